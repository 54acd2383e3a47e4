// Compares the calls of a witness by their functions and the values of their arguments.
//
// Arguments are evaluated under the witness, and calls are sorted by name and values, so that the calls to compare are
// neighbours. A call with an argument without a value is equal to no other. What is found depends on the calls'
// order alone. n log n comparisons of argument lists, and one for each pair of neighbours with equal ones.
#include "base/decide/witness/CallCongruence.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"

#include <algorithm>
#include <vector>

namespace VT {

namespace {

struct Call {
    SymbolicExprId name;
    std::vector<BigInteger> arguments;
    std::size_t position; ///< in the order of the calls
    std::int64_t value;
};

} // namespace

bool isFunctionCall(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* node = table.get(id);
    if (!callOps.contains(node->op()) || node->getNumInputs() < 2)
        return false;
    const SymbolicExpr* name = table.get(node->getInput(0));
    if (name == nullptr || name->op() != SymbolicOp::String)
        return false;
    const std::string& text = static_cast<const SymbolicString*>(name)->getName();
    return text != "defined" && !text.starts_with("__has_");
}

std::vector<std::pair<SymbolicExprId, SymbolicExprId>>
CallCongruence::findViolations(std::span<const SymbolicExprId> calls, const Witness& witness) {
    const SymbolicExprTable& table = leaves_.table();
    IdMap<std::int64_t> values;
    std::int64_t simulation = 0;
    for (const UnknownValue& each : witness) {
        values.insert(each.unknown, each.value);
        const LeafMeaning::Kind kind = leaves_(each.unknown).kind;
        if (kind == LeafMeaning::Kind::Simulation || kind == LeafMeaning::Kind::CodeGeneration)
            simulation = (kind == LeafMeaning::Kind::Simulation) == (each.value != 0) ? 1 : 0;
    }
    const auto valueOf = [&](Unknown unknown) -> BigInteger {
        const UnknownInfo& info = unknowns_[unknown];
        if (info.kind == UnknownKind::Simulation)
            return simulation;
        const std::int64_t* found = values.find(info.node);
        return found != nullptr ? *found : 0;
    };
    std::vector<Call> all;
    for (std::size_t i = 0; i < calls.size(); ++i) {
        const std::int64_t* value = values.find(calls[i]);
        if (value == nullptr)
            continue;
        const SymbolicExpr& node = *table.get(calls[i]);
        Call call{node.getInput(0), {}, i, *value};
        for (std::size_t at = 1; at < node.getNumInputs(); ++at) {
            TermPlan& plan = plans_.of(node.getInput(at));
            steps_.take(plan.size() + 1);
            const auto argument = plan.exactValue(valueOf);
            const auto integer = argument ? argument->integer() : std::nullopt;
            if (!integer)
                break;
            call.arguments.push_back(*integer);
        }
        if (call.arguments.size() + 1 == node.getNumInputs())
            all.push_back(std::move(call));
    }
    const auto before = [](const Call& a, const Call& b) {
        if (a.name != b.name)
            return a.name < b.name;
        return a.arguments != b.arguments ? a.arguments < b.arguments : a.position < b.position;
    };
    std::ranges::sort(all, before);
    std::vector<std::pair<std::size_t, std::size_t>> violations;
    for (std::size_t i = 0; i < all.size(); ++i) {
        const Call& a = all[i];
        for (std::size_t j = i + 1; j < all.size() && violations.size() < limits::callPairs; ++j) {
            const Call& b = all[j];
            steps_.take();
            if (a.name != b.name || a.arguments != b.arguments)
                break;
            if (a.value != b.value)
                violations.emplace_back(a.position, b.position);
        }
    }
    std::ranges::sort(violations);
    std::vector<std::pair<SymbolicExprId, SymbolicExprId>> pairs;
    pairs.reserve(violations.size());
    for (const auto& [first, second] : violations)
        pairs.emplace_back(calls[first], calls[second]);
    return pairs;
}

} // namespace VT
