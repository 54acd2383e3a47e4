// Random sequences of calls: the same answers with and without caches, and the truth of what was combined.
#include "tests/service/Customizers.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <bitset>

namespace VT::Testing {
namespace {

using Bits = std::bitset<64>; ///< the truth by assignment

Bits truthOf(SymbolicExprId condition) {
    Bits truth;
    std::size_t at = 0;
    forEachAssignment({"A", "B"}, -3, 4, [&](const Assignment& assignment) {
        truth[at++] = holds(VCService::getInstance().table(), condition, assignment);
    });
    return truth;
}

/// Plays a random sequence of calls on texts and earlier results; the results, each with its texts.
std::vector<std::string> play(std::uint64_t seed, bool caching) {
    std::mt19937_64 random(seed);
    const auto below = [&random](std::size_t bound) { return static_cast<std::size_t>(random() % bound); };
    std::vector<std::string> texts{"", "true", "false"}; // few, so that calls repeat
    std::vector<Bits> truthOfTexts;
    while (texts.size() < 7)
        texts.push_back(randomCondition(random, 1 + below(4), {.symbols = {"A", "B"}}));
    for (const std::string& text : texts)
        truthOfTexts.push_back(truthOf(FreshService()->parseC(text)));

    const FreshService service(caching);
    std::vector<std::pair<SymbolicExprId, Bits>> results{{service->parseC(texts[3]), truthOfTexts[3]}};
    std::vector<std::string> told;
    while (results.size() < 25) {
        const auto [a, truthOfA] = results[below(results.size())];
        const auto [b, truthOfB] = results[below(results.size())];
        const std::size_t text = below(texts.size());
        const bool flag = below(2) == 1;
        const std::array<std::function<std::pair<VCSymbolicExprId, Bits>()>, 6> calls{
            [&] { return std::pair(service->parseC(texts[text]), truthOfTexts[text]); },
            [&] { return std::pair(service->simplifyFromCCondition(texts[text]), truthOfTexts[text]); },
            [&] { return std::pair(service->AND(a, b, flag), truthOfA & truthOfB); },
            [&] { return std::pair(service->OR(a, b, flag), truthOfA | truthOfB); },
            [&] { return std::pair(service->NOT(a, flag), ~truthOfA); },
            [&] { return std::pair(service->simplify(a, flag), truthOfA); },
        };
        const auto [result, truth] = calls[below(calls.size())]();
        RC_ASSERT(truthOf(result.id()) == truth);
        results.emplace_back(result.id(), truth);
        told.push_back(std::to_string(result.id()) + "  " + service->printCExpr(result) + "  " +
                       service->printQExpr(result));
    }
    return told;
}

RC_GTEST_PROP(CallSequence, AnswersAlikeWithAndWithoutCachesAndKeepsTheTruth, (std::uint64_t seed)) {
    RC_ASSERT(play(seed, true) == play(seed, false));
}

} // namespace
} // namespace VT::Testing
