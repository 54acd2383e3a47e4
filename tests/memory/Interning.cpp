// Memory runs out at every allocation in turn: the table is as before or complete, nothing leaks, the next call is
// right.
#include "base/core/Nodes.hpp"
#include "tests/memory/FailingAllocator.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/TreeText.hpp"

#include <optional>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {
namespace {

/// Nodes of every shape, long texts and enough of them for several enlargements of everything.
std::vector<std::pair<SymbolicOp, NodeParts>> script() {
    std::vector<std::pair<SymbolicOp, NodeParts>> steps;
    std::mt19937 random(9);
    for (std::size_t i = 0; i < 4 * operatorCount; ++i) {
        const auto op = static_cast<SymbolicOp>(i % operatorCount);
        NodeParts parts{std::string(i, 'x'), static_cast<int>(i), 0.5 * static_cast<double>(i), {}};
        const std::size_t count = operandCount(op).value_or(i % 7);
        for (std::size_t k = 0; k < count; ++k)
            parts.inputs.push_back(random() % (i / 2 + 1));
        steps.emplace_back(op, parts);
    }
    return steps;
}

TEST(MemoryRunsOut, WhileNodesAreInterned) {
    const auto steps = script();
    std::vector<std::string> expected;
    SymbolicExprTable whole;
    for (const auto& [op, parts] : steps)
        expected.push_back(treeText(whole, makeAny(whole, op, parts)));

    forEachFailure([&](std::size_t number) {
        std::size_t done = 0;
        std::size_t size = 0;
        std::optional<SymbolicExprTable> table;
        attempt(number, [&] {
            table.emplace();
            for (; done < steps.size(); ++done) {
                makeAny(*table, steps[done].first, steps[done].second);
                size = table->size();
            }
        });
        if (!table)
            return;
        ASSERT_EQ(MemoryRunsOut::happened(), done < steps.size());
        ASSERT_EQ(table->size(), size);
        ASSERT_FALSE(table->has(size));
        // The step that failed is done now, and everything is as if it had never failed.
        for (std::size_t i = done; i < steps.size(); ++i)
            makeAny(*table, steps[i].first, steps[i].second);
        for (std::size_t i = done / 2; i < steps.size(); i += 7)
            ASSERT_EQ(treeText(*table, makeAny(*table, steps[i].first, steps[i].second)), expected[i]);
        ASSERT_EQ(table->size(), whole.size());
    });
}

TEST(MemoryRunsOut, WhileANodeIsAdded) {
    SymbolicExprTable source;
    for (int i = 0; i < 128; ++i)
        SymbolicIntValue(source, i);
    SymbolicIntValue(source, 4711);
    for (const std::size_t before : {0U, 11U, 12U, 16U, 128U}) {
        forEachFailure([&](std::size_t number) {
            SymbolicExprTable table;
            for (std::size_t i = 0; i < before; ++i)
                table.add(new SymbolicIntValue(source, static_cast<int>(i)));
            const auto* node = new SymbolicIntValue(source, 4711);
            const bool added = attempt(number, [&] { table.add(node); }); // freed where it fails
            ASSERT_EQ(added, !MemoryRunsOut::happened());
            ASSERT_EQ(table.size(), before + (added ? 1 : 0));
            ASSERT_EQ(SymbolicIntValue(table, 4711).getId(table), before);
        });
    }
}

TEST(MemoryRunsOut, WhileTheTruthConstantsAreInterned) {
    forEachFailure([](std::size_t number) {
        SymbolicExprTable table;
        attempt(number, [&] { table.addBoolSymbols(); });
        ASSERT_EQ(table.getIdTRUE() == invalidId, table.getIdFALSE() == invalidId) << "both or none";
        table.addBoolSymbols();
        ASSERT_EQ(table.getIdFALSE(), 0U);
        ASSERT_EQ(table.getIdTRUE(), 1U);
    });
}

} // namespace
} // namespace VT::Testing
