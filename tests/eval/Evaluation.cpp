// What expressions are worth, and prepared expressions: they answer what one evaluation answers, bit for bit.
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/transform/DimensionLists.hpp"
#include "host/Messages.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/eval/Scalars.hpp"
#include "tests/support/AnyNode.hpp"

#include <chrono>
#include <functional>
#include <gmock/gmock.h>
#include <limits>
#include <random>

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
        SymbolicExprEvalImpl visitor(table);
        visitor.execute(table, id);
        EXPECT_EQ(visitor.get(), result) << text;
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
        {"1 / 0.0 - 1 / 0.0", std::numeric_limits<double>::quiet_NaN()},
        {"0 * (1 / 0.0)", std::numeric_limits<double>::quiet_NaN()},
        {"(1 / 0.0) / (1 / 0.0)", std::numeric_limits<double>::quiet_NaN()},
        {"-1 / 0.0 < 1 / 0.0 && 1 / 0.0 == 1 / 0.0", true},
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
                                                [&] { static_cast<void>(evaluator.prepare(id).run()); },
                                                [&] {
                                                    SymbolicExprEvalImpl visitor(table);
                                                    table.get(id)->accept(table, visitor);
                                                    static_cast<void>(visitor.get());
                                                }})
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
    table.get(onNothing)->invoke(visitor);
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic);
    EXPECT_THROW(static_cast<void>(visitor.evaluate(onNothing)), HostDiagnostic);
    visitor.execute(table, one);
    EXPECT_EQ(visitor.get(), SymbolicValue(1));                     // of use behind errors
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic); // once
    SymbolicExprTable other;                                        // whose nodes are on the same numbers
    const SymbolicExprId two = SymbolicIntValue(other, 2).getId(other);
    other.get(two)->accept(table, visitor);
    EXPECT_EQ(visitor.get(), SymbolicValue(2));
    const SymbolicPlusExpr sum(other, two, two);
    sum.accept(table, visitor);
    EXPECT_EQ(visitor.get(), SymbolicValue(2)) << "1 + 1 in this table";
}

TEST_F(Evaluation, QuillWritesListsAsMatrices) {
    VTSymbolicExprErrorCheckerBlockVariants checker;
    SymbolicExprFromQParseTreeBlockVariants quill(table, checker);
    const SymbolicExprDimensionLists lists(table);
    bind("N", "3");
    const std::vector<std::pair<const char*, SymbolicValue>> rows{
        {"[1 2]*3", Vector{3, 6}}, {"[N, N*2] + [1 2]", Vector{4, 8}},
        {"-[5]", Vector{-5}},      {"[1 2 3 N]", Vector{1, 2, 3, 3}},
        {"[] * 2", Vector{}},      {"2 - (7 > [1 9])", Vector{1, 2}},
    };
    for (const auto& [text, wanted] : rows)
        EXPECT_EQ(SymbolicExprEval(table).eval(lists(quill(text))), wanted) << text;
    EXPECT_EQ(lists(quill("[1 2]*3")), read("[1, 2]*3"));
    for (const char* text : {"[1; 2] + 1", "{1, 2}", "N + f(N)"}) {
        const SymbolicExprId id = quill(text);
        EXPECT_EQ(lists(id), id) << text;
        EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(id)), HostDiagnostic) << text;
    }
    EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(lists(quill("[[1 2] 3]")))), HostDiagnostic);
    EXPECT_EQ(lists(invalidId), invalidId);
    const SymbolicExprId hollow = SymbolicMatrixExpr(table, std::vector<SymbolicExprId>{1000}).getId(table);
    EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(lists(hollow))), HostDiagnostic);
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

constexpr std::size_t symbolCount = 4;

/// Random expressions of evaluable nodes over a few symbols, and random values for these.
class Game {
public:
    explicit Game(unsigned seed) : random_(seed) {
        for (std::size_t i = 0; i < symbolCount; ++i)
            symbols_.push_back(SymbolicString(table, std::string(1, static_cast<char>('a' + i))).getId(table));
        std::vector<SymbolicExprId> nodes = symbols_;
        for (int i = 0; i < 6; ++i)
            nodes.push_back(literal(table, scalar()));
        const std::size_t count = 8 + below(40);
        while (nodes.size() < count)
            nodes.push_back(makeAny(table, anyOp(), {"", 0, 0, {any(nodes), any(nodes), any(nodes)}}));
        root = nodes.back();
    }

    /// Binds a new random value to a symbol, and answers it.
    SymbolicValue rebind(std::size_t symbol) {
        if (below(6) != 0) {
            const SymbolicScalar value = scalar();
            table.registerValueId(symbols_[symbol], literal(table, value));
            return value;
        }
        std::vector<SymbolicExprId> literals;
        SymbolicValue::Elements elements;
        for (std::size_t i = below(2) == 0 ? 2 : below(4); i > 0; --i) {
            elements.push_back(scalar());
            literals.push_back(literal(table, elements.back()));
        }
        table.registerValueId(symbols_[symbol], SymbolicNDExpr(table, literals).getId(table));
        return elements;
    }

    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

