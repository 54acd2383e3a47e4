// Lines typed on a terminal.
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <string>

namespace vtsym {

/// Reads lines with editing, a history for as long as it lives, and completion.
class LineEditor {
public:
    /// `words` gives the words to complete from whenever Tab is pressed.
    LineEditor(std::string prompt, std::function<const std::set<std::string>&()> words);
    LineEditor(const LineEditor&) = delete;
    LineEditor& operator=(const LineEditor&) = delete;
    ~LineEditor();

    /// The next line without its end; nothing at the end of the input.
    std::optional<std::string> read();

private:
    struct State;
    std::unique_ptr<State> state_;
};

/// How completion goes on from the beginning of a word.
struct Completion {
    std::string addition;             ///< what all words that begin so agree in
    std::set<std::string> candidates; ///< the words
};

/// Completes the name or command at the end of a text.
Completion complete(const std::string& text, const std::set<std::string>& words);

} // namespace vtsym
