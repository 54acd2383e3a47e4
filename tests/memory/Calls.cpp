// Memory runs out at every allocation in turn: the error passes, nothing leaks or breaks, the next call is right.
#include "base/core/Nodes.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/service/SymbolRegistry.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/QuillParser.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/memory/FailingAllocator.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Times.hpp"
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
            SymbolicExprTable table;
            std::string printed = expected;
            attempt(number, [&] { printed = road(table, text); });
            ASSERT_EQ(printed, expected);
            ASSERT_EQ(road(table, text), expected);
        });
    }
}

TEST(MemoryRunsOut, WhileQuillIsParsed) {
    for (const std::string& text :
         std::vector<std::string>{"a + b", times(600, "f(1,[2 3;4],@(x)-x){'t'} + ") + "a.b'",
                                  "[" + times(3000, "1 ") + "]", times(3000, "a^") + "$", times(200, "((")}) {
        forEachFailure([&](std::size_t number) {
            const auto parser = PARSER_T<char>::create(256);
            attempt(number, [&] { parser->delete_parse_tree(parser->generate_parse_tree(text.data(), text.size())); });
            const auto* const next = parser->generate_parse_tree("1 + x");
            ASSERT_NE(next, nullptr);
            ASSERT_EQ(next->children->code, 49);
            ASSERT_EQ(next->children->childCount, 3);
            parser->delete_parse_tree(next);
        });
    }
}

/// Every kind of work at once.
std::string work() {
    VCService& service = VCService::getInstance();
    const VCSymbolicExprId condition =
        service.simplifyFromCCondition("(A == 1 || A == 2) && B == 3 && !(C < 4) && f(A, B) / 2 + 3 * x.y != 1");
    const VCSymbolicExprId both = service.AND(condition, service.NOT(service.parseC("B == 4"), true), true);
    const VCSymbolicExprId quill = service.parseQ(service.printQExprWithConversion(condition));
    const SymbolicExprId dimension = service.parseQ("[N*2.5, max(M', 3)]");
    SymbolRegistry registry(service.table());
    const std::string name = registry.registerExpression(nullptr, dimension);
    if (service.printQExprWithConversion(both).empty() || registry.registeredBy(nullptr).front() != name)
        return "";
    return service.printCExpr(quill);
}

TEST(MemoryRunsOut, WhileTheServiceWorks) {
    for (const bool caching : {true, false}) {
        const std::string expected =
            "A==1 && B==3 && C>=4 && f(A,B)/2+3*x.y!=1 || A==2 && B==3 && C>=4 && f(A,B)/2+3*x.y!=1";
        ASSERT_EQ((FreshService(caching), work()), expected); // and what is made once for all has been made
        forEachFailure([&](std::size_t number) {
            const FreshService service(caching);
            std::string answer = expected; // what fails unseen, because it was not needed, leaves the answer right
            attempt(number, [&] { answer = work(); });
            ASSERT_EQ(answer, expected);
            ASSERT_EQ(work(), expected);
        });
    }
}

} // namespace
} // namespace VT::Testing
