#include "tests/support/Truth.hpp"

#include "base/print/ExpressionPrinter.hpp"

#include <set>
#include <stdexcept>

namespace VT::Testing {

namespace {

/// Calls and members have a value of their own, whatever their operands.
bool standsForItself(const SymbolicExprTable& table, SymbolicExprId id) {
    return callOps.contains(table.get(id)->op()) || table.get(id)->op() == SymbolicOp::MemberValue;
}

/// The nodes below and including a root; operands have smaller identifiers than their node.
std::set<SymbolicExprId> reachable(const SymbolicExprTable& table, SymbolicExprId root) {
    std::set<SymbolicExprId> nodes;
    std::vector<SymbolicExprId> pending{root};
    while (!pending.empty()) {
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        if (!nodes.insert(id).second || standsForItself(table, id))
            continue;
        for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
            pending.push_back(table.get(id)->getInput(i));
    }
    return nodes;
}

std::int64_t lookUp(const std::string& name, const Assignment& assignment) {
    if (name == "true" || name == "false")
        return name == "true" ? 1 : 0;
    const auto found = assignment.find(name);
    return found == assignment.end() ? 0 : found->second;
}

} // namespace

std::int64_t valueOf(const SymbolicExprTable& table, SymbolicExprId root, const Assignment& assignment) {
    std::map<SymbolicExprId, std::int64_t> values;
    for (const SymbolicExprId id : reachable(table, root)) {
        const SymbolicExpr& node = *table.get(id);
        if (standsForItself(table, id)) {
            values[id] = lookUp(SymbolicExprPrinter(table, false)(id), assignment);
            continue;
        }
        const auto in = [&](std::size_t i) { return values.at(node.getInput(i)); };
        values[id] = [&]() -> std::int64_t {
            switch (node.op()) {
            case SymbolicOp::String:
                return lookUp(static_cast<const SymbolicString&>(node).getName(), assignment);
            case SymbolicOp::IntValue:
                return static_cast<const SymbolicIntValue&>(node).getValue();
            case SymbolicOp::Plus:
                return in(0) + in(1);
            case SymbolicOp::Minus:
                return in(0) - in(1);
            case SymbolicOp::UnaryMinus:
                return -in(0);
            case SymbolicOp::Multiply:
                return in(0) * in(1);
            case SymbolicOp::Equal:
                return in(0) == in(1);
            case SymbolicOp::NotEqual:
                return in(0) != in(1);
            case SymbolicOp::LessThan:
                return in(0) < in(1);
            case SymbolicOp::LessThanEqual:
                return in(0) <= in(1);
            case SymbolicOp::GreaterThan:
                return in(0) > in(1);
            case SymbolicOp::GreaterThanEqual:
                return in(0) >= in(1);
            case SymbolicOp::And:
            case SymbolicOp::SingleAnd:
                return in(0) != 0 && in(1) != 0;
            case SymbolicOp::Or:
            case SymbolicOp::SingleOr:
                return in(0) != 0 || in(1) != 0;
            case SymbolicOp::Not:
                return in(0) == 0;
            case SymbolicOp::Divide:
                return in(1) == 0 ? throw NoValue() : in(0) / in(1);
            case SymbolicOp::Modulo:
                return in(1) == 0 ? throw NoValue() : in(0) % in(1);
            case SymbolicOp::BitAnd:
                return in(0) & in(1);
            case SymbolicOp::BitOr:
                return in(0) | in(1);
            case SymbolicOp::BitXOr:
                return in(0) ^ in(1);
            case SymbolicOp::BitCompl:
                return ~in(0);
            case SymbolicOp::ShiftRight:
                return in(0) >> in(1);
            case SymbolicOp::ShiftLeft:
                return in(0) * (std::int64_t{1} << in(1));
            default:
                throw std::logic_error("no brute-force value of " + std::string(operatorInfo(node.op()).className));
            }
        }();
    }
    return values.at(root);
}

void forEachAssignment(const std::vector<std::string>& symbols, std::int64_t low, std::int64_t high,
                       const std::function<void(const Assignment&)>& visit) {
    Assignment assignment;
    for (const std::string& symbol : symbols)
        assignment[symbol] = low;
    for (;;) {
        visit(assignment);
        auto next = assignment.begin();
        while (next != assignment.end() && next->second == high) {
            next->second = low;
            ++next;
        }
        if (next == assignment.end())
            return;
        ++next->second;
    }
}

std::size_t countComparisons(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr& node = *table.get(id);
    if (node.op() != SymbolicOp::And && node.op() != SymbolicOp::Or && node.op() != SymbolicOp::Not)
        return id == table.getIdTRUE() || id == table.getIdFALSE() ? 0 : 1;
    std::size_t count = 0;
    for (std::size_t i = 0; i < node.getNumInputs(); ++i)
        count += countComparisons(table, node.getInput(i));
    return count;
}

} // namespace VT::Testing
