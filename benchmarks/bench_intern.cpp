// Interning a million binary nodes over a thousand symbols: those that are new, and those that are there.
#include "base/core/Nodes.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatTable.hpp"

#include <algorithm>
#include <memory>
#include <numeric>
#include <random>

namespace VT::Benchmarks {
namespace {

constexpr std::uint32_t symbolCount = 1000;
constexpr std::uint32_t nodeCount = 1000000;

/// Every pair of symbols once, in a random order.
std::vector<std::uint32_t> shuffledPairs(unsigned seed) {
    std::vector<std::uint32_t> pairs(nodeCount);
    std::iota(pairs.begin(), pairs.end(), 0U);
    std::shuffle(pairs.begin(), pairs.end(), std::mt19937(seed));
    return pairs;
}

const std::vector<std::uint32_t>& creationOrder() {
    static const std::vector<std::uint32_t> order = shuffledPairs(1);
    return order;
}

const std::vector<std::uint32_t>& lookupOrder() {
    static const std::vector<std::uint32_t> order = shuffledPairs(2);
    return order;
}

std::string symbolName(std::uint32_t number) {
    return "Symbol_" + std::to_string(number);
}

std::unique_ptr<SymbolicExprTable> tableOfSymbols() {
    auto table = std::make_unique<SymbolicExprTable>();
    for (std::uint32_t i = 0; i < symbolCount; ++i)
        benchmark::DoNotOptimize(SymbolicString(*table, symbolName(i)).getId(*table));
    return table;
}

std::unique_ptr<Floor::FlatTable> recordsOfSymbols() {
    auto table = std::make_unique<Floor::FlatTable>();
    for (std::uint32_t i = 0; i < symbolCount; ++i)
        benchmark::DoNotOptimize(table->name(symbolName(i)));
    return table;
}

SymbolicExprId intern(SymbolicExprTable& table, std::uint32_t pair) {
    const SymbolicExprId left = pair / symbolCount;
    const SymbolicExprId right = pair % symbolCount;
    switch (right % 4) {
    case 0:
        return SymbolicPlusExpr(table, left, right).getId(table);
    case 1:
        return SymbolicMultiplyExpr(table, left, right).getId(table);
    case 2:
        return SymbolicEqualExpr(table, left, right).getId(table);
    default:
        return SymbolicAndExpr(table, left, right).getId(table);
    }
}

std::uint32_t intern(Floor::FlatTable& table, std::uint32_t pair) {
    const std::uint32_t left = pair / symbolCount;
    const std::uint32_t right = pair % symbolCount;
    switch (right % 4) {
    case 0:
        return table.intern(Floor::Kind::Plus, left, right);
    case 1:
        return table.intern(Floor::Kind::Times, left, right);
    case 2:
        return table.intern(Floor::Kind::Equal, left, right);
    default:
        return table.intern(Floor::Kind::And, left, right);
    }
}

template <class Table>
void internAll(Table& table, const std::vector<std::uint32_t>& pairs) {
    SymbolicExprId sum = 0;
    for (const std::uint32_t pair : pairs)
        sum += intern(table, pair);
    benchmark::DoNotOptimize(sum);
}

template <class Prepare>
void newNodes(benchmark::State& state, Prepare prepare) {
    const auto& pairs = creationOrder();
    measure(state, prepare, [&](auto& table) { internAll(*table, pairs); });
    const std::size_t before = bytesInUse();
    const auto table = prepare();
    internAll(*table, pairs);
    if (table->size() != symbolCount + nodeCount)
        state.SkipWithError("the nodes are not all there");
    state.counters["bytes a node"] =
        static_cast<double>(bytesInUse() - before) / static_cast<double>(symbolCount + nodeCount);
}

template <class Prepare>
void knownNodes(benchmark::State& state, Prepare prepare) {
    const auto table = prepare();
    internAll(*table, creationOrder());
    const auto& pairs = lookupOrder();
    measure(
        state, [&] { return table.get(); }, [&](auto* known) { internAll(*known, pairs); });
    if (table->size() != symbolCount + nodeCount)
        state.SkipWithError("a known node was added");
}

void newLibrary(benchmark::State& state, std::int64_t) {
    newNodes(state, tableOfSymbols);
}

void newFloor(benchmark::State& state, std::int64_t) {
    newNodes(state, recordsOfSymbols);
}

void knownLibrary(benchmark::State& state, std::int64_t) {
    knownNodes(state, tableOfSymbols);
}

void knownFloor(benchmark::State& state, std::int64_t) {
    knownNodes(state, recordsOfSymbols);
}

const bool registered = compare({.name = "new nodes",
                                 .library = newLibrary,
                                 .floor = newFloor,
                                 .items = nodeCount,
                                 .unit = "node",
                                 .mark = 1.2,
                                 .goal = 1}) &&
                        compare({.name = "known nodes",
                                 .library = knownLibrary,
                                 .floor = knownFloor,
                                 .items = nodeCount,
                                 .unit = "node",
                                 .mark = 1.8,
                                 .goal = 1.5});

} // namespace
} // namespace VT::Benchmarks
