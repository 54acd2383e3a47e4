// Memory runs out at every allocation in turn: the error passes, nothing leaks or breaks, the next call is right.
#include "base/core/Nodes.hpp"
#include "base/service/SymbolRegistry.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/text/TextPool.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/QuillParser.hpp"
#include "tests/memory/FailingMemory.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {
namespace {

/// Calls with the number of the allocation that fails, from the first on until none fails.  A call that leaves
/// allocations after it is an error.
void forEachFailure(const std::function<void(std::size_t number)>& run) {
    constexpr std::size_t enough = 100000;
    for (std::size_t number = 0; number < enough; ++number) {
        const std::size_t before = FailingMemory::living();
        run(number);
        ASSERT_EQ(FailingMemory::living(), before) << "allocation " << number;
        if (testing::Test::HasFatalFailure() || !FailingMemory::hasFailed())
            return;
    }
    FAIL() << "fails without end";
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

TEST(MemoryRunsOut, WhileADeepTextIsWritten) {
    forEachFailure([&](std::size_t number) {
        constexpr std::size_t depth = 300; // more than a writer has room for from the start
        TextPool pool;
        Text deep = pool.bytes("x");
        for (std::size_t i = 0; i < depth; ++i)
            deep = pool.enclose("(", deep, ")");
        std::string whole(depth, '(');
        whole.append("x").append(depth, ')');
        FailingMemory::attempt(number, [&] { static_cast<void>(pool.str(deep, whole.size())); });
        ASSERT_EQ(pool.str(pool.bytes("y"), 1), "y");
        ASSERT_EQ(pool.str(deep, whole.size()), whole);
    });
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
        FailingMemory::attempt(number, [&] {
            table.emplace();
            for (; done < steps.size(); ++done) {
                makeAny(*table, steps[done].first, steps[done].second);
                size = table->size();
            }
        });
        if (!table)
            return;
        ASSERT_EQ(FailingMemory::hasFailed(), done < steps.size());
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
            const bool added = FailingMemory::attempt(number, [&] { table.add(node); }); // freed where it fails
            ASSERT_EQ(added, !FailingMemory::hasFailed());
            ASSERT_EQ(table.size(), before + (added ? 1 : 0));
            ASSERT_EQ(SymbolicIntValue(table, 4711).getId(table), before);
        });
    }
}

TEST(MemoryRunsOut, WhileTheTruthConstantsAreInterned) {
    forEachFailure([](std::size_t number) {
        SymbolicExprTable table;
        FailingMemory::attempt(number, [&] { table.addBoolSymbols(); });
        ASSERT_EQ(table.getIdTRUE() == invalidId, table.getIdFALSE() == invalidId) << "both or none";
        table.addBoolSymbols();
        ASSERT_EQ(table.getIdFALSE(), 0U);
        ASSERT_EQ(table.getIdTRUE(), 1U);
    });
}

TEST(MemoryRunsOut, WhileQuillIsParsed) {
    for (const std::string& text :
         std::vector<std::string>{"a + b", times(600, "f(1,[2 3;4],@(x)-x){'t'} + ") + "a.b'",
                                  "[" + times(3000, "1 ") + "]", times(3000, "a^") + "$", times(200, "((")}) {
        forEachFailure([&](std::size_t number) {
            const auto parser = PARSER_T<char>::create(256);
            FailingMemory::attempt(
                number, [&] { parser->delete_parse_tree(parser->generate_parse_tree(text.data(), text.size())); });
            const auto* const next = parser->generate_parse_tree("1 + x");
            ASSERT_NE(next, nullptr);
            ASSERT_EQ(next->children->code, 49);
            ASSERT_EQ(next->children->childCount, 3);
            parser->delete_parse_tree(next);
        });
    }
}

/// Every kind of work at once.
std::string work(const std::string& text) {
    VCService& service = VCService::getInstance();
    const VCSymbolicExprId condition = service.simplifyFromCCondition(text);
    const VCSymbolicExprId both = service.AND(condition, service.NOT(service.parseC("B == 4"), true), true);
    const VCSymbolicExprId quill = service.parseQ(service.printQExprWithConversion(condition));
    const SymbolicExprId dimension = service.parseQ("[N*2.5, max(M', 3)]");
    SymbolRegistry registry(service.table());
    const std::string name = registry.registerExpression(nullptr, dimension);
    return service.printCExpr(quill) + service.printQExprWithConversion(both) + registry.registeredBy(nullptr).front();
}

TEST(MemoryRunsOut, WhileTheServiceWorks) {
    for (const bool caching : {true, false})
        for (const std::string text :
             {"(A == 1 || A == 2) && B == 3 && !(C < 4) && f(A, B) / 2 + 3 * x.y != 1",
              "(Mode == 1 || f(Mode, 2.5) > 3) && !(Gear < 3 && a.member != 4) && (Mode == 1 || Mode == 2)",
              "A != 1 && (B > 2 || !(A == 3 && C) || A <= 7) || B == A && (B != A || C < 4 && C > 2)",
              "x/2 - 3*y % [4, 5] + -x*2 + 1 + 2.0 + (1 << 4) + ~z - x >= 12"}) {
            const std::string expected = (FreshService(caching), work(text)); // makes what is made once for all, too
            forEachFailure([&](std::size_t number) {
                const FreshService service(caching);
                std::string answer = expected; // what fails unseen, because it was not needed, leaves the answer right
                FailingMemory::attempt(number, [&] { answer = work(text); });
                ASSERT_EQ(answer, expected);
                ASSERT_EQ(work(text), expected);
            });
        }
}

} // namespace
} // namespace VT::Testing