    SymbolicExprId symbol(std::size_t index) const { return symbols_[index]; }

    SymbolicExprTable table;
    SymbolicExprId root;

private:
    SymbolicExprId any(const std::vector<SymbolicExprId>& nodes) {
        // Late nodes more often than others, so that expressions grow deep.
        return nodes[below(2) == 0 ? below(nodes.size())
                                   : nodes.size() - 1 - below(std::min<std::size_t>(4, nodes.size()))];
    }

    SymbolicOp anyOp() {
        if (below(40) == 0)
            return below(2) == 0 ? SymbolicOp::Dims2D : SymbolicOp::DimsND;
        return scalarRules[below(scalarRules.size())].op;
    }

    SymbolicScalar scalar() { return corners()[below(corners().size())]; }

    std::mt19937_64 random_;
    std::vector<SymbolicExprId> symbols_;
};

struct Answer {
    SymbolicValue value = false;
    std::string error;

    bool operator==(const Answer&) const = default;
};

template <class Evaluate>
Answer answer(Evaluate evaluate) {
    try {
        return {evaluate(), ""};
    } catch (const HostDiagnostic& diagnostic) {
        return {false, diagnostic.messageId()};
    }
}

TEST(Prepared, AnswersWhatEvaluationAnswers) {
    std::size_t values = 0;
    std::size_t errors = 0;
    std::size_t again = 0;
    for (unsigned seed = 0; seed < 3000; ++seed) {
        Game game(seed);
        const SymbolicExprEval evaluator(game.table);
        PreparedExpr prepared = evaluator.prepare(game.root);
        PreparedExpr early = prepared;
        for (std::size_t i = 0; i < symbolCount; ++i)
            if (game.below(4) != 0)
                game.rebind(i);
        const bool failedEarly = !answer([&] { return early.run(); }).error.empty();
        for (int round = 0; round < 12; ++round) {
            for (std::size_t i = 0; i < symbolCount; ++i) {
                if (round > 0 && game.below(2) == 0)
                    continue;
                const SymbolicValue value = game.rebind(i);
                // In the first round some are left to be taken from the table.
                if (const auto slot = prepared.slotOf(game.symbol(i)); slot && (round > 0 || game.below(2) == 0))
                    prepared.set(*slot, value);
            }
            const Answer wanted = answer([&] { return evaluator.eval(game.root); });
            if (round == 0 && failedEarly) {
                ASSERT_EQ(answer([&] { return early.run(); }), wanted) << "kept from a failed run, seed " << seed;
                ++again;
            }
            ASSERT_EQ(answer([&] { return prepared.run(); }), wanted) << "seed " << seed << ", round " << round;
            ASSERT_EQ(answer([&] { return prepared.run(); }), wanted) << "again, seed " << seed;
            ASSERT_EQ(answer([&] { return evaluator.prepare(game.root).run(); }), wanted) << "anew, seed " << seed;
            ++(wanted.error.empty() ? values : errors);
            if (game.below(3) == 0) { // a copy goes on alone
                PreparedExpr copy = prepared;
                prepared = copy;
                if (copy.slotCount() > 0)
                    copy.set(0, SymbolicValue::Elements{1, 2, 3});
                static_cast<void>(answer([&] { return copy.run(); }));
            }
        }
    }
    EXPECT_GT(values, 10'000U);
    EXPECT_GT(errors, 1000U);
    EXPECT_GT(again, 500U);
}

TEST(Prepared, HasASlotForEachSymbol) {
    SymbolicExprTable table;
    const SymbolicExprId a = SymbolicString(table, "a").getId(table);
    const SymbolicExprId member = SymbolicMemberValue(table, a, "x").getId(table);
    const SymbolicExprId sum = SymbolicPlusExpr(table, member, SymbolicPlusExpr(table, a, member)).getId(table);
    const SymbolicExprId id = SymbolicPlusExpr(table, sum, SymbolicString(table, "true")).getId(table);
    PreparedExpr prepared = SymbolicExprEval(table).prepare(id);
    ASSERT_EQ(prepared.slotCount(), 2U);
    EXPECT_EQ(prepared.symbol(0), member);
    EXPECT_EQ(prepared.slotOf("a"), 1U);
    EXPECT_EQ(prepared.slotOf(member), 0U);
    EXPECT_EQ(prepared.slotOf("true"), std::nullopt);
    EXPECT_EQ(prepared.slotOf(sum), std::nullopt);
    EXPECT_THROW(prepared.setInt(2, 1), std::out_of_range);
    EXPECT_THROW(prepared.set(2, SymbolicValue::Elements{1}), std::out_of_range);
    prepared.setBool(0, true);
    EXPECT_THROW(static_cast<void>(prepared.run()), HostDiagnostic); // `a` has no value
    prepared.setInt(1, 5);
    EXPECT_EQ(prepared.run(), SymbolicValue(8));
    prepared.setDouble(1, 0.5);
    EXPECT_EQ(prepared.run(), SymbolicValue(3.5));
    prepared.setInt(1, 2147483647);
    EXPECT_EQ(prepared.run(), SymbolicValue(-2147483646));
}

} // namespace
} // namespace VT::Testing
