// The texts that a command is given, and the answers to them.
#pragma once

#include "tools/vtsym/Console.hpp"

#include <CLI/CLI.hpp>

#include <functional>
#include <string>
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
};

/// Marks arguments such as `[1,2]`, which CLI11 would take for lists of texts.
void guardLists(std::vector<std::string>& arguments);

/// Gives a command the texts, --json and --from.
void addTextOptions(CLI::App& command, TextOptions& options);
/// Gives a command --to.
void addLanguageOption(CLI::App& command, TextOptions& options);

/// Answers all texts in order.  True when every one had an answer and all input could be read.
bool answerTexts(const TextOptions& options, Console& console, const Answering& answering);

} // namespace vtsym
