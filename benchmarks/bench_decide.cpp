// Decisions about pairs of real conditions beside a general solver, and how the cost grows with atoms and choices.
// Both sides answer with an assignment where there is one; that of the library is the smallest.
#include "base/decide/Decider.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"
#include "tests/support/oracles/Solver.hpp"

#include <algorithm>
#include <cstdio>
#include <map>
#include <memory>

namespace VT::Benchmarks {
namespace {

using Pairs = std::vector<std::pair<SymbolicExprId, SymbolicExprId>>;

/// The corpus in one table, and its neighbours among the lines that share a symbol: the pairs that a tool asks about.
struct Corpus {
    Corpus() {
        table.addBoolSymbols();
        std::map<std::string, std::vector<SymbolicExprId>> bySymbol;
        for (const std::string& line : readableLines()) {
            const SymbolicExprId id = SymbolicExprParser(table, true, false)(line);
            std::vector<std::string> symbols;
            table.getSymbolsFromExpression(id, symbols);
            for (const std::string& symbol : symbols)
                if (symbol != "defined")
                    bySymbol[symbol].push_back(id);
        }
        for (const auto& [symbol, ids] : bySymbol)
            for (std::size_t i = 1; i < ids.size(); ++i)
                pairs.emplace_back(ids[i - 1], ids[i]);
    }

    SymbolicExprTable table;
    Pairs pairs;
};

const Corpus& corpus() {
    static const Corpus all;
    return all;
}

/// Whether the first implies the second, for every pair; conditions are read on the way.
void implyLibrary(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<Decider>(corpus().table); },
        [](auto& decider) {
            for (const auto& [a, b] : corpus().pairs)
                benchmark::DoNotOptimize(decider->implies(a, b));
        });
}

/// The same where every condition was read before.
void implyAgainLibrary(benchmark::State& state, std::int64_t) {
    measure(
        state,
        [] {
            auto decider = std::make_unique<Decider>(corpus().table);
            for (const auto& [a, b] : corpus().pairs)
                benchmark::DoNotOptimize(decider->overlaps(a, b));
            return decider;
        },
        [](auto& decider) {
            for (const auto& [a, b] : corpus().pairs)
                benchmark::DoNotOptimize(decider->implies(a, b));
        },
        [&](auto& decider) {
            state.counters["pairs undecided"] =
                static_cast<double>(std::ranges::count_if(corpus().pairs, [&](const auto& pair) {
                    return decider->classify(pair.first, pair.second).kind == RelationKind::Undecided;
                }));
        });
}

void implySolver(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<Testing::Solver>(corpus().table); },
        [](auto& solver) {
            for (const auto& [a, b] : corpus().pairs)
                benchmark::DoNotOptimize(solver->canHold(solver->truth(a), solver->negated(solver->truth(b))));
        });
}

void implyAgainSolver(benchmark::State& state, std::int64_t) {
    measure(
        state,
        [] {
            auto solver = std::make_unique<Testing::Solver>(corpus().table);
            for (const auto& [a, b] : corpus().pairs) {
                solver->truth(a);
                solver->truth(b);
            }
            return solver;
        },
        [](auto& solver) {
            for (const auto& [a, b] : corpus().pairs)
                benchmark::DoNotOptimize(solver->canHold(solver->truth(a), solver->negated(solver->truth(b))));
        });
}

/// A set of conditions in a table of its own.
struct Set {
    SymbolicExprTable table;
    std::vector<SymbolicExprId> ids;
};

using Build = std::string (*)(std::int64_t at, std::int64_t size);

std::string choice(std::int64_t at, std::int64_t size) {
    return "MODE==" + std::to_string(at * 7919 % size) + " && LEVEL>0";
}

std::string switchOf(std::int64_t at, std::int64_t) {
    return "defined(FEATURE_" + std::to_string(at * 7919 % 100003) + ")";
}

std::string step(std::int64_t at, std::int64_t size) {
    return "S" + std::to_string(at) + "<S" + std::to_string((at + 1) % size);
}

