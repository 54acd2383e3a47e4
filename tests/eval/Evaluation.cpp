// What expressions are worth, what is not evaluable, and how much work it is.
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "host/Messages.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/AnyNode.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <functional>
#include <limits>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;

class Evaluation : public ::testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return SymbolicExprParser(table, true, true)(text); }

    SymbolicExprId name(const std::string& text) { return SymbolicString(table, text).getId(table); }

    void bind(const std::string& symbol, const std::string& value) { table.registerValueId(read(symbol), read(value)); }

    /// The value by eval(), by a prepared expression and by a visitor that goes every path.
    SymbolicValue value(const std::string& text) {
        const SymbolicExprId id = read(text);
        const SymbolicValue result = SymbolicExprEval(table).eval(id);
        EXPECT_EQ(SymbolicExprEval(table).prepare(id).run(), result) << text;
        if (text.find('.') == std::string::npos) { // that one asks for the owners of members too
            SymbolicExprEvalImpl visitor(table);
            visitor.execute(table, id);
            EXPECT_EQ(visitor.get(), result) << text;
        }
        return result;
    }

    SymbolicExprTable table;
};

using Vector = SymbolicValue::Elements;

TEST_F(Evaluation, AnswersTexts) {
    bind("N", "3");
    bind("M", "N * N");
    bind("Rate", "0.5");
    bind("Dims", "[N, M]");
    bind("s.gear", "M - 1");
    bind("true", "0"); // a truth value stays one
    const std::vector<std::pair<const char*, SymbolicValue>> rows{
        // Arithmetic on numbers is judged in Arithmetic.cpp.
        {"N*2+1", 7},
        {"0.0 / 0.0", std::numeric_limits<double>::infinity()},
        {"0.1 + 0.2 == 0.3 && 0.1 + 0.2 > 0.3", true},
        {"2147483647 + 1.0", 2147483648.0},
        {"!Rate || M < 9", false},
        {"s.gear + 1 == M", true},
        {"[N, M, Rate]", Vector{3, 9, 0.5}},
        {"[N, M] * 2 - [1, 2]", Vector{5, 16}},
        {"2 - Dims", Vector{-1, -7}},
        {"!-[N, false, Rate, 0]", Vector{false, true, false, true}},
    };
    for (const auto& [text, wanted] : rows)
        EXPECT_EQ(value(text), wanted) << text;
    EXPECT_EQ(SymbolicExprEval(table).eval(SymbolicNDExpr(table, std::vector<SymbolicExprId>{}).getId(table)),
              SymbolicValue(Vector{}));
}

TEST_F(Evaluation, NamesWhatHasNoValue) {
    for (const auto& [symbol, bound] : std::vector<std::pair<const char*, const char*>>{
             {"A", "B + 1"}, {"B", "C * 2"}, {"C", "A"}, {"Self", "Self"}, {"N", "3"}, {"Open", "Missing"}})
        bind(symbol, bound);
    const std::vector<std::array<std::string, 3>> rows{
        {"N + Nope", "UnboundSymbol", "Nope"},
        {"Open", "UnboundSymbol", "Missing"},
        {"N * A", "CyclicValue", "A"},
        {"B", "CyclicValue", "B"},
        {"Self", "CyclicValue", "Self"},
        {"N + f(Nope)", "NotEvaluable", "f(Nope)"},
        {"1 + s.x", "NotEvaluable", "s.x"},
        {"[[1, 2], 3]", "NotEvaluable", "[[1,2],3]"},
        {"[1, 2] + ([1, 2, 3] - 1)", "SizeMismatch", "[1,2]+([1,2,3]-1)"},
    };
    for (const auto& [text, key, named] : rows) {
        SCOPED_TRACE(text);
        const SymbolicExprId id = read(text);
        const SymbolicExprEval evaluator(table);
        for (const std::function<void()>& evaluate :
             std::vector<std::function<void()>>{[&] { static_cast<void>(evaluator.eval(id)); },
                                                [&] { static_cast<void>(evaluator.prepare(id).run()); }})
            try {
                evaluate();
                ADD_FAILURE() << "has a value";
            } catch (const HostDiagnostic& diagnostic) {
                EXPECT_EQ(diagnostic.messageId(), "Vantor:SymbolicDims:" + key);
                EXPECT_TRUE(fits(*findMessage(diagnostic.messageId()), diagnostic.arguments()));
                EXPECT_EQ(std::get<std::string>(diagnostic.arguments().at(0)), named);
                EXPECT_THAT(diagnostic.what(), HasSubstr("\"" + named + "\""));
            }
    }
}

