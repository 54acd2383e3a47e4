// The texts that a command is given, and the answers to them.
#pragma once

#include "tools/vtsym/io/Console.hpp"

#include <CLI/CLI.hpp>

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// What every command on texts is told.
struct TextOptions {
    std::vector<std::string> texts; ///< none, or "-": the lines of standard input
    std::string from = "c";
    std::string to; ///< empty: as `from`
    bool json = false;

    [[nodiscard]] bool fromQuill() const { return from == "quill"; }

    [[nodiscard]] bool toQuill() const { return (to.empty() ? from : to) == "quill"; }

    /// Whether answers are conditions of preprocessor directives.
    [[nodiscard]] bool toDirective() const { return to == "pp"; }
};

/// How a command answers.
struct Answering {
    /// Appends the answer to a text: with --json further members of its object, otherwise text without the end of its
    /// last line.  What it throws is told as the error of that text.
    std::function<void(const std::string& text, std::string& answer)> answer;
    /// Whether answers have several lines; they are kept apart by empty lines then.
    bool inBlocks = false;
    /// What is to be told on standard error of the text that was answered last; nullptr for nothing ever.
    const std::vector<std::string>* warnings = nullptr;
    /// Whether an answer with --json tells the text in members of its own; otherwise `"input"` does.
    bool tellsInput = false;
};

/// Gives a command the texts, --json and --from.
void addTextOptions(CLI::App& command, TextOptions& options);
/// Gives a command --from alone.
void addSourceOption(CLI::App& command, TextOptions& options);
/// Gives a command --to.
void addLanguageOption(CLI::App& command, TextOptions& options);

/// Gives a command --bits.
void addBitsOption(CLI::App& command, bool& bits32);

/// Whether a text is one name.
bool isName(std::string_view text);

/// Answers all texts in order.  True when every one had an answer and all input could be read.
bool answerTexts(const TextOptions& options, Console& console, const Answering& answering);

} // namespace vtsym
