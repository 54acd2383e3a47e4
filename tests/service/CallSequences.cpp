// Random sequences of calls: the same answers with and without caches, and the truth of what was combined.
#include "tests/service/Customizers.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Truth.hpp"

#include <bitset>

namespace VT::Testing {
namespace {

const std::vector<std::string> symbols{"A", "B"};
constexpr int lowest = -3;
constexpr int highest = 4;
using Truth = std::bitset<64>; ///< by assignment

/// One call, made of what stands at earlier positions of a sequence.
struct Call {
    enum Kind : int { ParseC, And, Or, Not, Simplify, SimplifyText, Kinds } kind;

    std::size_t a;
    std::size_t b;
    bool flag;
    std::string text;
};

std::vector<Call> randomCalls(std::mt19937_64& random) {
    const auto below = [&random](std::size_t bound) { return static_cast<std::size_t>(random() % bound); };
    ConditionShape shape;
    shape.symbols = symbols;
    std::vector<std::string> texts; // few, so that calls repeat
    for (int i = 0; i < 4; ++i)
        texts.push_back(randomCondition(random, 1 + below(4), shape));
    texts.insert(texts.end(), {"", "true", "false"});
    std::vector<Call> calls;
    for (std::size_t i = 0; i < 25; ++i) {
        const auto kind = static_cast<Call::Kind>(i == 0 ? 0 : below(Call::Kinds));
        calls.push_back({kind, below(std::max<std::size_t>(i, 1)), below(std::max<std::size_t>(i, 1)), below(2) == 1,
                         texts[below(texts.size())]});
    }
    return calls;
}

Truth truthOf(SymbolicExprId condition) {
    Truth truth;
    std::size_t at = 0;
    forEachAssignment(symbols, lowest, highest, [&](const Assignment& assignment) {
        truth[at++] = holds(VCService::getInstance().table(), condition, assignment);
    });
    return truth;
}

/// The results of a sequence of calls, each with the texts that it prints as.
struct Transcript {
    std::vector<SymbolicExprId> ids;
    std::vector<std::string> texts;
    std::vector<Truth> truths;
};

Transcript play(const std::vector<Call>& calls, bool caching) {
    const FreshService service(caching);
    Transcript transcript;
    for (const Call& call : calls) {
        const auto id = [&](std::size_t at) { return VCSymbolicExprId(transcript.ids[at]); };
        const auto result = [&]() -> VCSymbolicExprId {
            switch (call.kind) {
            case Call::ParseC:
                return service->parseC(call.text);
            case Call::And:
                return service->AND(id(call.a), id(call.b), call.flag);
            case Call::Or:
                return service->OR(id(call.a), id(call.b), call.flag);
            case Call::Not:
                return service->NOT(id(call.a), call.flag);
            case Call::Simplify:
                return service->simplify(id(call.a), call.flag);
            default:
                return service->simplifyFromCCondition(call.text);
            }
        }();
        transcript.ids.push_back(result.id());
        transcript.texts.push_back(service->printCExpr(result) + "  " + service->printQExpr(result));
        transcript.truths.push_back(truthOf(result.id()));
    }
    return transcript;
}

/// What the result of a call means, from what its operands mean.
Truth expectedTruth(const Call& call, const std::vector<Truth>& truths, const Truth& ofText) {
    switch (call.kind) {
    case Call::And:
        return truths[call.a] & truths[call.b];
    case Call::Or:
        return truths[call.a] | truths[call.b];
    case Call::Not:
        return ~truths[call.a];
    case Call::Simplify:
        return truths[call.a];
    default:
        return ofText;
    }
}

RC_GTEST_PROP(CallSequence, AnswersAlikeWithAndWithoutCachesAndKeepsTheTruth, ()) {
    std::mt19937_64 random(*rc::gen::arbitrary<std::uint64_t>());
    const std::vector<Call> calls = randomCalls(random);
    const Transcript cached = play(calls, true);
    const Transcript plain = play(calls, false);
    RC_ASSERT(cached.ids == plain.ids);
    RC_ASSERT(cached.texts == plain.texts);
    for (std::size_t i = 0; i < calls.size(); ++i) {
        const FreshService service;
        const Truth ofText = truthOf(service->parseC(calls[i].text));
        RC_ASSERT(cached.truths[i] == expectedTruth(calls[i], cached.truths, ofText));
    }
}

} // namespace
} // namespace VT::Testing
