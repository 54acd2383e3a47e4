// Answers texts one after another.  Every line of standard input is answered by one line, whatever happens, so that a
// caller can pair them; an error leaves an empty line, or an object with `"error"`.
//
// Answers are flushed whenever the next read may wait, so that another program can hold a dialogue.  Memory is bounded
// by the longest line, of which at most mostBytes are kept.
#include "tools/vtsym/io/Texts.hpp"

#include "tools/vtsym/io/CommandLine.hpp"
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

/// Bytes that are kept of a line that is too long, to show which line it is.
constexpr std::size_t shownOfLong = 80;

/// Answers one text after another.
class Answerer {
public:
    Answerer(const TextOptions& options, Console& console, const Answering& answering)
        : json_(options.json),
          console_(console),
          answering_(answering) {}

    /// `isWhole` is false for the beginning of a text that is too long.
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
    std::string messages;
    const std::size_t begin = out_.size();
    if (json_ && !answering_.writesInput)
        appendMember(out_, "input", jsonString(text));
    try {
        if (!isWhole)
            throw CommandError("The line is longer than " + sizeText(mostBytes) + ": split it.");
        answering_.answer(text, out_);
        messages = warnings();
    } catch (...) {
        const std::vector<TextError> errors = currentTextErrors();
        allAnswered_ = false;
        out_.resize(begin);
        if (json_) {
            appendMember(out_, "input", jsonString(text));
            appendMember(out_, "error", jsonOf(errors));
        } else {
            messages = errorLines(line_, text, errors, console_.errStyle());
        }
    }
    out_ += json_ ? "}\n" : "\n";
    console_.out(out_);
    if (!messages.empty())
        console_.err(messages);
}

std::string Answerer::warnings() const {
    std::string lines;
    if (answering_.warnings != nullptr)
        for (const std::string& warning : *answering_.warnings)
            lines += warningLine(line_, warning, console_.errStyle());
    return lines;
}

/// The line of standard input being read.
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

/// Calls `use` with every line of standard input.  Returns 0, or the error that ended reading.  Flushes the answers so
/// far before it waits for more input.
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

void addTexts(Command& command, TextOptions& options, const std::string& texts) {
    command.addArguments({"TEXT", texts + "; without any, or with -, every line of standard input"},
                         [&options](std::vector<std::string> given) { options.texts = std::move(given); });
    command.addFlag("--json", "Answer with one JSON object per text", options.json);
}

void addTextOptions(Command& command, TextOptions& options, const std::string& texts) {
    addTexts(command, options, texts);
    addSourceOption(command, options);
}

void addSourceOption(Command& command, TextOptions& options) {
    command.addChoice({"--from", "Language of the texts: c or quill (c unless given)", "LANGUAGE"}, {"c", "quill"},
                      [&options](const std::string& language) { options.from = language; });
}

void addLanguageOption(Command& command, TextOptions& options) {
    command.addChoice(
        {"--to", "Language of the answers: c, quill or pp for directives (as --from unless given)", "LANGUAGE"},
        {"c", "quill", "pp"}, [&options](const std::string& language) { options.to = language; });
}

void addAssumeOption(Command& command, std::vector<std::string>& assumptions) {
    command.addArguments(
        {"--assume", "Answer for the values for which a condition holds; may be repeated", "CONDITION"},
        [&assumptions](std::vector<std::string> all) { assumptions = std::move(all); });
}

void addBitsOption(Command& command, bool& bits32) {
    command.addChoice({"--bits", "Take names for signed integers of 32 bits (without bounds unless given)", "BITS"},
                      {"32"}, [&bits32](const std::string&) { bits32 = true; });
}

bool answerTexts(const TextOptions& options, Console& console, const Answering& answering) {
    Answerer answerer(options, console, answering);
    bool allRead = true;
    const auto readInput = [&] {
        if (const int error =
                forEachLine(console, [&](const InputLine& line) { answerer.answer(line.text, line.isWhole); })) {
            console.err(std::string("vtsym: standard input cannot be read: ") + std::strerror(error) + "\n");
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
