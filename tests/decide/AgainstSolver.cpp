// Random pairs and pairs of the corpus against an independent solver.
#include "tests/decide/Bench.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Solver.hpp"

#include <cstdlib>
#include <random>

namespace VT::Testing {
namespace {

#ifdef VTSYM_HAVE_Z3

/// Compares the three questions about a pair and confirms the witnesses.
void expectSame(const DecisionBench& bench, Solver& solver, SymbolicExprId a, SymbolicExprId b,
                const Relation& relation) {
    const auto expectOne = [&](const Decision& decision, bool wantsA, bool wantsB) {
        const Z3_ast inA = wantsA ? solver.truth(a) : solver.negated(solver.truth(a));
        const Z3_ast inB = wantsB ? solver.truth(b) : solver.negated(solver.truth(b));
        ASSERT_EQ(decision.answer, solver.canHold(inA, inB) ? Answer::Yes : Answer::No);
        if (decision.isYes()) {
            ASSERT_EQ(bench.holdsFor(a, decision), wantsA);
            ASSERT_EQ(bench.holdsFor(b, decision), wantsB);
        }
    };
    expectOne(relation.onlyA, true, false);
    expectOne(relation.onlyB, false, true);
    expectOne(relation.both, true, true);
}

TEST(AgainstSolver, RandomPairs) {
    const char* asked = std::getenv("VTSYM_SOLVER_PAIRS");
    const std::size_t pairs = asked != nullptr ? std::strtoul(asked, nullptr, 10) : 10000;
    std::mt19937_64 random(22);
    ConditionShape shape{.symbols = {"A", "B", "C", "D"}, .symbolPairs = true, .truthValues = true};
    std::size_t done = 0;
    while (done < pairs) {
        DecisionBench bench; // a fresh one now and then, so that neither side grows without end
        Solver solver(bench.table);
        for (int i = 0; i < 500 && done < pairs; ++i, ++done) {
            const auto text = [&] {
                std::string condition = randomCondition(random, 1 + random() % 5, shape);
                if (random() % 4 == 0)
                    condition += random() % 2 == 0 ? " || A+2<=C" : " && 3*B-1>D-D+2*B+(C<2)";
                return condition;
            };
            const SymbolicExprId a = bench.parse(text());
            const SymbolicExprId b = bench.parse(text());
            expectSame(bench, solver, a, b, bench.decider.classify(a, b));
            ASSERT_FALSE(HasFatalFailure()) << SymbolicExprPrinter(bench.table, false)(a) << "\n"
                                            << SymbolicExprPrinter(bench.table, false)(b);
        }
    }
}

#else

TEST(AgainstSolver, RandomPairs) {
    GTEST_SKIP() << "skipped: the solver's development files (libz3-dev) were not there when the tests were built";
}

#endif

/// Neighbours among the lines that share a symbol.
TEST(CorpusPairs, AreDecidedAndWitnessesHold) {
    DecisionBench bench;
    std::map<std::string, std::vector<SymbolicExprId>> bySymbol;
    for (const CorpusFile& file : corpusFiles)
        for (const std::string& line : corpusLines(file.name)) {
            try {
                const SymbolicExprId id = bench.parse(line);
                std::vector<std::string> symbols;
                bench.table.getSymbolsFromExpression(id, symbols);
                for (const std::string& symbol : symbols)
                    if (symbol != "defined")
                        bySymbol[symbol].push_back(id);
            } catch (const std::runtime_error&) {
                continue; // a text that is no condition
            }
        }
    std::size_t pairs = 0;
    std::size_t undecided = 0;
    for (const auto& [symbol, ids] : bySymbol)
        for (std::size_t i = 1; i < ids.size(); ++i) {
            const SymbolicExprId a = ids[i - 1];
            const SymbolicExprId b = ids[i];
            const Relation relation = bench.decider.classify(a, b);
            ++pairs;
            undecided += relation.kind == RelationKind::Undecided ? 1U : 0U;
            const auto expectWitness = [&](const Decision& decision, bool wantsA, bool wantsB) {
                ASSERT_EQ(decision.isYes(), decision.witness.has_value());
                if (decision.isYes()) {
                    ASSERT_EQ(bench.holdsFor(a, decision), wantsA) << SymbolicExprPrinter(bench.table, false)(a);
                    ASSERT_EQ(bench.holdsFor(b, decision), wantsB) << SymbolicExprPrinter(bench.table, false)(b);
                }
            };
            expectWitness(relation.onlyA, true, false);
            expectWitness(relation.onlyB, false, true);
            expectWitness(relation.both, true, true);
        }
    EXPECT_GT(pairs, 10000U);
    EXPECT_LT(undecided * 1000, pairs) << undecided << " of " << pairs;
}

} // namespace
} // namespace VT::Testing
