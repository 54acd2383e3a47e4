// Memory runs out at every allocation in turn: the table is as before or complete, nothing leaks, the next call is
// right.
#include "base/core/Nodes.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/memory/FailingAllocator.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace VT::Testing {
namespace {

/// Calls with the number of the allocation that fails, from the first on until none fails.
void forEachFailure(const std::function<void(std::size_t number)>& run) {
    constexpr std::size_t enough = 100000;
    for (std::size_t number = 0; number < enough; ++number) {
        run(number);
        if (!MemoryRunsOut::happened())
            return;
    }
    FAIL() << "fails without end";
}

/// A call while memory runs out; nothing where std::bad_alloc passed.
template <class Call>
std::optional<SymbolicExprId> attempt(std::size_t number, Call call) {
    try {
        const MemoryRunsOut limit(number);
        return call();
    } catch (const std::bad_alloc&) {
        return std::nullopt;
    }
}

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
        const std::size_t living = livingAllocations();
        {
            std::size_t done = 0;
            std::size_t size = 0;
            std::optional<SymbolicExprTable> table;
            try {
                const MemoryRunsOut limit(number);
                table.emplace();
                for (; done < steps.size(); ++done) {
                    makeAny(*table, steps[done].first, steps[done].second);
                    size = table->size();
                }
            } catch (const std::bad_alloc&) {
            }
            const bool failed = MemoryRunsOut::happened();
            if (table) {
                ASSERT_EQ(failed, done < steps.size());
                ASSERT_EQ(table->size(), size);
                ASSERT_FALSE(table->has(size));
                // The step that failed is done now, and everything is as if it had never failed.
                for (std::size_t i = done; i < steps.size(); ++i)
                    makeAny(*table, steps[i].first, steps[i].second);
                for (std::size_t i = done / 2; i < steps.size(); i += 7)
                    ASSERT_EQ(treeText(*table, makeAny(*table, steps[i].first, steps[i].second)), expected[i]);
                ASSERT_EQ(table->size(), whole.size());
            }
        }
        ASSERT_EQ(livingAllocations(), living);
    });
}

TEST(MemoryRunsOut, WhileANodeIsAdded) {
    SymbolicExprTable source;
    for (int i = 0; i < 128; ++i)
        SymbolicIntValue(source, i);
    SymbolicIntValue(source, 4711);
    for (const std::size_t before : {0U, 11U, 12U, 16U, 128U}) {
        forEachFailure([&](std::size_t number) {
            const std::size_t living = livingAllocations();
            {
                SymbolicExprTable table;
                for (std::size_t i = 0; i < before; ++i)
                    table.add(new SymbolicIntValue(source, static_cast<int>(i)));
                const auto* node = new SymbolicIntValue(source, 4711);
                const auto added = attempt(number, [&] {
                    table.add(node); // freed where it fails
                    return SymbolicExprId{0};
                });
                ASSERT_EQ(added.has_value(), !MemoryRunsOut::happened());
                ASSERT_EQ(table.size(), before + (added ? 1 : 0));
                ASSERT_EQ(SymbolicIntValue(table, 4711).getId(table), before);
            }
            ASSERT_EQ(livingAllocations(), living);
        });
    }
}

TEST(MemoryRunsOut, WhileTheTruthConstantsAreInterned) {
    forEachFailure([](std::size_t number) {
        SymbolicExprTable table;
        attempt(number, [&] {
            table.addBoolSymbols();
            return SymbolicExprId{0};
        });
        ASSERT_EQ(table.getIdTRUE() == invalidId, table.getIdFALSE() == invalidId) << "both or none";
        table.addBoolSymbols();
        ASSERT_EQ(table.getIdFALSE(), 0U);
        ASSERT_EQ(table.getIdTRUE(), 1U);
    });
}

TEST(MemoryRunsOut, WhileTextIsReadConvertedSimplifiedAndPrinted) {
    const auto road = [](SymbolicExprTable& table, const std::string& text) {
        const SymbolicExprId read = SymbolicExprParser(table, true, true)(text);
        const SymbolicExprId converted = SymbolicExprQ2C(table)(SymbolicExprC2Q(table)(read));
        std::uint64_t passes = 0;
        const SymbolicExprId result = SymbolicExprSimplify(table).simplify(converted, passes);
        return SymbolicExprPrinter(table, false)(result);
    };
    for (const std::string text :
         {"(Mode == 1 || f(Mode, 2.5) > 3) && !(Gear < 3 && a.member != 4) && (Mode == 1 || Mode == 2)",
          "A != 1 && (B > 2 || !(A == 3 && C) || A <= 7) || B == A && (B != A || C < 4 && C > 2)",
          "x/2 - 3*y % [4, 5] + -x*2 + 1 + 2.0 + (1 << 4) + ~z - x >= 12"}) {
        SymbolicExprTable whole;
        const std::string expected = road(whole, text);
        forEachFailure([&](std::size_t number) {
            const std::size_t living = livingAllocations();
            {
                SymbolicExprTable table;
                std::string printed = expected;
                attempt(number, [&] {
                    printed = road(table, text);
                    return SymbolicExprId{0};
                });
                ASSERT_EQ(printed, expected);
                ASSERT_EQ(road(table, text), expected);
            }
            ASSERT_EQ(livingAllocations(), living);
        });
    }
}

} // namespace
} // namespace VT::Testing
