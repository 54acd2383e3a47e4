#include "tools/vtsym/io/Texts.hpp"

#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/Json.hpp"

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

/// Bytes of a line that is too long that are kept, to tell which one it is.
constexpr std::size_t shownOfLong = 80;

/// Answers one text after another.
class Answerer {
public:
    Answerer(const TextOptions& options, Console& console, const Answering& answering)
        : json_(options.json),
          console_(console),
          answering_(answering) {}

    /// @param isWhole  whether the text is not the beginning of one that is too long
    void answer(const std::string& text, bool isWhole = true);

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

void Answerer::answer(const std::string& text, bool isWhole) {
    console_.working(++line_);
    out_.clear();
    if (answering_.inBlocks && line_ > 1)
        out_ += '\n';
    if (json_)
        out_.append("{\"line\":").append(std::to_string(line_));
    std::string words;
    const std::size_t begin = out_.size();
    if (json_ && !answering_.tellsInput)
        appendMember(out_, "input", jsonString(text));
    try {
        if (!isWhole)
            throw CommandError("The line is longer than " + sizeText(mostBytes) + ".");
        answering_.answer(text, out_);
        words = warnings();
    } catch (...) {
        const std::vector<TextError> errors = currentTextErrors();
        allAnswered_ = false;
        out_.resize(begin);
        if (json_) {
            appendMember(out_, "input", jsonString(text));
            appendMember(out_, "error", jsonOf(errors));
        } else {
            words = errorLines(line_, text, errors, console_.wordStyle());
        }
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

/// The line of standard input that is being read.
struct InputLine {
    std::string text;
    bool begun = false;
    bool isWhole = true;

    void clear() {
        text.clear();
        begun = false;
        isWhole = true;
    }

    void append(std::string_view part) {
        begun = true;
        isWhole = isWhole && part.size() <= mostBytes - text.size();
        if (isWhole)
            text.append(part);
        else if (text.size() > shownOfLong)
            text = text.substr(0, shownOfLong);
    }
};

/// Calls `use` with every line of standard input; 0, or the error that ended reading.  Before it waits for more input,
/// it lets the answers so far out.
template <class Use>
int forEachLine(Console& console, Use&& use) {
    std::array<char, 65536> buffer{};
    InputLine line;
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
            if (line.text.ends_with('\r'))
                line.text.pop_back();
            use(line);
            line.clear();
        }
        if (!rest.empty())
            line.append(rest);
    }
    if (line.begun)
        use(line);
    return 0;
}

} // namespace

bool isName(std::string_view text) {
    const auto isLetter = [](char c) { return c == '_' || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); };
    if (text.empty() || !isLetter(text.front()))
        return false;
    return text.find_first_not_of("abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_") ==
           std::string_view::npos;
}

void addTextOptions(CLI::App& command, TextOptions& options) {
    const auto take = [&options](std::vector<std::string> texts) { options.texts = std::move(texts); };
    addArguments(command, "TEXT", take, "Texts to work on; without any, or with -, every line of standard input");
    addSourceOption(command, options);
    command.add_flag("--json", options.json, "Answer with one JSON object per text");
}

void addSourceOption(CLI::App& command, TextOptions& options) {
    addArgument(command, "--from", options.from, "Language of the texts: c or quill")
        ->check(oneOf({"c", "quill"}))
        ->type_name("LANGUAGE");
}

void addLanguageOption(CLI::App& command, TextOptions& options) {
    addArgument(command, "--to", options.to,
                "Language of the answers: c, quill or pp, the condition of a preprocessor directive (as --from unless "
                "given)")
        ->check(oneOf({"c", "quill", "pp"}))
        ->type_name("LANGUAGE");
}

void addBitsOption(CLI::App& command, bool& bits32) {
    const auto take = [&bits32](const std::string&) { bits32 = true; };
    addArgument(command, "--bits", take,
                "Take names for signed integers of 32 bits; for integers without bounds unless given")
        ->check(oneOf({"32"}))
        ->type_name("BITS");
}

bool answerTexts(const TextOptions& options, Console& console, const Answering& answering) {
    Answerer answerer(options, console, answering);
    bool allRead = true;
    const auto readInput = [&] {
        if (const int error =
                forEachLine(console, [&](const InputLine& line) { answerer.answer(line.text, line.isWhole); })) {
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
