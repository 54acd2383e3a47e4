// Graphs of any operators: what the parts of the library make of them, judged by exact values.
#include "base/transform/QuillConversion.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "tests/support/oracles/Agreement.hpp"

namespace VT::Fuzz {

namespace {

constexpr std::size_t mostOperators = 20; ///< as each may double the text
constexpr std::size_t assignmentCount = 24;

/// Calls with an Agreement about the condition that the input chooses, in a fresh service.
template <class Demands>
void judge(Input input, Demands demands) {
    Choices choices(input);
    const std::uint8_t flags = choices.byte();
    const Testing::ConditionWorld world{.reals = (flags & 1U) != 0, .calls = (flags & 2U) != 0};
    VCService service;
    service.setSolver(false);
    const SymbolicExprId id = chosenCondition(service.table(), choices, mostOperators, world);
    service.table().addBoolSymbols();
    try {
        demands(Testing::Agreement(service, id, world, someAssignments(world, assignmentCount)), service, id);
        demand(true, "the parts of the library agree");
    } catch (const Testing::Disagreement& disagreement) {
        demand(false, "the parts of the library agree", disagreement.what());
    }
}

} // namespace

void fuzzSimplify(Input input) {
    judge(input, [](const Testing::Agreement& agreement, auto&&...) { agreement.demandSimplified(); });
}

void fuzzShortest(Input input) {
    judge(input, [](const Testing::Agreement& agreement, auto&&...) { agreement.demandShortest(); });
}

void fuzzReadBackC(Input input) {
    judge(input, [](const Testing::Agreement& agreement, auto&&...) { agreement.demandReadBack(false); });
}

void fuzzReadBackQuill(Input input) {
    judge(input, [](const Testing::Agreement& agreement, auto&&...) { agreement.demandReadBack(true); });
}

void fuzzConversion(Input input) {
    judge(input, [](const Testing::Agreement& agreement, VCService& service, SymbolicExprId id) {
        const SymbolicExprC2Q toQuill(service.table());
        const SymbolicExprQ2C toC(service.table());
        const SymbolicExprId c = toC(id);
        const SymbolicExprId quill = toQuill(id);
        demand(service.table().has(c) && service.table().has(quill), "a conversion of a condition is one");
        demand(toC(c) == c && toQuill(quill) == quill, "a conversion settles at once", service.printCExpr(id));
        agreement.demandSame("C shape", c);
        agreement.demandSame("C shape after Quill shape", toC(quill));
    });
}

} // namespace VT::Fuzz