template <Build build>
std::unique_ptr<Set> setOf(std::int64_t size) {
    auto set = std::make_unique<Set>();
    set->table.addBoolSymbols();
    for (std::int64_t i = 0; i < size; ++i)
        set->ids.push_back(SymbolicExprParser(set->table, true, false)(build(i, size)));
    return set;
}

/// One condition of so many atoms, joined by &&.
template <Build build>
std::unique_ptr<Set> conjunctionOf(std::int64_t size) {
    auto set = setOf<build>(size);
    SymbolicExprId all = set->ids.front();
    for (std::size_t i = 1; i < set->ids.size(); ++i)
        all = SymbolicAndExpr(set->table, all, set->ids[i]).getId(set->table);
    set->ids.assign(1, all);
    return set;
}

template <auto build, auto ask>
void askLibrary(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& set) {
            Decider decider(set->table);
            if (ask(decider, *set).isUndecided())
                std::fprintf(stderr, "undecided: the measurement is worth nothing\n");
        });
}

/// What deciding a set cannot do without: every condition read, alone.
template <auto build>
void readFloor(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& set) {
            Decider decider(set->table);
            for (const SymbolicExprId id : set->ids)
                benchmark::DoNotOptimize(decider.canHold(id));
        });
}

/// The solver's context, which takes a millisecond to make, is there already.
template <auto build>
void holdSolver(benchmark::State& state, std::int64_t size) {
    struct Asked {
        std::unique_ptr<Set> set;
        std::unique_ptr<Testing::Solver> solver;
    };

    measure(
        state,
        [&] {
            Asked asked{build(size), nullptr};
            asked.solver = std::make_unique<Testing::Solver>(asked.set->table);
            return asked;
        },
        [](auto& asked) {
            const Z3_ast truth = asked.solver->truth(asked.set->ids.front());
            benchmark::DoNotOptimize(asked.solver->canHold(truth, truth));
        });
}

SetDecision covers(Decider& decider, const Set& set) {
    return decider.covers(set.ids);
}

SetDecision disjoint(Decider& decider, const Set& set) {
    return decider.disjoint(set.ids);
}

Decision canHold(Decider& decider, const Set& set) {
    return decider.canHold(set.ids.front());
}

const bool registered = [] {
    const auto pairs = static_cast<double>(corpus().pairs.size());
    compare({.name = "decide corpus pairs, read on the way (floor: Z3)",
             .library = implyLibrary,
             .floor = implySolver,
             .items = pairs,
             .unit = "pair",
             .mark = 0.05});
    compare({.name = "decide corpus pairs (floor: Z3)",
             .library = implyAgainLibrary,
             .floor = implyAgainSolver,
             .items = pairs,
             .unit = "pair",
             .mark = 0.05});
    for (const std::int64_t atoms : {4, 8, 16, 32}) {
        const std::string count = std::to_string(atoms);
        compare({.name = "decide " + count + " switches (floor: Z3)",
                 .library = askLibrary<conjunctionOf<switchOf>, canHold>,
                 .floor = holdSolver<conjunctionOf<switchOf>>,
                 .size = atoms});
        compare({.name = "decide a circle of " + count + " differences (floor: Z3)",
                 .library = askLibrary<conjunctionOf<step>, canHold>,
                 .floor = holdSolver<conjunctionOf<step>>,
                 .size = atoms});
    }
    for (const std::int64_t choices : {10, 100, 1000, 10000}) {
        const std::string count = std::to_string(choices);
        compare({.name = "cover by " + count + " choices (floor: read)",
                 .library = askLibrary<setOf<choice>, covers>,
                 .floor = readFloor<setOf<choice>>,
                 .size = choices,
                 .items = static_cast<double>(choices),
                 .unit = "choice"});
        compare({.name = "disjointness of " + count + " choices (floor: read)",
                 .library = askLibrary<setOf<choice>, disjoint>,
                 .floor = readFloor<setOf<choice>>,
                 .size = choices,
                 .items = static_cast<double>(choices),
                 .unit = "choice"});
        compare({.name = "cover by " + count + " switches (floor: read)",
                 .library = askLibrary<setOf<switchOf>, covers>,
                 .floor = readFloor<setOf<switchOf>>,
                 .size = choices,
                 .items = static_cast<double>(choices),
                 .unit = "choice"});
    }
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
