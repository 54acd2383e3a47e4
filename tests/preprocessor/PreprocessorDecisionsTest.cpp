// Printed conditions are decided by a real preprocessor and a real compiler as brute force decides them.
//
// Pairs of a condition and values count where C defines what is computed: no division by zero, no shift out of range,
// nothing outside an int.
#include "base/print/CTextObstacles.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/simplify/Simplify.hpp"
#include "tests/preprocessor/Judges.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <gtest/gtest.h>
#include <limits>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

const std::vector<std::string> variables{"A", "B", "C", "S.x", "S.y"};

/// Random expressions of all operators that C text may hold, and of some that it may not.
class Expressions {
public:
    Expressions(SymbolicExprTable& table, CTextUse use) : table_(table), use_(use) {}

    SymbolicExprId make(int depth) {
        static const std::vector<Op> operators = [] {
            std::vector<Op> all{Op::Power};
            for (const OperatorInfo& row : operatorTable())
                if ((row.form == OperatorForm::Infix || row.form == OperatorForm::Prefix) && row.precedence > 2 &&
                    row.c.find_first_of(".\\") == std::string_view::npos)
                    all.insert(all.end(), 4, row.op);
            return all;
        }();
        return randomTree(table_, random_, operators, depth, [this] { return leaf(); });
    }

    std::int64_t value() {
        static constexpr std::int64_t corners[] = {2147483647, -2147483647 - 1, 31, 32, -32, 2147483646, 65536};
        return below(8) == 0 ? corners[below(std::size(corners))] : static_cast<std::int64_t>(below(9)) - 4;
    }

    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

private:
    /// What reads like a name in C text without being one, and names that look odd.
    SymbolicExprId oddLeaf() {
        static const std::vector<CaseRow> leaves = casesOf("print.txt", "odd names", 2);
        const CaseRow& row = leaves[below(leaves.size())];
        return use_ == CTextUse::Program && !row[1].empty() ? oddLeaf() : readTree(table_, row[0]);
    }

    SymbolicExprId leaf() {
        if (below(20) == 0)
            return oddLeaf();
        const std::size_t kind = below(use_ == CTextUse::Directive ? 12 : 10);
        return kind < 3     ? SymbolicIntValue(table_, static_cast<int>(value())).getId(table_)
               : kind == 3  ? oneOf({"true", "false"})
               : kind == 10 ? oneOf({"FcnCall1U(defined,A)", "FcnCall1U(defined,D)"})
               : kind == 11 ? oneOf({"0.5r", "S_z", "S_z"})
                            : oneOf({"A", "B", "C", "MemberValue(S,x)", "MemberValue(S,y)"});
    }

    SymbolicExprId oneOf(const std::vector<std::string>& trees) { return readTree(table_, trees[below(trees.size())]); }

    SymbolicExprTable& table_;
    CTextUse use_;
    std::mt19937_64 random_{20};
};

/// Questions, and the answers that are right.
struct Quiz {
    std::vector<std::string> asked;
    std::vector<std::int64_t> right;

    void ask(const std::string& text, std::int64_t value) {
        asked.push_back(text);
        right.push_back(value);
    }

    void expectRight(const std::vector<std::int64_t>& answers) const {
        ASSERT_EQ(answers.size(), right.size());
        std::size_t differences = 0;
        for (std::size_t i = 0; i < right.size(); ++i)
            if (answers[i] != right[i] && ++differences <= 5)
                ADD_FAILURE() << asked[i] << " is " << answers[i] << ", not " << right[i];
        std::cout << asked.size() << " answers, " << differences << " differences\n";
    }
};

/// Conditions that a preprocessor decides under many definitions.
struct Inquiry {
    /// Asks about the conditions that have a value.
    void ask(const Assignment& values) {
        for (const auto& [truth, text] : conditions)
            if (const auto value = truth.under(values)) {
                preprocessor.ask(text);
                quiz.ask(text, *value != 0 ? 1 : 0);
            }
    }

    void expectRight(std::size_t least) const {
        EXPECT_GE(quiz.asked.size(), least);
        quiz.expectRight(preprocessor.decide());
    }

