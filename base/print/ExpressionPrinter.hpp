// Prints expressions by identifier.
#pragma once

#include "base/core/Nodes.hpp"

#include <concepts>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <type_traits>
#include <utility>

namespace VT {

class StringifySymbolicExpr;

/// Prints expressions of one table as one line of text each, in Quill or in C syntax.
///
/// A printer keeps the printed forms of the nodes that it met, so that each of them is looked at once in the printer's
/// life; a graph with shared operands costs its nodes, and the text its length.  Nothing is interned.  A printer is
/// used by one thread at a time; its table outlives it.
class VTSYM_API SymbolicExprPrinter {
public:
    /// Chooses the text of an identifier.  The base chooses its name.
    class VTSYM_API Predicate {
    public:
        [[nodiscard]] virtual std::string printIdentifier(const SymbolicString& node) const;
        virtual ~Predicate();
        /// A number that differs once texts have changed, so that printers drop those that they keep.  The base returns
        /// 0: texts never change.
        [[nodiscard]] virtual std::uint64_t version() const;
    };

    /// The predicate of a printer: one of the caller's, which outlives the printer, or a temporary, which is kept.  An
    /// empty handle prints names as they are.
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

    /// Returns the text of an expression.  Throws std::out_of_range for an identifier that is not of the table, and
    /// std::length_error for a text beyond the bound, before anything of it is written.
    [[nodiscard]] std::string operator()(SymbolicExprId id) const;
    /// Returns the text of a node whose operands are in the table; the node itself need not be.
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
    /// positive; zero for expressions that do not differ.  The order does not depend on the order of interning, nor
    /// on the nodes that the printer has met.
    ///
    /// Writes no text.  Mostly O(1) once the printer has met the nodes; at worst linear in the bound and the depth.
    /// Throws std::out_of_range for an identifier that is not of the table.
    [[nodiscard]] int compareUsingCache(SymbolicExprId left, SymbolicExprId right) const;
    /// Sorts expressions by that order.  Looks each of them up once.
    void sortUsingCache(std::span<SymbolicExprId> ids) const;

    /// Bytes beyond which printing throws std::length_error; limits::textBytes unless set.
    void setTextBound(std::size_t bytes);

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
