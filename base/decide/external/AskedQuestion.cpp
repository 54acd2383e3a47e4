// Each kind of question as a truth function, as text and as facts.
#include "base/decide/external/AskedQuestion.hpp"

#include "base/core/Nodes.hpp"
#include "base/util/IdMap.hpp"

#include <algorithm>

namespace VT {

bool isAsAsked(AskedOf asked, const std::vector<bool>& truths) {
    switch (asked) {
    case AskedOf::Holds:
        return truths[0];
    case AskedOf::Fails:
        return !truths[0];
    case AskedOf::Both:
        return truths[0] && truths[1];
    case AskedOf::FirstAlone:
        return truths[0] && !truths[1];
    case AskedOf::Differ:
        return truths[0] != truths[1];
    case AskedOf::DifferGiven:
        return truths[0] != truths[1] && truths[2];
    case AskedOf::NoneHolds:
        return std::ranges::count(truths, true) == 0;
    case AskedOf::TwoHold:
        return std::ranges::count(truths, true) >= 2;
    }
    return false;
}

std::string askedText(AskedOf asked, std::span<const std::string> truths) {
    const auto all = [&](const std::string& function) {
        std::string text = "(" + function;
        for (const std::string& truth : truths)
            text.append(" ").append(truth);
        return text + ")";
    };
    const auto differ = [&] { return "(xor " + truths[0] + " " + truths[1] + ")"; };
    switch (asked) {
    case AskedOf::Holds:
        return truths[0];
    case AskedOf::Fails:
        return "(not " + truths[0] + ")";
    case AskedOf::Both:
        return all("and");
    case AskedOf::FirstAlone:
        return "(and " + truths[0] + " (not " + truths[1] + "))";
    case AskedOf::Differ:
        return differ();
    case AskedOf::DifferGiven:
        return "(and " + truths[2] + " " + differ() + ")";
    case AskedOf::NoneHolds:
        return "(not " + all("or false") + ")";
    case AskedOf::TwoHold:
        return truths.size() < 2 ? "false" : all("(_ at-least 2)");
    }
    return "false";
}

std::vector<AskedFact> factsOf(const SymbolicExprTable& table, AskedOf asked,
                               std::span<const SymbolicExprId> conditions) {
    std::vector<AskedFact> open;
    switch (asked) {
    case AskedOf::Holds:
    case AskedOf::Both:
        for (const SymbolicExprId condition : conditions)
            open.push_back({condition, true});
        break;
    case AskedOf::Fails:
    case AskedOf::NoneHolds:
        for (const SymbolicExprId condition : conditions)
            open.push_back({condition, false});
        break;
    case AskedOf::FirstAlone:
        open = {{conditions[0], true}, {conditions[1], false}};
        break;
    case AskedOf::DifferGiven:
        open = {{conditions[2], true}};
        break;
    case AskedOf::Differ:
    case AskedOf::TwoHold:
        break;
    }
    std::vector<AskedFact> facts;
    IdMap<unsigned> seen; // 1: as holding, 2: as failing
    while (!open.empty()) {
        const AskedFact fact = open.back();
        open.pop_back();
        const unsigned* const before = seen.find(fact.condition);
        const unsigned known = before != nullptr ? *before : 0;
        const unsigned mark = fact.holds ? 1 : 2;
        if ((known & mark) != 0 || !table.has(fact.condition))
            continue;
        seen.insert(fact.condition, known | mark);
        const SymbolicExpr& node = *table.get(fact.condition);
        const SymbolicOp op = node.op();
        const bool splits = fact.holds ? op == SymbolicOp::And || op == SymbolicOp::SingleAnd
                                       : op == SymbolicOp::Or || op == SymbolicOp::SingleOr;
        if (!splits && op != SymbolicOp::Not) {
            facts.push_back(fact);
            continue;
        }
        for (std::size_t i = 0; i < node.getNumInputs(); ++i)
            open.push_back({node.getInput(i), fact.holds != (op == SymbolicOp::Not)});
    }
    return facts;
}

} // namespace VT