    std::vector<std::pair<Truth, std::string>> conditions;
    Preprocessor preprocessor{};
    Quiz quiz{};
};

TEST(Decisions, RandomConditionsInDirectives) {
    SymbolicExprTable table;
    Expressions expressions(table, CTextUse::Directive);
    Inquiry inquiry;
    while (inquiry.conditions.size() < 4500) {
        const SymbolicExprId id = expressions.make(4);
        if (findCTextObstacles(table, id, CTextUse::Directive).empty())
            inquiry.conditions.emplace_back(Truth(table, id, Arithmetic::C),
                                            PreprocessorVCExpr(table, false, id % 2 == 0).print(id));
    }
    for (int round = 0; round < 40; ++round) {
        Assignment values;
        for (const char* const name : {"A", "B", "C", "S.x", "S.y", "S_z"})
            if (expressions.below(10) != 0)
                values[name] = expressions.value();
        inquiry.preprocessor.define(values);
        values["(sim)"] = values["(codegen)"] = values["@default"] = 1; // which no definition can do
        inquiry.ask(values);
    }
    inquiry.expectRight(100'000);
}

/// Whether names mean to the preprocessor what the definitions say.
bool areFree(const std::vector<std::string>& names) {
    return std::ranges::none_of(names, [](const std::string& name) {
        return name.starts_with("__has_") || name.starts_with("__STDC") || name == "__LINE__" || name == "__COUNTER__";
    });
}

TEST(Decisions, RealConditionsAsTheyStandAndSimplified) {
    SymbolicExprTable table;
    const SymbolicExprSimplify simplifier(table);
    Inquiry inquiry;
    std::set<std::string> names, functions;
    for (const CorpusFile& file : corpusFiles) {
        for (const std::string& line : corpusLines(file.name)) {
            const SymbolicExprId id = parse(table, line, true, false).id;
            if (id == invalidId || !findCTextObstacles(table, id, CTextUse::Directive).empty())
                continue;
            const Truth truth(table, id, Arithmetic::C);
            if (!areFree(truth.names()))
                continue;
            names.insert(truth.names().begin(), truth.names().end());
            functions.insert(truth.functions().begin(), truth.functions().end());
            std::uint64_t passes = 0;
            PreprocessorVCExpr printer(table, false, true);
            inquiry.conditions.emplace_back(truth, printer.print(id));
            inquiry.conditions.emplace_back(truth, printer.print(simplifier.simplify(id, passes)));
        }
    }
    for (const char* word : {"true", "false", "defined"})
        names.erase(word);
    EXPECT_GT(inquiry.conditions.size(), 30'000U);
    std::mt19937_64 random(4);
    for (int round = 0; round < 3; ++round) {
        Assignment values;
        for (const std::string& name : names)
            if (functions.contains(name) || random() % 4 != 0)
                values[name] = static_cast<std::int64_t>(random() % 5) - 1;
        inquiry.preprocessor.define(values, {functions.begin(), functions.end()});
        inquiry.ask(values);
    }
    inquiry.expectRight(30'000);
}

TEST(Decisions, ValuesOfRandomExpressionsInCompiledPrograms) {
    SymbolicExprTable table;
    Expressions expressions(table, CTextUse::Program);
    const SymbolicExprPrinter printer(table, false);
    Compiler compiler("int A, B, C; struct { int x, y; } S;", variables);
    Quiz quiz;
    std::vector<Compiler::Question> questions;
    for (std::size_t expression = 0; expression < 2000;) {
        const SymbolicExprId id = expressions.make(4);
        if (!findCTextObstacles(table, id, CTextUse::Program).empty())
            continue;
        const Truth truth(table, id, Arithmetic::C);
        compiler.add(printer(id));
        for (int i = 0; i < 80; ++i) {
            Compiler::Question question{expression, {}};
            Assignment values;
            for (const std::string& variable : variables)
                question.values.push_back(values[variable] = expressions.value());
            if (const auto value = truth.under(values)) {
                questions.push_back(std::move(question));
                quiz.ask(printer(id), *value);
            }
        }
        ++expression;
    }
    EXPECT_GE(questions.size(), 100'000U);
    quiz.expectRight(compiler.compute(questions));
}

} // namespace
} // namespace VT::Testing
