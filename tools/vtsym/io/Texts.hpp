// The texts that a command answers: from the command line or from standard input, one answer a text.
// Every command on texts takes the same options, which are added here.
#pragma once

#include "tools/vtsym/io/Console.hpp"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

class Command;

/// Options of every command on texts.
struct TextOptions {
    std::vector<std::string> texts; ///< empty, or "-": the lines of standard input
    std::string from = "c";
    std::string to; ///< empty: like `from`
    bool json = false;

    [[nodiscard]] bool fromQuill() const { return from == "quill"; }

    [[nodiscard]] bool toQuill() const { return (to.empty() ? from : to) == "quill"; }

    /// Whether answers are conditions of preprocessor directives.
    [[nodiscard]] bool toDirective() const { return to == "pp"; }
};

/// How a command answers.
struct Answering {
    /// Appends the answer to a text: with --json further members of its object, otherwise text without a final line
    /// end. An exception is reported as the error of that text.
    std::function<void(const std::string& text, std::string& answer)> answer;
    /// Whether answers have several lines, and are separated by empty ones.
    bool inBlocks = false;
    /// Warnings about the text that was answered last; nullptr for a command without warnings.
    const std::vector<std::string>* warnings = nullptr;
    /// Whether the command writes the text into its JSON answer itself, rather than as `"input"`.
    bool writesInput = false;
};

/// Adds the texts, --json and --from to a command.
void addTextOptions(Command& command, TextOptions& options, const std::string& texts = "Texts to work on");
/// Adds the texts, which the help describes with these words, and --json.
void addTexts(Command& command, TextOptions& options, const std::string& texts = "Texts to work on");
/// Adds --from.
void addSourceOption(Command& command, TextOptions& options);
/// Adds --to.
void addLanguageOption(Command& command, TextOptions& options);
/// Adds --bits.
void addBitsOption(Command& command, bool& bits32);

/// Adds --assume, which may be written again.
void addAssumeOption(Command& command, std::vector<std::string>& assumptions);

/// Whether a text is an identifier.
bool isName(std::string_view text);

/// Answers all texts in order.  Returns whether every one had an answer and all input could be read.
bool answerTexts(const TextOptions& options, Console& console, const Answering& answering);

} // namespace vtsym
