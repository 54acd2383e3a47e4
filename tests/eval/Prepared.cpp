// Prepared expressions answer what one evaluation under the same bindings answers, bit for bit, whatever is set when.
#include "tests/eval/Scalars.hpp"

#include <gtest/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

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
    for (unsigned seed = 0; seed < 3000; ++seed) {
        Game game(seed);
        const SymbolicExprEval evaluator(game.table);
        PreparedExpr prepared = evaluator.prepare(game.root);
        std::optional<PreparedExpr> before;
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
