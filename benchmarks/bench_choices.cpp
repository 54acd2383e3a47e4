// Checks of whole choice sets beside reading their conditions, from 10 to 100,000 choices.
#include "base/VCService.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/service/VCServiceHandle.hpp"
#include "benchmarks/Comparison.hpp"

#include <memory>
#include <string>
#include <vector>

namespace VT::Benchmarks {
namespace {

/// Choices that are apart but for a gap: combinations of the values of seven names.
std::string combination(std::int64_t at) {
    std::string text;
    for (int name = 0; name < 7; ++name, at /= 6)
        text += (name == 0 ? "N" : " && N") + std::to_string(name) + " == " + std::to_string(at % 6);
    return text;
}

struct Set {
    VCServiceHandle service;
    std::vector<SymbolicExprId> choices;
};

std::unique_ptr<Set> setOf(std::int64_t size) {
    auto set = std::make_unique<Set>();
    for (std::int64_t i = 0; i < size; ++i)
        set->choices.push_back(set->service->parseC(combination(i)));
    return set;
}

template <ChoicePolicy policy>
void checkSet(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return setOf(size); },
        [](auto& set) {
            const ChoiceSetReport report =
                ChoiceSetChecker(*set->service).check(set->service->parseC("true"), set->choices, std::nullopt, policy);
            benchmark::DoNotOptimize(report.findings.size());
        });
}

/// What a check cannot do without: every condition decided alone.
void readSet(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return setOf(size); },
        [](auto& set) {
            for (const SymbolicExprId choice : set->choices)
                benchmark::DoNotOptimize(set->service->canHold(choice));
        });
}

const bool registered = [] {
    for (const std::int64_t choices : {10, 100, 1000, 10000, 100000}) {
        const std::string count = std::to_string(choices);
        compare({.name = "check " + count + " choices (floor: each alone)",
                 .library = checkSet<ChoicePolicy::Unique>,
                 .floor = readSet,
                 .size = choices,
                 .items = static_cast<double>(choices),
                 .unit = "choice"});
        compare({.name = "check " + count + " choices, the first counts (floor: each alone)",
                 .library = checkSet<ChoicePolicy::First>,
                 .floor = readSet,
                 .size = choices,
                 .items = static_cast<double>(choices),
                 .unit = "choice"});
    }
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
