// Prints expressions by identifier.
#pragma once

#include "base/core/Nodes.hpp"

#include <concepts>
#include <cstdint>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>

namespace VT {

class StringifySymbolicExpr;

/// Prints expressions of one table as one line of text each, in Quill or in C syntax.
///
/// A printer keeps what it knows of the nodes that it met, so that each of them is looked at once in the printer's
/// life; a graph with shared operands costs its nodes, and the text its length.  Nothing is interned.  A printer is
/// used by one thread at a time; its table outlives it.
class VTSYM_API SymbolicExprPrinter {
public:
    /// Gives the text of an identifier.  The base gives its name.
    class VTSYM_API Predicate {
    public:
        [[nodiscard]] virtual std::string printIdentifier(const SymbolicString& node) const;
        virtual ~Predicate();
        /// A number that is another one once texts have changed, so that printers drop those that they keep.  The base
        /// answers 0: texts never change.
        [[nodiscard]] virtual std::uint64_t version() const;
    };

    /// The predicate of a printer: one of the caller's, which outlives the printer, or a temporary, which is kept.
    /// Names as they are, when none is given.
    class VTSYM_API PredicateHandle {
    public:
        PredicateHandle() = default;

        // NOLINTBEGIN(google-explicit-constructor, bugprone-forwarding-reference-overload): a predicate stands for its
        // handle
        PredicateHandle(const Predicate& predicate) : predicate_(std::shared_ptr<const Predicate>(), &predicate) {}
        template <class Temporary>

        requires(!std::is_lvalue_reference_v<Temporary> && std::derived_from<std::remove_cv_t<Temporary>, Predicate>)
            PredicateHandle(Temporary&& predicate)
            : predicate_(std::make_shared<const std::remove_cv_t<Temporary>>(std::forward<Temporary>(predicate))) {}

        // NOLINTEND(google-explicit-constructor, bugprone-forwarding-reference-overload)

        /// Whether every identifier is printed as its name.
        [[nodiscard]] bool isPlain() const;
        [[nodiscard]] std::string printIdentifier(const SymbolicString& node) const;
        [[nodiscard]] std::uint64_t version() const;

    private:
        std::shared_ptr<const Predicate> predicate_;
    };

    /// @param quillSyntax             Quill's spellings and rules; those of C otherwise
    /// @param spacedLogicalOperators  one blank on each side of && || and of Quill's & |
    explicit SymbolicExprPrinter(const SymbolicExprTable& table, bool quillSyntax, bool spacedLogicalOperators = false,
                                 const PredicateHandle& predicate = {});
    SymbolicExprPrinter(SymbolicExprPrinter&&) noexcept;
    SymbolicExprPrinter& operator=(SymbolicExprPrinter&&) noexcept;
    ~SymbolicExprPrinter();

    /// The text of an expression.  Throws std::out_of_range for an identifier that is not of the table and
    /// std::length_error for a text beyond the bound; nothing of it was written then.
    [[nodiscard]] std::string operator()(SymbolicExprId id) const;
    /// The text of a node whose operands are of the table; it need not be there itself.
    [[nodiscard]] std::string operator()(const SymbolicExpr& node) const;
    /// The same as printing the identifier, from a store of finished texts that lives as long as the printer.  The
    /// store is emptied when the predicate has another version, so that it follows new aliases.  Under a predicate that
    /// names identifiers differently without another version a stored text stays, and so do the lengths and the order
    /// below.
    [[nodiscard]] std::string printIdUsingCache(SymbolicExprId id) const;

    /// Bytes of the text of an expression, without writing it; numbers from 2^62 on are all 2^62.  Linear in the nodes
    /// that the printer has not met.  Throws std::out_of_range for an identifier that is not of the table.
    [[nodiscard]] std::uint64_t textLength(SymbolicExprId id) const;
    /// Orders two expressions: by the first limits::orderedTextBytes bytes of their texts, as unsigned numbers, a
    /// beginning before the longer text, and those that agree in them by compareStructure().  Negative, zero or
    /// positive; zero for expressions that cannot be told apart.  The order does not depend on what was interned when,
    /// nor on what the printer has met.
    ///
    /// Writes no text.  Mostly O(1) behind the nodes that the printer has not met; at worst linear in the bound and the
    /// depth. Throws std::out_of_range for an identifier that is not of the table.
    [[nodiscard]] int compareUsingCache(SymbolicExprId left, SymbolicExprId right) const;

    /// Bytes beyond which printing throws std::length_error; limits::textBytes unless set.
    void setTextBound(std::size_t bytes);

private:
    struct State;
    std::unique_ptr<State> state_;
};

/// Orders two expressions of a table by structure: operator, literal or name, number of operands, then the operands
/// from left to right.  Zero for equal structure.  Identifiers have no say, so the order does not depend on the table's
/// history.  Linear in the depth of the first difference; linear in the size where copies of NaN make equal structures
/// of several nodes.
[[nodiscard]] VTSYM_API int compareStructure(const SymbolicExprTable& table, SymbolicExprId left, SymbolicExprId right);

} // namespace VT
