// Everything that reads expressions, over tables as hosts derive them and over graphs that lack operands.
#include "tests/support/HostTables.hpp"

#include "base/choices/ChoiceRanges.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/shorten/StringifyImpliedCondition.hpp"
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/print/StructuralOrder.hpp"
#include "base/service/VCSymbols.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/Messages.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

/// What the library says of an expression, but for identifiers.
std::vector<std::string> textsOf(SymbolicExprTable& table, SymbolicExprId id) {
    std::vector<std::string> texts{SymbolicExprPrinter(table, true)(id),
                                   SymbolicExprPrinter(table, false)(SymbolicExprQ2C(table)(id))};
    const SymbolicExprPrinter print(table, false);
    std::uint64_t passes = 0;
    texts.push_back(print(SymbolicExprSimplify(table).simplify(id, passes)));
    texts.push_back(print(SymbolicExprParser(table, true, true)(texts[1])));
    PreprocessorVCExpr preprocessor(table, false, true);
    texts.push_back(preprocessor.print(id));
    texts.push_back(StringifyImpliedCondition(table, false, true, id).print(id));
    std::vector<std::string> names;
    VCSymbolsOfSymbolicExpr(table, {VCSymbolType::Identifier, VCSymbolType::FunctionName}).getSymbols(id, names);
    texts.insert(texts.end(), names.begin(), names.end());
    texts.push_back(std::to_string(findCTextObstacles(table, id, CTextUse::Directive).size()));
    texts.push_back(std::to_string(rangesOf(table, id).size()));

    for (const char* const name : {"a", "b", "c", "d"})
        table.registerValue(name, name[0] - 'a' + 1);
    const SymbolicExprEval evaluate(table);
    try {
        texts.push_back(std::to_string(evaluate.eval(id).scalar().toDouble()));
        EXPECT_EQ(evaluate.prepare(id).run(), evaluate.eval(id));
    } catch (const HostDiagnostic& diagnostic) {
        texts.push_back(diagnostic.what());
    }
    Decider decider(table);
    const Decision decision = decider.canHold(id);
    texts.push_back(std::to_string(static_cast<int>(decision.answer)));
    for (const UnknownValue& each : decision.witness.value_or(Witness()))
        texts.push_back(decider.nameOf(each.unknown) + "=" + std::to_string(each.value));
    return texts;
}

TEST(HostTables, SayTheSameAsTheLibrarysOwn) {
    const std::vector<Op> operators{Op::Plus, Op::Minus,       Op::Multiply, Op::Divide, Op::Modulo,   Op::UnaryMinus,
                                    Op::Not,  Op::And,         Op::Or,       Op::Equal,  Op::LessThan, Op::NotEqual,
                                    Op::And,  Op::GreaterThan, Op::BitAnd,   Op::Or,     Op::FcnCall1U};
    for (std::uint64_t seed = 1; seed <= 200; ++seed) {
        std::vector<std::string> expected;
        for (const auto& numbered : tablesOfEachKind()) {
            std::mt19937_64 random(seed);
            SymbolicExprTable& table = numbered->table();
            table.addBoolSymbols();
            const auto leaf = [&] {
                const Trees tree{table};
                return random() % 3 == 0 ? tree.integer(static_cast<int>(random() % 7) - 3)
                                         : tree.name(std::string(1, "abcd"[random() % 4]));
            };
            const auto texts = textsOf(table, randomTree(table, random, operators, 4, leaf));
            if (expected.empty())
                expected = texts;
            else
                ASSERT_THAT(texts, testing::ElementsAreArray(expected)) << seed;
        }
    }
}

bool isWhole(const SymbolicExprTable& table, SymbolicExprId id) {
    bool whole = true;
    walkDistinct(
        table, id, [](SymbolicExprId, const SymbolicExpr&) {},
        [&](SymbolicExprId operand) { whole = whole && operand != invalidId; });
    return whole;
}

TEST(HostTables, WhatLacksAnOperandIsAnswered) {
    std::size_t broken = 0;
    forBrokenGraphs(4, 30, 40, [&](NumberedTable& numbered, const std::vector<SymbolicExprId>& all) {
        SymbolicExprTable& table = numbered.table();
        for (const SymbolicExprId id : all) {
            if (isWhole(table, id))
                continue;
            ++broken;
            EXPECT_THROW(SymbolicExprPrinter(table, true)(id), std::out_of_range);
            EXPECT_THROW(SymbolicExprPrinter(table, false)(*table.get(id)), std::out_of_range);
            EXPECT_THROW(SymbolicExprEval(table).eval(id), HostDiagnostic);
            EXPECT_THROW(SymbolicExprEval(table).prepare(id).run(), HostDiagnostic);
            EXPECT_EQ(compareStructure(table, id, id), 0);
            EXPECT_EQ(compareStructure(table, id, all.front()) < 0, compareStructure(table, all.front(), id) > 0);
            std::vector<SymbolicExprId> symbols;
            VCSymbolsOfSymbolicExpr(table, {VCSymbolType::Identifier}).getSymbolIds(id, symbols);
            for (const SymbolicExprId each : symbols)
                EXPECT_TRUE(table.has(each));
            rangesOf(table, id);
            EXPECT_EQ(Decider(table).canHold(id).bound, DecisionBound::NoCondition);
        }
    });
    EXPECT_GT(broken, 2000U);
}

} // namespace
} // namespace VT::Testing
