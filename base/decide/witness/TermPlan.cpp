// Flattens a term into a list of nodes, operands before operators, and evaluates it in one pass.
//
// The list is ordered by identifier, because operands are interned before their operator. Evaluation yields no value as
// soon as one node has none; `&&` and `||` do not hide a division by zero on their right. Integers of 64 bits are
// computed directly, other numbers as constant forms. Linear in the distinct nodes, no recursion.
#include "base/decide/witness/TermPlan.hpp"

#include "base/core/Walk.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <cmath>

namespace VT {

TermPlan::TermPlan(const LeafReader& leaves, Unknowns& unknowns, SymbolicExprId term) {
    const SymbolicExprTable& table = leaves.table();
    std::vector<SymbolicExprId> ids;
    IdMap<std::size_t> position;
    std::vector<WalkFrame> stack;
    const auto add = [&](SymbolicExprId id) {
        position.insert(id, 0);
        ids.push_back(id);
    };
    walkUnknown(
        table, term, stack,
        [&](SymbolicExprId id, const SymbolicExpr*) {
            if (position.find(id) != nullptr)
                return true;
            const bool isLeaf = leaves(id).kind != LeafMeaning::Kind::Compound;
            if (isLeaf)
                add(id);
            return isLeaf;
        },
        [&](SymbolicExprId id, const SymbolicExpr&, const SymbolicExpr*) { add(id); },
        [](SymbolicExprId, const SymbolicExpr*) {});
    for (const SymbolicExprId id : ids) {
        const SymbolicExpr& node = *table.get(id);
        Node step{node.op(), leaves(id), noUnknown, 0, 0, 0};
        switch (step.leaf.kind) {
        case LeafMeaning::Kind::Compound:
            step.operands = node.getNumInputs();
            step.a = step.operands > 0 ? *position.find(node.getInput(0)) : 0;
            step.b = step.operands > 1 ? *position.find(node.getInput(1)) : 0;
            if (step.op == SymbolicOp::ShiftLeft || step.op == SymbolicOp::ShiftRight)
                suggestPower(nodes_[step.b].leaf);
            break;
        case LeafMeaning::Kind::Integer:
            constants_.push_back(step.leaf.integer);
            break;
        case LeafMeaning::Kind::Free:
            step.unknown = unknowns.free(step.leaf.node);
            unknowns_.push_back(step.unknown);
            break;
        case LeafMeaning::Kind::Simulation:
        case LeafMeaning::Kind::CodeGeneration:
            step.unknown = unknowns.simulation();
            unknowns_.push_back(step.unknown);
            break;
        default:
            break;
        }
        position.insert(id, nodes_.size());
        nodes_.push_back(step);
    }
}

/// What a shift multiplies or divides by.
void TermPlan::suggestPower(const LeafMeaning& distance) {
    if (distance.kind == LeafMeaning::Kind::Integer && distance.integer >= 0 && distance.integer < 32)
        constants_.push_back(std::int64_t{1} << distance.integer);
}

namespace {

/// The value of logic where there is one: of two truth values.
std::optional<bool> logicResult(SymbolicOp op, bool a, bool b) {
    switch (op) {
    case SymbolicOp::Not:
        return !a;
    case SymbolicOp::And:
    case SymbolicOp::SingleAnd:
        return a && b;
    case SymbolicOp::Or:
    case SymbolicOp::SingleOr:
        return a || b;
    default:
        return std::nullopt;
    }
}

} // namespace

std::optional<std::int64_t> TermPlan::computeSmall(const Node& node, std::int64_t a, std::int64_t b) {
    if (const auto truth = logicResult(node.op, a != 0, b != 0))
        return *truth ? 1 : 0;
    if (comparisonOps.contains(node.op))
        return compareNumbers(node.op, a, b) ? 1 : 0;
    return node.operands == 1 ? integerResult(node.op, a) : integerResult(node.op, a, b);
}

std::optional<TermPlan::Exact> TermPlan::computeExact(const Node& node, const Exact& a, const Exact& b) {
    const auto ofTruth = [](bool truth) { return Exact{RationalForm(LinearForm{{}, truth ? 1 : 0})}; };
    const auto holds = [](const Exact& value) {
        return value.literal ? *value.literal != 0 : value.number.sign() != 0;
    };
    if (const auto truth = logicResult(node.op, holds(a), holds(b)))
        return ofTruth(*truth);
    const bool finite = std::isfinite(a.literal.value_or(0)) && std::isfinite(b.literal.value_or(0));
    if (comparisonOps.contains(node.op)) {
        if (!finite)
            return ofTruth(compareNumbers(node.op, a.literal.value_or(0), b.literal.value_or(0)));
        const auto difference = combine(a.number, 1, b.number, -1);
        return difference ? std::optional(ofTruth(compareNumbers(node.op, difference->sign(), 0))) : std::nullopt;
    }
    if (node.operands == 1 && node.op == SymbolicOp::UnaryMinus && a.literal && a.isReal)
        return ofReal(-*a.literal);
    if (!finite)
        return std::nullopt;
    const bool isReal = a.isReal || b.isReal;
    std::optional<RationalForm> number;
    if (node.operands == 1) {
        const LinearForm* small = a.number.small();
        const auto value = small != nullptr && !isReal ? integerResult(node.op, small->constant) : std::nullopt;
        if (node.op == SymbolicOp::UnaryMinus)
            number = combine(a.number, -1, {}, 0);
        else if (node.op == SymbolicOp::BitCompl && a.number.isInteger() && !isReal)
            number = combine(a.number, -1, LinearForm{{}, -1}, 1);
        else if (value)
            number = RationalForm(BigInteger(*value));
        if (!number)
            return std::nullopt;
        const bool isLiteral = node.op == SymbolicOp::UnaryMinus && a.literal;
        return Exact{*std::move(number), isReal, isLiteral ? std::optional(-*a.literal) : std::nullopt};
    }
    if (isReal && a.literal && b.literal)
        if (const auto folded = foldedReals(node.op, *a.literal, *b.literal))
            return ofReal(*folded);
    number = exactResult(node.op, a.number, b.number, isReal);
    if (!number)
        return std::nullopt;
    Exact result{*std::move(number), isReal};
    if (a.literal && b.literal && !isReal && result.number.small() != nullptr)
        result.literal = static_cast<double>(result.number.small()->constant);
    return result;
}

TermPlan::Exact TermPlan::ofReal(double real) {
    return {std::isfinite(real) ? RationalForm::of(real) : RationalForm(), true, real};
}

/// Computes all nodes; `leaf` and `compute` give the value of one, if it has any.
template <class Results, class Leaf, class Compute>
bool TermPlan::evaluate(Results& results, Leaf leaf, Compute compute) const {
    results.resize(nodes_.size());
    for (std::size_t i = 0; i < nodes_.size(); ++i) {
        const Node& node = nodes_[i];
        const bool isLeaf = node.leaf.kind != LeafMeaning::Kind::Compound;
        if (!isLeaf && (node.operands == 0 || node.operands > 2))
            return false;
        auto value = isLeaf ? leaf(node) : compute(node, results[node.a], results[node.operands > 1 ? node.b : node.a]);
        if (!value)
            return false;
        results[i] = *std::move(value);
    }
    return true;
}

std::optional<std::int64_t> TermPlan::value(const std::function<std::int64_t(Unknown)>& valueOf) {
    using Kind = LeafMeaning::Kind;
    const auto leaf = [&](const Node& node) -> std::optional<std::int64_t> {
        switch (node.leaf.kind) {
        case Kind::Integer:
            return node.leaf.integer;
        case Kind::Real:
        case Kind::Opaque:
            return std::nullopt;
        case Kind::CodeGeneration:
            return 1 - valueOf(node.unknown);
        default:
            return valueOf(node.unknown);
        }
    };
    return evaluate(results_, leaf, computeSmall) ? std::optional(results_.back()) : std::nullopt;
}

std::optional<RationalForm> TermPlan::exactValue(const std::function<BigInteger(Unknown)>& valueOf) {
    using Kind = LeafMeaning::Kind;
    const auto leaf = [&](const Node& node) -> std::optional<Exact> {
        switch (node.leaf.kind) {
        case Kind::Integer:
            return Exact{RationalForm(LinearForm{{}, node.leaf.integer}), false,
                         static_cast<double>(node.leaf.integer)};
        case Kind::Real:
            return ofReal(node.leaf.real);
        case Kind::Opaque:
            return std::nullopt;
        default: {
            RationalForm number(valueOf(node.unknown));
            if (node.leaf.kind != Kind::CodeGeneration)
                return Exact{std::move(number)};
            const auto opposite = combine(number, -1, LinearForm{{}, 1}, 1);
            return opposite ? std::optional(Exact{*opposite}) : std::nullopt;
        }
        }
    };
    std::vector<Exact> results;
    if (!evaluate(results, leaf, computeExact))
        return std::nullopt;
    const Exact& last = results.back();
    if (!last.isReal)
        return last.number;
    const bool holds = last.literal ? *last.literal != 0 : last.number.sign() != 0;
    return RationalForm(LinearForm{{}, holds ? 1 : 0});
}

} // namespace VT
