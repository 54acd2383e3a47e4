// The prompt without its terminal: answers conditions and commands, and remembers names, values and the last result.
// Tests and pipes use it line by line; ReplCommand adds the line editor.
#pragma once

#include "base/transform/Replacement.hpp"
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/io/Console.hpp"

#include <optional>
#include <set>
#include <string>
#include <string_view>

namespace vtsym {

/// Answers lines one after another.
class Session {
public:
    Session(TextOptions options, const Style& style);

    /// Appends the answer to a line: the simplified condition or the output of a command; nothing for an empty line.
    /// Throws what reading and printing throw, and CommandError for an unknown command.  A line that fails changes
    /// nothing.
    void answer(const std::string& line, std::string& out);

    /// Whether :quit was answered.
    [[nodiscard]] bool ended() const noexcept { return ended_; }

    /// Names seen and commands, for completion.
    [[nodiscard]] const std::set<std::string>& words() const noexcept { return words_; }

private:
    struct CommandRow;
    static const CommandRow commands[];

    static const CommandRow& commandOf(std::string_view word);
    [[nodiscard]] VT::SymbolicExprId parse(std::string_view text) const;
    [[nodiscard]] VT::SymbolicExprId read(std::string_view text);
    [[nodiscard]] VT::SymbolicExprId subject(std::string_view text);
    void show(std::string_view text, const TextOptions& options, std::string& out);
    void keep(VT::SymbolicExprId result);
    void bind(const std::string& name, VT::SymbolicExprId value);

    void showIn(const char* language, std::string_view text, std::string& out);
    void showDirective(std::string_view text, std::string& out);
    void showTree(std::string_view text, std::string& out);
    void explain(std::string_view text, std::string& out);
    void listSymbols(std::string_view text, std::string& out);
    void let(std::string_view assignment, std::string& out);
    void help(std::string& out) const;

    std::string_view line_; ///< being answered
    TextOptions options_;
    const Style& style_;
    Conditions conditions_;
    VT::SymbolicExprReplacements values_; ///< of names, `ans` included
    std::optional<VT::SymbolicExprId> result_;
    std::set<std::string> words_;
    bool ended_ = false;
};

} // namespace vtsym
