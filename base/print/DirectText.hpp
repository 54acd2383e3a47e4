// Texts of expressions in one pass, for those that have no special cases.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/util/PlainVector.hpp"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace VT {

/// Writes an expression from left to right into one buffer, each occurrence of a node anew.  Gives up where another
/// printer is needed: at nodes whose text depends on more than operators and precedences, and at texts that are long
/// because nodes are shared.
class DirectText {
public:
    /// `table` is a plain one and outlives the object; names are printed as they are.
    DirectText(const SymbolicExprTable& table, bool quillSyntax, bool spacedLogicalOperators);

    /// Returns the text that StringifySymbolicExpr prints, or nothing for one of more than `most` bytes, of an
    /// identifier that is not of the table, or of a node that is left to it.  Linear in the text or in `most`; its
    /// stack is explicit.
    std::optional<std::string> print(SymbolicExprId id, std::size_t most);

private:
    struct Style;

    /// An operator some of whose operands are still to be written.
    struct Open {
        SymbolicExprId id;
        const Style* style;
        std::uint32_t next;  ///< operand
        std::uint32_t count; ///< of operands
        bool wrapped;        ///< the operand that is written now is in parentheses
    };

    [[nodiscard]] static const Style* stylesOf(bool quill, bool spaced);
    [[nodiscard]] const Style& styleAt(SymbolicExprId id) const;
    [[nodiscard]] SymbolicExprId operandOf(SymbolicExprId id, std::size_t index) const;
    [[nodiscard]] bool enter(SymbolicExprId id, const Style* style);
    [[nodiscard]] bool advance();
    [[nodiscard]] bool enterCall(SymbolicExprId id, const Style* style);
    [[nodiscard]] bool beginsWithMinus(SymbolicExprId id) const;
    [[nodiscard]] const std::string& nameAt(SymbolicExprId id) const;
    void putInteger(int value);

    void put(char c) { *bytes_.extend(1) = c; }

    void put(std::string_view text);

    const SymbolicExprTable& table_;
    const Style* styles_; ///< by operator
    PlainVector<char> bytes_;
    PlainVector<Open> open_;
};

} // namespace VT
