// Evaluating one formula again and again with changing values: prepared, and in one shot.
#include "base/core/Nodes.hpp"
#include "base/eval/Eval.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatProgram.hpp"
#include "benchmarks/floors/FlatText.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <array>

#ifdef VTSYM_BENCH_MUPARSER
#include <muParser.h>
#endif

namespace VT::Benchmarks {
namespace {

struct Formula {
    const char* name;
    const char* text;
    bool reals; ///< whether its variables hold reals
};

constexpr auto formulas = std::to_array<Formula>({
    {"arithmetic on reals",
     "(a + b) * (c - 2.5) / (d + 1.5) - a * c / (b + 7.25) + (a - d) * (b + c) * (d - 1.25) / (c + 3.5) + "
     "(b - d) * (a + 6.5) - c / (d + 2.75) + (a * b - c * d) / (a + b + c + d + 1.0)",
     true},
    {"conditions on reals",
     "a + b < c * 2.5 && d > a - 1.5 || b * c > d + 7.25 && a < c + 0.5 || c - a > b * d && b < a + d || a * d > 3.5",
     true},
    {"dimensions of integers",
     "(a + b) * (c - 2) + (d + 1) * 3 - a * c * (b + 7) + (a - d) * (b + c) * (d - 1) + (b - d) * (a + 6) - c * (d + "
     "2) + (a * b - c * d) * (a + b + c + d + 1)",
     false},
});

constexpr std::array<const char*, 4> variables{"a", "b", "c", "d"};

/// The values of the variables, which come round again.
constexpr std::size_t rounds = 16;
using Values = std::array<std::array<double, variables.size()>, rounds>;

Values valuesOf(const Formula& formula) {
    Values values{};
    for (std::size_t round = 0; round < rounds; ++round)
        for (std::size_t variable = 0; variable < variables.size(); ++variable)
            values[round][variable] =
                static_cast<double>((round + 7 * variable) % rounds + 1) * (formula.reals ? 1.125 : 1.0);
    return values;
}

struct Subject {
    explicit Subject(const Formula& made)
        : formula(made),
          id(SymbolicExprParser(table, true, false)(made.text)),
          values(valuesOf(made)),
          floor(programOf(made.text)) {}

    static Floor::FlatProgram programOf(const char* text) {
        Floor::FlatTable records;
        const std::uint32_t root = Floor::read(records, text);
        return {records, root};
    }

    const Formula& formula;
    SymbolicExprTable table;
    SymbolicExprId id;
    Values values;
    Floor::FlatProgram floor;
};

template <std::size_t Which>
void runFloor(benchmark::State& state, std::int64_t evaluations) {
    const Subject subject(formulas[Which]);
    measure(
        state, [&] { return subject.floor; },
        [&](Floor::FlatProgram& floor) {
            for (std::int64_t i = 0; i < evaluations; ++i) {
                const auto& values = subject.values[static_cast<std::size_t>(i) % rounds];
                for (std::size_t variable = 0; variable < variables.size(); ++variable)
                    floor.set(variable, values[variable]);
                benchmark::DoNotOptimize(floor.run());
            }
        });
}

template <std::size_t Which>
void runPrepared(benchmark::State& state, std::int64_t evaluations) {
    const Subject subject(formulas[Which]);
    measure(
        state, [&] { return SymbolicExprEval(subject.table).prepare(subject.id); },
        [&](PreparedExpr& prepared) {
            for (std::int64_t i = 0; i < evaluations; ++i) {
                const auto& values = subject.values[static_cast<std::size_t>(i) % rounds];
                for (std::size_t variable = 0; variable < variables.size(); ++variable)
                    if (subject.formula.reals)
                        prepared.setDouble(variable, values[variable]);
                    else
                        prepared.setInt(variable, static_cast<std::int32_t>(values[variable]));
                benchmark::DoNotOptimize(prepared.run());
            }
        });
}

/// Values are bound in the table, as nodes that were interned before.
template <std::size_t Which>
void runOneShot(benchmark::State& state, std::int64_t evaluations) {
    Subject subject(formulas[Which]);
    SymbolicExprTable& table = subject.table;
    std::array<SymbolicExprId, variables.size()> symbols{};
    for (std::size_t variable = 0; variable < variables.size(); ++variable)
        symbols[variable] = SymbolicString(table, variables[variable]).getId(table);
    std::array<std::array<SymbolicExprId, variables.size()>, rounds> values{};
    for (std::size_t round = 0; round < rounds; ++round)
        for (std::size_t variable = 0; variable < variables.size(); ++variable) {
            const double value = subject.values[round][variable];
            values[round][variable] = subject.formula.reals
                                          ? SymbolicDoubleValue(table, value).getId(table)
                                          : SymbolicIntValue(table, static_cast<std::int32_t>(value)).getId(table);
        }
    measure(
        state, [&] { return SymbolicExprEval(table); },
        [&](const SymbolicExprEval& evaluator) {
            for (std::int64_t i = 0; i < evaluations; ++i) {
                for (std::size_t variable = 0; variable < variables.size(); ++variable)
                    table.registerValueId(symbols[variable], values[static_cast<std::size_t>(i) % rounds][variable]);
                benchmark::DoNotOptimize(evaluator.eval(subject.id));
            }
        });
}

#ifdef VTSYM_BENCH_MUPARSER
template <std::size_t Which>
void runMuParser(benchmark::State& state, std::int64_t evaluations) {
    const Subject subject(formulas[Which]);
    std::array<double, variables.size()> values{};
    mu::Parser parser;
    for (std::size_t variable = 0; variable < variables.size(); ++variable)
        parser.DefineVar(variables[variable], &values[variable]);
    parser.SetExpr(subject.formula.text);
    benchmark::DoNotOptimize(parser.Eval()); // compiles
    measure(
        state, [] { return 0; },
        [&](int) {
            for (std::int64_t i = 0; i < evaluations; ++i) {
                for (std::size_t variable = 0; variable < variables.size(); ++variable)
                    values[variable] = subject.values[static_cast<std::size_t>(i) % rounds][variable];
                benchmark::DoNotOptimize(parser.Eval());
            }
        });
}
#endif

template <std::size_t Which>
void registerFormula() {
    const Subject subject(formulas[Which]);
    const std::string name = subject.formula.name;
    const auto add = [&](const std::string& what, Side library, Side floor, std::int64_t evaluations, double mark) {
        compare({.name = what + name,
                 .library = library,
                 .floor = floor,
                 .size = evaluations,
                 .items = static_cast<double>(evaluations) * static_cast<double>(subject.floor.nodes()),
                 .unit = "node",
                 .mark = mark});
    };
    add("prepared: ", runPrepared<Which>, runFloor<Which>, 1'000'000, 1);
#ifdef VTSYM_BENCH_MUPARSER
    add("beside muParser: ", runPrepared<Which>, runMuParser<Which>, 1'000'000, 1);
#endif
    add("one shot: ", runOneShot<Which>, runFloor<Which>, 1'000'000, 30);
}

const bool registered = [] {
    registerFormula<0>();
    registerFormula<1>();
    registerFormula<2>();
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
