// Evaluating one formula for a million rows of values, beside the loop that one would write and compile for it.
#include "base/eval/Eval.hpp"
#include "benchmarks/Comparison.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <array>
#include <memory>
#include <string>
#include <type_traits>
#include <vector>

namespace VT::Benchmarks {
namespace {

constexpr std::size_t names = 4;

/// A formula over columns of one type, and the compiled loop with plain arithmetic of the language.
template <class Value, class Answer>
struct Rows {
    using Loop = void (*)(const Value* a, const Value* b, const Value* c, const Value* d, Answer* answers,
                          std::size_t rows);

    const char* text;
    Loop loop;
};

using Int = std::int32_t;

constexpr Rows<Int, bool> conditionOnIntegers{
    "(a > 3 && b < 7 || c == 2) && d != 5 && (a <= c || b >= d)",
    [](const Int* a, const Int* b, const Int* c, const Int* d, bool* answers, std::size_t rows) {
        for (std::size_t i = 0; i < rows; ++i)
            answers[i] = (((a[i] > 3) & (b[i] < 7)) | (c[i] == 2)) & (d[i] != 5) & ((a[i] <= c[i]) | (b[i] >= d[i]));
    }};

constexpr Rows<Int, Int> dimensionsOfIntegers{
    "(a + b) * (c - 2) + (d + 1) * 3 - a * c * (b + 7) + (a - d) * (b + c) * (d - 1)",
    [](const Int* a, const Int* b, const Int* c, const Int* d, Int* answers, std::size_t rows) {
        const auto u = [](Int value) { return static_cast<std::uint32_t>(value); };
        for (std::size_t i = 0; i < rows; ++i)
            answers[i] = static_cast<Int>((u(a[i]) + u(b[i])) * (u(c[i]) - 2) + (u(d[i]) + 1) * 3 -
                                          u(a[i]) * u(c[i]) * (u(b[i]) + 7) +
                                          (u(a[i]) - u(d[i])) * (u(b[i]) + u(c[i])) * (u(d[i]) - 1));
    }};

constexpr Rows<double, bool> conditionOnReals{
    "a + b < c * 2.5 && d > a - 1.5 || b * c > d + 7.25 && a < c + 0.5 || c - a > b * d && b < a + d || a * d > 3.5",
    [](const double* a, const double* b, const double* c, const double* d, bool* answers, std::size_t rows) {
        for (std::size_t i = 0; i < rows; ++i)
            answers[i] = ((a[i] + b[i] < c[i] * 2.5) & (d[i] > a[i] - 1.5)) |
                         ((b[i] * c[i] > d[i] + 7.25) & (a[i] < c[i] + 0.5)) |
                         ((c[i] - a[i] > b[i] * d[i]) & (b[i] < a[i] + d[i])) | (a[i] * d[i] > 3.5);
    }};

constexpr Rows<double, double> arithmeticOnReals{
    "(a + b) * (c - 2.5) - a * c * (b + 7.25) + (a - d) * (b + c) * (d - 1.25) + (b - d) * (a + 6.5)",
    [](const double* a, const double* b, const double* c, const double* d, double* answers, std::size_t rows) {
        for (std::size_t i = 0; i < rows; ++i)
            answers[i] = (a[i] + b[i]) * (c[i] - 2.5) - a[i] * c[i] * (b[i] + 7.25) +
                         (a[i] - d[i]) * (b[i] + c[i]) * (d[i] - 1.25) + (b[i] - d[i]) * (a[i] + 6.5);
    }};

constexpr Rows<double, double> quotientsOfReals{
    "a / (b + 7.25) - c / (d + 2.75)",
    [](const double* a, const double* b, const double* c, const double* d, double* answers, std::size_t rows) {
        for (std::size_t i = 0; i < rows; ++i)
            answers[i] = a[i] / (b[i] + 7.25) - c[i] / (d[i] + 2.75);
    }};

template <class Value, class Answer>
struct Subject {
    explicit Subject(std::size_t rows) : answers(new Answer[rows]) {
        std::uint32_t state = 1;
        for (std::vector<Value>& column : columns)
            for (std::size_t i = 0; i < rows; ++i)
                column.push_back(static_cast<Value>((state = state * 1664525U + 1013904223U) >> 28U));
    }

    std::array<std::vector<Value>, names> columns;
    std::unique_ptr<Answer[]> answers;
};

template <const auto& Formula, class Value, class Answer>
void runLoop(benchmark::State& state, std::int64_t rows) {
    const auto count = static_cast<std::size_t>(rows);
    Subject<Value, Answer> subject(count);
    const auto& columns = subject.columns;
    measure(
        state, [] { return 0; },
        [&](int) {
            Formula.loop(columns[0].data(), columns[1].data(), columns[2].data(), columns[3].data(),
                         subject.answers.get(), count);
            benchmark::DoNotOptimize(subject.answers[count - 1]);
        });
}

template <const auto& Formula, class Value, class Answer>
void runPrepared(benchmark::State& state, std::int64_t rows) {
    const auto count = static_cast<std::size_t>(rows);
    Subject<Value, Answer> subject(count);
    SymbolicExprTable table;
    PreparedExpr prepared = SymbolicExprEval(table).prepare(SymbolicExprParser(table, true, false)(Formula.text));
    std::vector<ValueColumn> columns;
    for (std::size_t i = 0; i < names; ++i)
        columns.push_back({prepared.slotOf(std::string(1, static_cast<char>('a' + i))).value(),
                           std::is_same_v<Value, double> ? ValueColumn::Type::Double : ValueColumn::Type::Int32,
                           subject.columns[i].data(), sizeof(Value)});
    measure(
        state, [] { return 0; },
        [&](int) {
            prepared.runMany(columns, count, [&](ScalarType) { return subject.answers.get(); });
            benchmark::DoNotOptimize(subject.answers[count - 1]);
        });
}

template <const auto& Formula, class Value, class Answer>
bool add(const char* name) {
    constexpr std::int64_t rows = 1'000'000;
    return compare({.name = std::string("many rows: ") + name,
                    .library = runPrepared<Formula, Value, Answer>,
                    .floor = runLoop<Formula, Value, Answer>,
                    .size = rows,
                    .items = static_cast<double>(rows),
                    .unit = "row",
                    .mark = 3,
                    .goal = 1.5});
}

const bool registered = add<conditionOnIntegers, Int, bool>("condition on integers") &&
                        add<dimensionsOfIntegers, Int, Int>("dimensions of integers") &&
                        add<conditionOnReals, double, bool>("condition on reals") &&
                        add<arithmeticOnReals, double, double>("arithmetic on reals") &&
                        add<quotientsOfReals, double, double>("quotients of reals");

} // namespace
} // namespace VT::Benchmarks
