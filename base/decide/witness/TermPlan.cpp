// Flattens a term into a list of nodes, operands before operators, and evaluates it in one pass.
//
// The list is ordered by identifier, because operands are interned before their operator. Evaluation yields no value as
// soon as one node has none; `&&` and `||` do not hide a division by zero on their right. Linear in the distinct nodes,
// no recursion.
#include "base/decide/witness/TermPlan.hpp"

#include "base/core/Walk.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>

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
    results_.resize(nodes_.size());
}

/// What a shift multiplies or divides by.
void TermPlan::suggestPower(const LeafMeaning& distance) {
    if (distance.kind == LeafMeaning::Kind::Integer && distance.integer >= 0 && distance.integer < 32)
        constants_.push_back(std::int64_t{1} << distance.integer);
}

std::optional<TermPlan::Result> TermPlan::compute(const Node& node) const {
    const Result& a = results_[node.a];
    const Result& b = results_[node.b];
    const auto truth = [](bool value) { return Result{false, value ? 1 : 0, 0}; };
    switch (node.op) {
    case SymbolicOp::Not:
        return truth(!a.holds());
    case SymbolicOp::And:
    case SymbolicOp::SingleAnd:
        return truth(a.holds() && b.holds());
    case SymbolicOp::Or:
    case SymbolicOp::SingleOr:
        return truth(a.holds() || b.holds());
    default:
        break;
    }
    if (comparisonOps.contains(node.op)) {
        if (a.isReal && b.isReal)
            return truth(compareNumbers(node.op, a.real, b.real));
        if (a.isReal)
            return truth(compareExactly(operatorInfo(node.op).mirrored, b.integer, a.real));
        return truth(b.isReal ? compareExactly(node.op, a.integer, b.real)
                              : compareNumbers(node.op, a.integer, b.integer));
    }
    if (node.op == SymbolicOp::UnaryMinus && a.isReal)
        return Result{true, 0, -a.real};
    if (a.isReal || (node.operands > 1 && b.isReal) || node.operands == 0 || node.operands > 2)
        return std::nullopt;
    const auto value =
        node.operands == 1 ? integerResult(node.op, a.integer) : integerResult(node.op, a.integer, b.integer);
    return value ? std::optional(Result{false, *value, 0}) : std::nullopt;
}

std::optional<std::int64_t> TermPlan::value(const std::function<std::int64_t(Unknown)>& valueOf) {
    for (std::size_t i = 0; i < nodes_.size(); ++i) {
        const Node& node = nodes_[i];
        Result& result = results_[i];
        switch (node.leaf.kind) {
        case LeafMeaning::Kind::Integer:
            result = {false, node.leaf.integer, 0};
            break;
        case LeafMeaning::Kind::Real:
            result = {true, 0, node.leaf.real};
            break;
        case LeafMeaning::Kind::Opaque:
            return std::nullopt;
        case LeafMeaning::Kind::CodeGeneration:
            result = {false, 1 - valueOf(node.unknown), 0};
            break;
        case LeafMeaning::Kind::Compound: {
            const auto computed = compute(node);
            if (!computed)
                return std::nullopt;
            result = *computed;
            break;
        }
        default:
            result = {false, valueOf(node.unknown), 0};
        }
    }
    const Result& last = results_.back();
    return last.isReal ? std::int64_t{last.holds()} : last.integer;
}

} // namespace VT
