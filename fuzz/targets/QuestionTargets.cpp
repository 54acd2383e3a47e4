// Questions about two conditions, as texts so that dictionaries apply; and about choices, against brute force.
#include "base/choices/ChoiceSetChecker.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/oracles/Agreement.hpp"

#include <algorithm>
#include <set>

namespace VT::Fuzz {

namespace {

using Testing::Agreement;
using Testing::Assignment;

/// The first condition against the second, which both are texts in C.
template <class Demands>
void judgeTexts(Input input, Demands demands) {
    Choices choices(input);
    const std::string first = choices.text();
    const std::string second = choices.text();
    VCService service;
    service.setSolver(false);
    service.table().addBoolSymbols();
    SymbolicExprId a = invalidId;
    SymbolicExprId b = invalidId;
    try {
        a = service.parseC(first);
        b = service.parseC(second);
    } catch (const HostDiagnostic&) {
        return;
    }
    const Testing::ConditionWorld world{.names = {"A", "B", "C"}};
    try {
        demands(Agreement(service, a, world, someAssignments(world, 32)), service, a, b);
        demand(true, "the parts of the library agree");
    } catch (const Testing::Disagreement& disagreement) {
        demand(false, "the parts of the library agree", disagreement.what());
    }
}

std::optional<bool> holdsUnder(const Testing::ExactValue& value, const Assignment& assignment) {
    const auto number = value.under(assignment);
    return number ? std::optional(number->holds()) : std::nullopt;
}

/// A comparison of a or b with a small number.
std::string chosenComparison(Choices& choices) {
    static const std::vector<std::string> operators{"==", "!=", "<", "<=", ">", ">="};
    const std::string name = choices.below(2) == 0 ? "A" : "B";
    const std::size_t kind = choices.below(8);
    const std::string right = kind == 0 ? (name == "A" ? "B" : "A") : std::to_string(choices.below(6)) + "-1";
    return (kind == 1 ? name + "%2" : kind == 2 ? "A+B" : name) + choices.of(operators) + "(" + right + ")";
}

std::string chosenText(Choices& choices) {
    std::string text = chosenComparison(choices);
    for (std::size_t more = choices.below(4); more > 0; --more) {
        text = "(" + text + ")" + (choices.below(2) == 0 ? "&&" : "||") + chosenComparison(choices);
        if (choices.below(8) == 0)
            text = "!(" + text + ")";
    }
    return text;
}

} // namespace

void fuzzDecide(Input input) {
    judgeTexts(input, [](const Agreement& agreement, VCService& service, SymbolicExprId a, SymbolicExprId b) {
        agreement.demandDecided(b);
        const Relation there = service.compare(a, b);
        const Relation back = service.compare(b, a);
        demand(there.onlyA.answer == back.onlyB.answer && there.both.answer == back.both.answer,
               "a comparison is the same from both sides", service.printCExpr(a) + "\n" + service.printCExpr(b));
    });
}

void fuzzDecide32Bits(Input input) {
    judgeTexts(input, [](const Agreement&, VCService& service, SymbolicExprId a, SymbolicExprId b) {
        service.setDecisions32Bit(true);
        const Relation relation = service.compare(a, b);
        const Testing::ExactValue first(service.table(), a);
        const Testing::ExactValue second(service.table(), b);
        for (const Assignment& assignment : someAssignments({.names = {"A", "B", "C"}}, 32)) {
            const auto x = holdsUnder(first, assignment);
            const auto y = holdsUnder(second, assignment);
            if (x && y)
                demand(!(*x && !*y && relation.onlyA.isNo()) && !(*y && !*x && relation.onlyB.isNo()) &&
                           !(*x && *y && relation.both.isNo()),
                       "what is proven of 32 bits holds at their corners",
                       service.printCExpr(a) + "\n" + service.printCExpr(b));
        }
        for (const Decision* each : {&relation.onlyA, &relation.onlyB, &relation.both})
            for (const UnknownValue& unknown : each->witness.value_or(Witness()))
                demand(unknown.value == static_cast<std::int32_t>(unknown.value), "a witness is of 32 bits");
    });
}

void fuzzGiven(Input input) {
    judgeTexts(input, [](const Agreement& agreement, VCService&, SymbolicExprId, SymbolicExprId known) {
        agreement.demandGiven(known);
    });
}

void fuzzCheck(Input input) {
    Choices choices(input);
    VCService service;
    service.setSolver(false);
    const auto policy = static_cast<ChoicePolicy>(choices.below(3));
    const int low = -2;
    const int high = 5;
    const SymbolicExprId parent = service.parseC("A+B<99 && (" + chosenText(choices) + ")"); // has both names
    std::vector<SymbolicExprId> ids;
    for (std::size_t count = 1 + choices.below(5); count > 0; --count)
        ids.push_back(service.parseC(chosenText(choices)));
    const ChoiceSetOptions options{.reasons = choices.below(2) == 0,
                                   .merges = choices.below(2) == 0,
                                   .domains = {{.symbol = service.parseC("A"), .min = low, .max = high},
                                               {.symbol = service.parseC("B"), .min = low, .max = high}}};
    const ChoiceSetReport report = ChoiceSetChecker(service, options).check(parent, ids, std::nullopt, policy);

    std::vector<Testing::Truth> truths;
    for (const SymbolicExprId id : ids)
        truths.emplace_back(service.table(), id);
    std::vector<std::size_t> active(ids.size());
    std::set<std::pair<std::size_t, std::size_t>> overlaps;
    bool isReached = false;
    bool hasGap = false;
    const Testing::Truth around(service.table(), parent);
    Testing::forEachAssignment({"A", "B"}, low, high, [&](const Assignment& values) {
        if (around.under(values).value() == 0)
            return;
        isReached = true;
        std::vector<std::size_t> on;
        for (std::size_t i = 0; i < ids.size(); ++i)
            if (truths[i].under(values).value() != 0)
                on.push_back(i);
        hasGap = hasGap || on.empty();
        for (std::size_t i = 0; i < on.size(); ++i) {
            active[on[i]] += policy != ChoicePolicy::First || i == 0 ? 1U : 0U;
            for (std::size_t j = i + 1; j < on.size(); ++j)
                overlaps.emplace(on[i], on[j]);
        }
    });
    std::string texts = service.printCExpr(parent);
    for (const SymbolicExprId id : ids)
        texts += "\n" + service.printCExpr(id);
    demand(report.undecided.empty(), "two names of eight values are decided", texts);
    demand(report.parentNeverHolds == !isReached, "the parent holds where it does", texts);
    if (!isReached)
        return;
    std::vector<bool> isDead(ids.size(), false);
    std::set<std::pair<std::size_t, std::size_t>> found;
    bool isMissing = false;
    for (const ChoiceFinding& finding : report.findings) {
        if (finding.fault == ChoiceFault::Dead)
            isDead[finding.choice] = true;
        if (finding.fault == ChoiceFault::Overlap)
            found.emplace(std::min(finding.choice, finding.other), std::max(finding.choice, finding.other));
        isMissing = isMissing || finding.fault == ChoiceFault::Missing;
    }
    for (std::size_t i = 0; i < ids.size(); ++i)
        demand(isDead[i] == (active[i] == 0), "a choice is dead where it is never active", texts);
    demand(isMissing == hasGap, "a gap is found where there is one", texts);
    demand(policy == ChoicePolicy::Unique ? found == overlaps : found.empty(), "overlaps are those there are", texts);
}

} // namespace VT::Fuzz
