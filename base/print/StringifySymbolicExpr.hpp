// The visitor that turns an expression into text.
#pragma once

#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/text/TextPool.hpp"
#include "base/util/IdPages.hpp"

#include <boost/container/small_vector.hpp>

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// Prints an expression bottom-up: each visit takes the printed operands of its node from a stack and leaves the
/// printed node. Spellings, precedences and forms are those of the operator table.  Parentheses are written where
/// precedence demands them and where the text would otherwise read differently.
///
/// A visitor serves one print: node.accept(table, visitor) or visitor.execute(table, id), then get().  Those visit a
/// shared operand once for every path to it; print() visits each distinct node once.
///
/// A derived printer overrides visits, the joining of operands and the results; all of it works through a reference to
/// this class.
class VTSYM_API StringifySymbolicExpr : public SymbolicExprVisitor {
public:
    /// A printed expression: the operator of its node, its text, and how strongly the outermost operator binds (0 for a
    /// text that needs no parentheses anywhere; a smaller number binds tighter).
    struct Printed {
        SymbolicOp op;
        Text text;
        unsigned char precedence;
        /// Number of the form that the node has inside a Quill call that stands for a C operator; 0 where it is written
        /// the same there.
        std::uint32_t inCall = 0;
    };

    /// How a binary operator and its operands are put together.
    struct Delimiters {
        bool wrapRight;
        bool wrapLeft;
        bool spaced;
    };

    explicit StringifySymbolicExpr(const SymbolicExprTable& table, bool quillSyntax,
                                   bool spacedLogicalOperators = false,
                                   SymbolicExprPrinter::PredicateHandle predicate = {});
    StringifySymbolicExpr(const StringifySymbolicExpr&) = delete;
    StringifySymbolicExpr& operator=(const StringifySymbolicExpr&) = delete;
    ~StringifySymbolicExpr() override;

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// The text of the expression that was visited last.  Throws std::out_of_range where nothing was visited, because
    /// the identifier was not of the table, and std::length_error for a text beyond the bound, before memory is taken
    /// for it.
    [[nodiscard]] virtual std::string get() const;

    /// Prints an expression of the table; visits each distinct node once, and none that an earlier print() or printed()
    /// met under names of the same version. Throws like get().
    [[nodiscard]] virtual std::string print(SymbolicExprId id);
    /// Prints a node whose operands are of the table.
    [[nodiscard]] virtual std::string print(const SymbolicExpr& node);
    /// The printed form of an expression of the table.  Throws std::out_of_range where the table has none.
    Printed printed(SymbolicExprId id);

    /// Whether print() or printed() met an expression, so that its text is at hand.
    [[nodiscard]] bool hasMet(SymbolicExprId id) const noexcept {
        const Known* const met = known_.find(id);
        return met != nullptr && met->opAndOne != 0;
    }

    /// Forgets the nodes met by print() and printed(), and their texts.
    virtual void forget();

    [[nodiscard]] const TextPool& texts() const noexcept {
        return texts_;
    }

    /// Bytes beyond which get() and print() throw std::length_error.
    void setTextBound(std::size_t bytes) noexcept {
        textBound_ = bytes;
    }

protected:
    /// Takes the right operand, then the left one, from the stack and pushes the operation.
    virtual void appendBinary(const SymbolicOp& op, const char* spelling, unsigned char precedence,
                              OpAssociativity assoc);
    /// Takes the operand and pushes the operation.  Minus an integer literal 0 is that 0.
    void appendUnary(const SymbolicOp& op, const char* spelling, unsigned char precedence, OpAssociativity assoc,
                     bool prefix);
    /// Takes the node's inputs and pushes them as a list.
    void appendArraySelection(const SymbolicExpr& node, const char* open, const char* close, const char* separator);
    void appendCellArray(const SymbolicExpr& node);
    /// Takes the node's inputs, the callee first, and pushes the call.
    void appendFcnCall(const SymbolicExpr& node);
    /// For Quill: takes the operands of a C operator and pushes the call of the function that stands for it.  Its
    /// arguments are written the same way, so that each division in them is an integer division.
    void PrintQExprFromCExpr(const SymbolicExpr& node);

