// Reads lines on a terminal, with a history and completion of names.
// Relies on libedit; without a terminal the program reads standard input instead.
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <string>

namespace vtsym {

/// A prompt.  Its history lasts as long as the object.
class LineEditor {
public:
    /// `words` is asked for the words to complete from whenever Tab is pressed.
    LineEditor(std::string prompt, std::function<const std::set<std::string>&()> words);
    LineEditor(const LineEditor&) = delete;
    LineEditor& operator=(const LineEditor&) = delete;
    ~LineEditor();

    /// The next line, without its end; nullopt at the end of the input.
    std::optional<std::string> read();

private:
    struct State;
    std::unique_ptr<State> state_;
};

/// The ways to continue the beginning of a word.
struct Completion {
    std::string addition;             ///< letters that all candidates continue with
    std::set<std::string> candidates; ///< words that begin so
};

/// Completes the name or command at the end of a text.
Completion complete(const std::string& text, const std::set<std::string>& words);

} // namespace vtsym
