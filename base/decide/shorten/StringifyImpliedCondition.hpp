// Prints conditions where another one is known to hold.
#pragma once

#include "base/core/NodeHash.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/util/IdMap.hpp"

#include <boost/unordered_map.hpp>

#include <cstdint>
#include <utility>

namespace VT {

/// Prints a condition as it needs to be tested where a known condition holds, like the inner one of two nested `#if`:
/// operands of And that the known condition contains are left out, and operands of Or that it excludes.
///
/// What holds is taken from the structure of the known condition, not from reasoning: the operands of its And, the
/// negated operands of an Or under Not, and their turned comparisons, so that A < B excludes A >= B and contains B > A.
/// An And with an excluded operand is excluded, an Or with a contained one is contained.  A condition of which nothing
/// is left prints as the constant that it is: `1` or `0`, in Quill `true` or `false`.
///
/// Wherever the known condition holds, the text is true exactly where the condition is.  Where And and Or are operands
/// of anything but And, Or and Not, their value counts and not only its truth, so they keep their operands there.
///
/// Used like every printing visitor; execute(table, id) and get(), or print(), which visits a shared operand once.  A
/// visitor may print any number of conditions by print().
class VTSYM_API StringifyImpliedCondition : public PreprocessorVCExpr {
public:
    /// @param known  the condition that holds; nothing is known from an identifier that is not of the table
    /// Linear in the distinct nodes of `known`.
    StringifyImpliedCondition(const SymbolicExprTable& table, bool quillSyntax, bool clarifyLogicalMix,
                              SymbolicExprId known, SymbolicExprPrinter::PredicateHandle predicate = {});

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// The text of the condition that was visited last; throws like the base.
    [[nodiscard]] std::string get() const override;
    using PreprocessorVCExpr::print;
    /// Prints a condition of the table; throws like the base.
    [[nodiscard]] std::string print(SymbolicExprId id) override;
    void forget() override;

private:
    /// What the known condition says of another one.
    enum class Verdict : std::uint8_t { Open, Contained, Excluded };

    /// A condition where only its truth counts.
    struct Condition {
        Verdict verdict = Verdict::Open;
        Printed text{};
    };

    /// A condition and, by the pair, its negation: comparisons are == or < then.
    struct Literal {
        SymbolicOp op = SymbolicOp::None;
        SymbolicExprId a = invalidId;
        SymbolicExprId b = invalidId;

        friend bool operator==(const Literal&, const Literal&) = default;

        friend std::size_t hash_value(const Literal& literal) {
            return hashStep(hashStep(hashSeed(literal.op), literal.a), literal.b);
        }
    };

    [[nodiscard]] static std::pair<Literal, bool> literalOf(SymbolicExprId id, const SymbolicExpr& node);
    [[nodiscard]] static Verdict negated(Verdict verdict);
    [[nodiscard]] Verdict verdictOf(SymbolicExprId id, const SymbolicExpr& node) const;
    void learn(SymbolicExprId known);
    [[nodiscard]] Condition operand(SymbolicExprId id, const Printed& asValue) const;
    template <class Node>
    void append(const Node& node);
    void conclude(const SymbolicExpr& node, Condition condition);
    [[nodiscard]] std::string text(const Condition& condition) const;

    const SymbolicExprTable& table_;
    boost::unordered_map<Literal, bool> facts_;
    IdMap<Condition> conditions_; ///< what was visited, but for what is no condition of its own
    Condition last_;
};

} // namespace VT