    /// Joins two operands by an operator.
    [[nodiscard]] Printed createBinaryExpr(const SymbolicOp& op, const char* spelling, unsigned char precedence,
                                           OpAssociativity assoc, const Printed& lhs, const Printed& rhs);
    /// Decides on parentheses by precedence and on blanks.  Parentheses without which a sign would read differently are
    /// written in any case.
    [[nodiscard]] virtual Delimiters isDelimitWithSpacesAndWrapParenthesis(const SymbolicOp& op,
                                                                           unsigned char precedence,
                                                                           OpAssociativity assoc, const Printed& lhs,
                                                                           const Printed& rhs) const;

    void push(const Printed& printed) {
        stack_.push_back(printed);
    }

    void push(const SymbolicOp& op, std::string_view text, unsigned char precedence) {
        push({op, texts_.bytes(text), precedence});
    }

    /// The operand that was printed last.  Throws std::out_of_range for an empty stack.
    [[nodiscard]] const Printed& top() const;

    /// Takes it from the stack.
    Printed pop() {
        const Printed last = top();
        stack_.pop_back();
        return last;
    }

    /// The bytes of a printed expression.  Throws std::length_error for more than the bound.
    [[nodiscard]] std::string textOf(const Printed& printed) const {
        return texts_.str(printed.text, textBound_);
    }

    /// The text of an identifier, as the predicate chooses it.
    [[nodiscard]] std::string identifier(const SymbolicString& node) const {
        return predicate_.printIdentifier(node);
    }

    [[nodiscard]] bool isQuillSyntax() const noexcept {
        return quillSyntax_;
    }

    [[nodiscard]] bool hasSpacedLogicalOperators() const noexcept {
        return spacedLogicalOperators_;
    }

private:
    class StackDepth;

    /// A printed expression, packed; all zero for a node that was not met, so that fresh pages are zeroed memory.
    struct Known {
        Text text;
        std::uint32_t inCall;
        std::uint8_t opAndOne;
        unsigned char precedence;
    };

    template <SymbolicOp Op, class Node>
    void append(const Node& node);
    template <class Build>
    void replaceOperands(std::size_t count, Build build);
    [[nodiscard]] bool pushKnown(SymbolicExprId id);
    [[nodiscard]] Printed printedOnce(SymbolicExprId id);
    [[nodiscard]] std::span<const Printed> operands(std::size_t count) const;
    [[nodiscard]] Printed insideCall(const Printed& printed) const;
    void setInsideCall(Printed& printed, const Printed& form);

    [[nodiscard]] bool needsParentheses(const Printed& operand, unsigned char precedence) const;
    void appendInteger(int value);
    void appendDouble(double value);
    [[nodiscard]] Text integer(int value);

    [[nodiscard]] Text wrapped(Text text) {
        return texts_.enclose("(", text, ")");
    }

    [[nodiscard]] Text list(std::span<const Printed> parts, std::string_view open, std::string_view separator,
                            std::string_view close);
    [[nodiscard]] Printed call(SymbolicOp op, const Printed& callee, std::span<const Printed> arguments);
    [[nodiscard]] Printed unary(SymbolicOp op, std::string_view spelling, unsigned char precedence, bool prefix,
                                const Printed& operand);
    [[nodiscard]] Printed quillCall(SymbolicOp op, std::span<const Printed> arguments);
    [[nodiscard]] Printed shiftAmount(const SymbolicExpr& shift, const Printed& amount);

    const SymbolicExprTable& table_;
    SymbolicExprPrinter::PredicateHandle predicate_;
    bool plainNames_;
    bool quillSyntax_;
    bool spacedLogicalOperators_;
    std::size_t textBound_ = limits::textBytes;

    TextPool texts_;
    std::vector<Printed> stack_;
    std::vector<Printed> insideCalls_; ///< the forms that inCall numbers, from 1 on
    IdPages<Known> known_;             ///< what print() and printed() met
    std::uint64_t knownUnder_ = 0;     ///< version of the names
    std::vector<WalkFrame> frames_;
};

} // namespace VT
