// Every driver over graphs that have more paths than could be walked, and more depth than a stack has.
#include "base/transform/Cast2Int.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"
#include "base/transform/XForm.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

TEST(Drivers, SharedAndDeepExpressions) {
    SymbolicExprTable table;
    const Trees tree{table};
    const auto grown = [&](const char* text) {
        return tree.zigzag(Op::Plus, Op::Minus, tree.doubled(Op::Plus, read(table, text)), tree.name("z"), 300'000);
    };
    const SymbolicExprReplacements replacements{{tree.name("x"), tree.name("y")}};

    const struct {
        const char* name;
        std::function<SymbolicExprId(SymbolicExprId)> run;
        const char* from;
        const char* to;
    } cases[] = {
        {"cast", [&](SymbolicExprId id) { return SymbolicExprCast2Int(table).cast2Int(id); }, "x+1.5", "x+2"},
        {"to C", [&](SymbolicExprId id) { return SymbolicExprQ2C(table)(id); }, "rem(bitshift(x,-2),3)", "(x>>2)%3"},
        {"to Quill", [&](SymbolicExprId id) { return SymbolicExprC2Q(table)(id); }, "x/2", "idivide(x,2)"},
        {"replace", [&](SymbolicExprId id) { return SymbolicExprReplacement(table, replacements)(id); }, "x", "y"},
        {"rebuild", [&](SymbolicExprId id) { return SymbolicExprXFormVisitor(table).rebuild(table, id); }, "x", "x"},
        {"factor", [&](SymbolicExprId id) { return SymbolicExprFactorDivision(table).factorDivision(id); }, "x", "x"},
    };

    for (const auto& [name, run, from, to] : cases)
        EXPECT_EQ(run(grown(from)), grown(to)) << name;

    SymbolicExprTable source, target;
    const Trees original{source};
    const SymbolicExprId x = original.name("x");
    const SymbolicExprId id = original.zigzag(Op::Plus, Op::Minus, original.doubled(Op::Plus, x), x, 300'000);
    EXPECT_NE(SymbolicExprCopy(source, target)(id), invalidId);
    EXPECT_EQ(target.size(), source.size());

    // A visitor of a host meets every occurrence.
    const SymbolicExprId deep = tree.zigzag(Op::Plus, Op::Plus, tree.name("x"), tree.name("x"), 1'000'000);
    for (const bool accept : {false, true}) {
        SymbolicExprXFormVisitor visitor(table);
        accept ? table.get(deep)->accept(table, visitor) : visitor.execute(table, deep);
        EXPECT_EQ(visitor.get(), deep);
    }
}

} // namespace
} // namespace VT::Testing
