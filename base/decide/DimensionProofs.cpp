// Proves claims about dimensions by decisions about conditions without quotients.
//
// Method: divisions are pulled outwards on both sides of each comparison, which is then multiplied by both divisors:
// N/2 + 1 >= M/3 is (N + 2)*3 >= M*2.  What is left holds no quotient, so that exact and cut ones are the same.
// Cost: linear in the distinct nodes of the claim, plus one decision; three for an order.
#include "base/decide/DimensionProofs.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/integer/IntegerSet.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"

#include <optional>

namespace VT {

namespace {

/// An expression over a positive integer.
struct Quotient {
    SymbolicExprId numerator;
    std::int64_t divisor;
};

/// The value of a product of positive integers that fits a literal.
std::optional<std::int64_t> productOf(const SymbolicExprTable& table, SymbolicExprId id) {
    std::int64_t product = 1;
    const bool complete = walkChain(table, id, limits::chainOperands, LinksOf(SymbolicOp::Multiply),
                                    [&](SymbolicExprId, const SymbolicExpr* node) {
                                        if (node == nullptr || node->op() != SymbolicOp::IntValue)
                                            return false;
                                        const int factor = static_cast<const SymbolicIntValue*>(node)->getValue();
                                        product *= factor > 0 ? factor : 0;
                                        return product > 0 && fitsInt(product);
                                    });
    return complete ? std::optional(product) : std::nullopt;
}

std::optional<Quotient> quotientOf(SymbolicExprTable& table, SymbolicExprId dimension) {
    const SymbolicExprId factored = SymbolicExprFactorDivision(table).factorDivision(dimension);
    const SymbolicExpr* const node = table.get(factored);
    if (node == nullptr)
        return std::nullopt;
    if (node->op() != SymbolicOp::Divide)
        return Quotient{factored, 1};
    const std::optional<std::int64_t> divisor = productOf(table, node->getInput(1));
    return divisor ? std::optional(Quotient{table.get(factored)->getInput(0), *divisor}) : std::nullopt;
}

SymbolicExprId times(SymbolicExprTable& table, SymbolicExprId a, std::int64_t factor) {
    return factor == 1 ? a
                       : makeBinary(table, SymbolicOp::Multiply, a,
                                    SymbolicIntValue(table, static_cast<int>(factor)).getId(table));
}

} // namespace

/// The claim with every comparison multiplied by its divisors; the invalid identifier where a quotient is left.
SymbolicExprId DimensionProofs::withoutQuotients(SymbolicExprId claim) {
    std::vector<SymbolicExprId> comparisons;
    walkDistinct(
        table_, claim,
        [&](SymbolicExprId id, const SymbolicExpr& node) {
            if (comparisonOps.contains(node.op()))
                comparisons.push_back(id);
        },
        [](SymbolicExprId) {});
    SymbolicExprReplacements multiplied;
    for (const SymbolicExprId id : comparisons) {
        const SymbolicOp op = table_.get(id)->op();
        const auto a = quotientOf(table_, table_.get(id)->getInput(0));
        const auto b = quotientOf(table_, table_.get(id)->getInput(1));
        if (a && b)
            multiplied.emplace(id, makeBinary(table_, op, times(table_, a->numerator, b->divisor),
                                              times(table_, b->numerator, a->divisor)));
    }
    // A root is never replaced, but the operand of Not is.
    const SymbolicExprId denied = makeUnary(table_, SymbolicOp::Not, claim);
    const SymbolicExprId result = SymbolicExprReplacement(table_, multiplied)(denied);
    bool isWhole = true;
    walkDistinct(
        table_, result,
        [&](SymbolicExprId, const SymbolicExpr& node) { isWhole = isWhole && node.op() != SymbolicOp::Divide; },
        [&](SymbolicExprId id) { isWhole = isWhole && id != invalidId; });
    return isWhole ? table_.get(result)->getInput(0) : invalidId;
}

Decision DimensionProofs::holds(SymbolicExprId claim) {
    if (!table_.has(claim))
        return {Answer::Undecided, DecisionBound::NoCondition, std::nullopt};
    const SymbolicExprId whole = withoutQuotients(claim);
    if (whole == invalidId)
        return {Answer::Undecided, DecisionBound::Terms, std::nullopt};
    const SymbolicExprId asked = SymbolicExprQ2C(table_)(whole);
    return decider_.implies(assumptions_.knownOf(std::span(&asked, 1)), asked);
}

Decision DimensionProofs::holds(SymbolicOp op, SymbolicExprId a, SymbolicExprId b) {
    if (!table_.has(a) || !table_.has(b))
        return {Answer::Undecided, DecisionBound::NoCondition, std::nullopt};
    return holds(makeBinary(table_, op, a, b));
}

Decision DimensionProofs::isNonNegative(SymbolicExprId dimension) {
    return holds(SymbolicOp::GreaterThanEqual, dimension, SymbolicIntValue(table_, 0).getId(table_));
}

Decision DimensionProofs::isEqual(SymbolicExprId a, SymbolicExprId b) {
    return holds(SymbolicOp::Equal, a, b);
}

Decision DimensionProofs::isDivisible(SymbolicExprId dimension, int divisor) {
    if (!table_.has(dimension))
        return {Answer::Undecided, DecisionBound::NoCondition, std::nullopt};
    if (divisor <= 0)
        return {Answer::Undecided, DecisionBound::Terms, std::nullopt};
    const SymbolicExprId rest =
        makeBinary(table_, SymbolicOp::Modulo, dimension, SymbolicIntValue(table_, divisor).getId(table_));
    return holds(SymbolicOp::Equal, rest, SymbolicIntValue(table_, 0).getId(table_));
}

DimensionOrder DimensionProofs::compare(SymbolicExprId a, SymbolicExprId b) {
    const bool notGreater = holds(SymbolicOp::LessThanEqual, a, b).isYes();
    const bool notLess = holds(SymbolicOp::GreaterThanEqual, a, b).isYes();
    if (notGreater && notLess)
        return DimensionOrder::Equal;
    if (!holds(SymbolicOp::NotEqual, a, b).isYes()) {
        return notGreater ? DimensionOrder::LessOrEqual
               : notLess  ? DimensionOrder::GreaterOrEqual
                          : DimensionOrder::Open;
    }
    return notGreater ? DimensionOrder::Less : notLess ? DimensionOrder::Greater : DimensionOrder::Different;
}

} // namespace VT
