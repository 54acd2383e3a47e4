// The texts that a command answers: from the command line or from standard input, one answer a text.
// Every command on texts takes the same options, which are added here.
#pragma once

#include "tools/vtsym/io/Console.hpp"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
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
    std::size_t jobs = 0; ///< 0 for all processors

    [[nodiscard]] bool fromQuill() const { return from == "quill"; }

    [[nodiscard]] bool toQuill() const { return (to.empty() ? from : to) == "quill"; }

    /// Whether answers are conditions of preprocessor directives.
    [[nodiscard]] bool toDirective() const { return to == "pp"; }
};

/// Steps that the questions of all texts may take together.
struct TextSteps {
    std::uint64_t atFirst = 0;
    std::uint64_t spare = 0; ///< with so many left, an answer does not depend on how many are left
    std::uint64_t ahead = 0; ///< that texts may take beyond their own before it is their turn
    std::function<std::uint64_t()> left{};
};

/// How a command answers, in one thread at a time.
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
    /// Answers from now on as if no text had been before, with steps for questions; nullptr where an answer depends on
    /// its text alone.
    std::function<void(std::uint64_t steps)> begin{};
    /// The steps since begin(); nothing for a command without questions.
    std::optional<TextSteps> steps{};
};

/// Makes what answers in a further thread.  May be called by several threads.
using MakeAnswering = std::function<Answering()>;

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

/// Adds --jobs to a command; 0 is all processors.
void addJobsOption(Command& command, std::size_t& jobs);

/// Whether a text is an identifier.
bool isName(std::string_view text);

/// Answers all texts in order, lines of standard input on several processors.  Returns whether every one had an answer
/// and all input could be read.
bool answerTexts(const TextOptions& options, Console& console, const MakeAnswering& make);

/// The same where an answer may depend on all texts before it.
bool answerOneByOne(const TextOptions& options, Console& console, const Answering& answering);

} // namespace vtsym