TEST_F(Evaluation, AnswersIdentifiersThatAreNoNodes) {
    const SymbolicExprId one = SymbolicIntValue(table, 1).getId(table);
    const SymbolicExprId onNothing = SymbolicPlusExpr(table, one, 1000).getId(table);
    const SymbolicExprId onItself = SymbolicPlusExpr(table, one, table.size()).getId(table);
    table.registerValueId("N", 1000);
    for (const SymbolicExprId id : {SymbolicExprId{999}, invalidId, onNothing, onItself, name("N")}) {
        EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(id)), HostDiagnostic);
        EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).prepare(id).run()), HostDiagnostic);
    }
    SymbolicExprEvalImpl visitor(table);
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic);
    EXPECT_THROW(table.get(onNothing)->invoke(visitor), HostDiagnostic);
    EXPECT_THROW(static_cast<void>(visitor.evaluate(onNothing)), HostDiagnostic);
    EXPECT_EQ(visitor.evaluate(one), SymbolicValue(1)); // of use behind errors
}

TEST_F(Evaluation, EvaluatesSharedNodesOnce) {
    table.registerValue("x", 1);
    const Trees tree{table};
    const SymbolicExprId id = tree.doubled(SymbolicOp::Plus, name("x"));
    const SymbolicExprId truth = tree.doubled(SymbolicOp::And, name("x"));
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(SymbolicExprEval(table).eval(id), SymbolicValue(0)); // 2^64 wraps
    EXPECT_EQ(SymbolicExprEval(table).prepare(id).run(), SymbolicValue(0));
    EXPECT_EQ(SymbolicExprEval(table).eval(truth), SymbolicValue(true));
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(500));
}

TEST_F(Evaluation, TakesDepthFromMemory) {
    constexpr int depth = 1'000'000;
    const SymbolicExprId one = SymbolicIntValue(table, 1).getId(table);
    table.registerValueId("x", one);
    const SymbolicExprId x = name("x");
    const SymbolicExprId sum = Trees{table}.zigzag(SymbolicOp::Plus, SymbolicOp::Plus, x, one, depth);
    SymbolicExprId prefix = x;
    SymbolicExprId bound = one;
    for (int i = 0; i < depth; ++i) {
        prefix = SymbolicBitComplExpr(table, prefix).getId(table);
        const SymbolicExprId symbol = name("s" + std::to_string(i));
        table.registerValueId(symbol, bound);
        bound = symbol;
    }
    for (const auto& [id, wanted] :
         std::vector<std::pair<SymbolicExprId, int>>{{sum, depth + 1}, {prefix, 1}, {bound, 1}}) {
        EXPECT_EQ(SymbolicExprEval(table).eval(id), SymbolicValue(wanted));
        PreparedExpr prepared = SymbolicExprEval(table).prepare(id);
        EXPECT_EQ(prepared.run(), SymbolicValue(wanted));
    }
    table.registerValueId("s0", bound); // a million symbols in a circle
    EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(bound)), HostDiagnostic);
    EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(SymbolicPowerExpr(table, sum, sum).getId(table))),
                 HostDiagnostic);
}

} // namespace
} // namespace VT::Testing
