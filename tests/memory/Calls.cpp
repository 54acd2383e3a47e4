// Memory runs out at every allocation of whole calls: the error passes, nothing leaks or breaks, the next call is
// right.
#include "base/print/ExpressionPrinter.hpp"
#include "base/service/SymbolRegistry.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/QuillParser.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/memory/FailingAllocator.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Times.hpp"

namespace VT::Testing {
namespace {

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
