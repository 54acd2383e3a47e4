#include "tools/vtsym/Texts.hpp"

#include "tools/vtsym/ErrorText.hpp"
#include "tools/vtsym/Json.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <unistd.h>
#include <utility>

namespace vtsym {

namespace {

/// What no argument of a command line holds.
constexpr char textMark = '\0';

/// Answers one text after another.
class Answerer {
public:
    Answerer(const TextOptions& options, Console& console, const Answering& answering)
        : json_(options.json),
          console_(console),
          answering_(answering) {}

    void answer(const std::string& text);

    [[nodiscard]] bool allAnswered() const noexcept { return allAnswered_; }

private:
    [[nodiscard]] std::string warnings() const;

    bool json_;
    Console& console_;
    const Answering& answering_;
    std::uint64_t line_ = 0;
    bool allAnswered_ = true;
    std::string out_;
};

void Answerer::answer(const std::string& text) {
    console_.working(++line_);
    out_.clear();
    if (answering_.inBlocks && line_ > 1)
        out_ += '\n';
    if (json_) {
        out_.append("{\"line\":").append(std::to_string(line_));
        appendMember(out_, "input", jsonString(text));
    }
    std::string words;
    const std::size_t begin = out_.size();
    try {
        answering_.answer(text, out_);
        words = warnings();
    } catch (...) {
        const TextError error = currentTextError();
        allAnswered_ = false;
        out_.resize(begin);
        if (json_)
            appendMember(out_, "error", jsonOf(error));
        else
            words = errorLines(line_, text, error, console_.wordStyle());
    }
    out_ += json_ ? "}\n" : "\n";
    console_.data(out_);
    if (!words.empty())
        console_.words(words);
}

std::string Answerer::warnings() const {
    std::string lines;
    if (answering_.warnings != nullptr)
        for (const std::string& warning : *answering_.warnings)
            lines += warningLine(line_, warning, console_.wordStyle());
    return lines;
}

/// Calls `use` with every line of standard input; 0, or the error that ended reading.  Before it waits for more input,
/// it lets the answers so far out.
template <class Use>
int forEachLine(Console& console, Use&& use) {
    std::array<char, 65536> buffer{};
    std::string line;
    bool open = false; // a line has begun
    for (;;) {
        console.flush();
        console.waiting();
        const ssize_t got = read(STDIN_FILENO, buffer.data(), buffer.size());
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0)
            return errno;
        if (got == 0)
            break;
        std::string_view rest(buffer.data(), static_cast<std::size_t>(got));
        for (std::size_t end = rest.find('\n'); end != std::string_view::npos; end = rest.find('\n')) {
            line.append(rest.substr(0, end));
            rest.remove_prefix(end + 1);
            if (line.ends_with('\r'))
                line.pop_back();
            use(line);
            line.clear();
            open = false;
        }
        line.append(rest);
        open = open || !rest.empty();
    }
    if (open)
        use(line);
    return 0;
}

} // namespace

void markTexts(std::vector<std::string>& arguments) {
    const auto isList = [](const std::string& text) { return text.starts_with('[') && text.ends_with(']'); };
    bool behind = false;
    for (auto text = arguments.begin(); text != arguments.end();) {
        if (!behind && *text == "--") {
            behind = true;
            text = arguments.erase(text);
            continue;
        }
        if (behind || isList(*text))
            text->insert(text->begin(), textMark);
        ++text;
    }
}

std::string withoutMark(const std::string& argument) {
    return argument.starts_with(textMark) ? argument.substr(1) : argument;
}

bool isName(std::string_view text) {
    const auto isLetter = [](char c) { return c == '_' || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); };
    if (text.empty() || !isLetter(text.front()))
        return false;
    return text.find_first_not_of("abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_") ==
           std::string_view::npos;
}

CLI::Validator oneOf(std::vector<std::string> words) {
    return {[words = std::move(words)](const std::string& value) -> std::string {
                if (std::ranges::find(words, value) != words.end())
                    return {};
                std::string choice = words.front();
                for (std::size_t i = 1; i < words.size(); ++i)
                    choice += (i + 1 < words.size() ? ", " : " or ") + words[i];
                return "'" + value + "' is not offered; " + choice + " is";
            },
            ""};
}

void addTextOptions(CLI::App& command, TextOptions& options) {
    command.add_option("TEXT", options.texts, "Texts to work on; without any, or with -, every line of standard input")
        ->transform(withoutMark, "")
        ->type_name("");
    addSourceOption(command, options);
    command.add_flag("--json", options.json, "Answer with one JSON object per text");
}

void addSourceOption(CLI::App& command, TextOptions& options) {
    command.add_option("--from", options.from, "Language of the texts: c or quill")
        ->check(oneOf({"c", "quill"}))
        ->type_name("LANGUAGE");
}

void addLanguageOption(CLI::App& command, TextOptions& options) {
    command
        .add_option("--to", options.to,
                    "Language of the answers: c, quill or pp, the condition of a preprocessor directive (as --from "
                    "unless given)")
        ->check(oneOf({"c", "quill", "pp"}))
        ->type_name("LANGUAGE");
}

bool answerTexts(const TextOptions& options, Console& console, const Answering& answering) {
    Answerer answerer(options, console, answering);
    bool allRead = true;
    const auto readInput = [&] {
        if (const int error = forEachLine(console, [&](const std::string& line) { answerer.answer(line); })) {
            console.words(std::string("vtsym: standard input cannot be read: ") + std::strerror(error) + "\n");
            allRead = false;
        }
    };
    if (options.texts.empty())
        readInput();
    for (const std::string& text : options.texts) {
        if (text == "-")
            readInput();
        else
            answerer.answer(text);
    }
    console.flush();
    return allRead && answerer.allAnswered();
}

} // namespace vtsym
