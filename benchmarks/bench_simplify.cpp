// Normal and shortest forms of conditions: of the corpus, and of random ones beside a minimiser over truth tables.
#include "base/VCService.hpp"
#include "base/simplify/Simplify.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatMinimiser.hpp"
#include "benchmarks/floors/FlatText.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <memory>
#include <random>

namespace VT::Benchmarks {
namespace {

void corpusLibrary(benchmark::State& state, std::int64_t) {
    struct Parsed {
        SymbolicExprTable table;
        std::vector<SymbolicExprId> ids;
    };

    measure(
        state,
        [] {
            auto parsed = std::make_unique<Parsed>();
            parsed->table.addBoolSymbols();
            for (const std::string& line : readableLines())
                parsed->ids.push_back(SymbolicExprParser(parsed->table, true, false)(line));
            return parsed;
        },
        [](auto& parsed) {
            const SymbolicExprSimplify simplifier(parsed->table);
            std::uint64_t passes = 0;
            for (const SymbolicExprId id : parsed->ids)
                benchmark::DoNotOptimize(simplifier.simplify(id, passes));
        });
}

/// The corpus in a service of its own.
struct ServiceCorpus {
    ServiceCorpus() {
        for (const std::string& line : readableLines())
            ids.push_back(service->parseC(line));
    }

    VCServiceHandle service;
    std::vector<SymbolicExprId> ids;
};

void shortestLibrary(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<ServiceCorpus>(); },
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->ids)
                benchmark::DoNotOptimize(corpus->service->shortestCondition(id, false));
        });
}

void shortestFloor(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<ServiceCorpus>(); },
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->ids)
                benchmark::DoNotOptimize(corpus->service->simplify(id, false));
        });
}

constexpr std::size_t randomConditions = 5000;

/// Conditions of 3 to 12 comparisons over three symbols.
const std::vector<std::string>& randomTexts() {
    static const std::vector<std::string> texts = [] {
        std::mt19937_64 random(19);
        std::vector<std::string> all;
        for (std::size_t i = 0; i < randomConditions; ++i)
            all.push_back(Testing::randomCondition(random, 3 + i % 10, {.lowest = -1, .highest = 2}));
        return all;
    }();
    return texts;
}

/// The random conditions in a service of its own, and what they become.
struct RandomCorpus {
    RandomCorpus() {
        for (const std::string& text : randomTexts())
            given.push_back(service->parseC(text));
    }

    /// Reports how many of the given comparisons are left, and how many results are proven smallest.
    void report(benchmark::State& state) const {
        const SymbolicExprTable& table = service->table();
        std::size_t before = 0;
        std::size_t after = 0;
        for (const SymbolicExprId id : given)
            before += Testing::countComparisons(table, id);
        for (const SymbolicExprId id : results)
            after += id == table.getIdTRUE() || id == table.getIdFALSE() ? 0 : Testing::countComparisons(table, id);
        state.counters["of the comparisons kept"] = static_cast<double>(after) / static_cast<double>(before);
        if (smallest > 0)
            state.counters["proven smallest"] = static_cast<double>(smallest) / static_cast<double>(results.size());
    }

    VCServiceHandle service;
    std::vector<SymbolicExprId> given;
    std::vector<SymbolicExprId> results;
    std::size_t smallest = 0;
};

std::unique_ptr<RandomCorpus> randomCorpus() {
    return std::make_unique<RandomCorpus>();
}

void randomNormalForms(benchmark::State& state, std::int64_t) {
    measure(
        state, randomCorpus,
        [](auto& corpus) {
            SymbolicExprTable& table = corpus->service->table();
            const SymbolicExprSimplify simplifier(table);
            for (const SymbolicExprId id : corpus->given) {
                SymbolicExprSimplifyVisitor visitor(table, true, simplifier.printer());
                std::uint64_t passes = 0;
                corpus->results.push_back(simplifier.simplify(id, passes, visitor));
                corpus->smallest += visitor.isSmallest(corpus->results.back()) ? 1 : 0;
            }
        },
        [&](const auto& corpus) { corpus->report(state); });
}

void randomShortestForms(benchmark::State& state, std::int64_t) {
    measure(
        state, randomCorpus,
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->given)
                corpus->results.push_back(corpus->service->shortestCondition(id, false).id());
        },
        [&](const auto& corpus) { corpus->report(state); });
}

/// The random conditions as records.
struct RandomRecords {
    RandomRecords() {
        for (const std::string& text : randomTexts())
            given.push_back(Floor::read(table, text));
    }

    Floor::FlatTable table;
    std::vector<std::uint32_t> given;
    std::size_t after = 0;
};

void randomFloor(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<RandomRecords>(); },
        [](auto& records) {
            Floor::FlatMinimiser minimiser(records->table);
            for (const std::uint32_t id : records->given) {
                benchmark::DoNotOptimize(minimiser.run(id));
                records->after += minimiser.comparisons();
            }
        },
        [&](const auto& records) {
            std::size_t before = 0;
            for (const std::string& text : randomTexts()) // a name in each comparison
                before +=
                    static_cast<std::size_t>(std::ranges::count_if(text, [](char c) { return c >= 'A' && c <= 'C'; }));
            state.counters["of the comparisons kept"] =
                static_cast<double>(records->after) / static_cast<double>(before);
        });
}

const bool registered = [] {
    compare({.name = "normal forms of random conditions",
             .library = randomNormalForms,
             .floor = randomFloor,
             .items = randomConditions,
             .unit = "condition",
             .mark = 1,
             .goal = 0.5});
    compare({.name = "shortest forms of random conditions",
             .library = randomShortestForms,
             .floor = randomFloor,
             .items = randomConditions,
             .unit = "condition"});
    compare({.name = "normal forms of the corpus",
             .library = corpusLibrary,
             .floor = nullptr,
             .items = static_cast<double>(readableLines().size()),
             .unit = "line",
             .goalSeconds = 2e-6});
    compare({.name = "shortest forms of the corpus (floor: its normal forms)",
             .library = shortestLibrary,
             .floor = shortestFloor,
             .items = static_cast<double>(readableLines().size()),
             .unit = "line"});
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
