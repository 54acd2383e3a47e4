// Printed conditions are decided by a real preprocessor and a real compiler as brute force decides them.
//
// Pairs of a condition and values count where C defines what is computed: no division by zero, no shift out of range,
// nothing outside an int.
#include "base/VCService.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/simplify/Simplify.hpp"
#include "tests/preprocessor/Judges.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/AnyCondition.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomExpression.hpp"
#include "tests/support/oracles/ExactValue.hpp"

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
    SymbolicExprId name(const std::string& text) { return SymbolicString(table_, text).getId(table_); }

    /// What reads like a name in C text without being one, and names that look odd.
    SymbolicExprId oddLeaf() {
        const auto call = [&](const char* function, SymbolicExprId argument) {
            return SymbolicFcnCall1UExpr(table_, name(function), argument).getId(table_);
        };
        const auto member = [&](SymbolicExprId owner, const char* field) {
            return SymbolicMemberValue(table_, owner, field).getId(table_);
        };
        const std::vector<SymbolicExprId> leaves{
            name("(sim)"),
            name("(codegen)"),
            name("@default"),
            name("while"),
            member(name(below(2) == 0 ? "true" : "false"), "x"),
            member(member(name("true"), "x"), "y"),
            member(name("(sim)"), "x"),
            member(name("S"), "int"),
            call("true", name("A")),
            call("(codegen)", name("A")),
            SymbolicDoubleValue(table_, std::numeric_limits<double>::infinity()).getId(table_),
            name("defined"), // from here on in directives alone
            call("defined", name("true")),
            call("defined", name("(sim)")),
            call("defined", name("defined")),
            call("defined", call("f", name("A"))),
            call("defined", SymbolicIntValue(table_, 1).getId(table_)),
            call("defined", member(name("S"), "x")),
            SymbolicFcnCall0UExpr(table_, name("defined")).getId(table_),
            SymbolicFcnCall2UExpr(table_, name("defined"), name("A"), name("B")).getId(table_),
        };
        const auto common = std::ranges::find(leaves, name("defined")) - leaves.begin();
        return leaves[below(use_ == CTextUse::Directive ? leaves.size() : static_cast<std::size_t>(common))];
    }

    SymbolicExprId leaf() {
        const bool directive = use_ == CTextUse::Directive;
        if (below(20) == 0)
            return oddLeaf();
        switch (below(directive ? 12 : 10)) {
        case 0:
        case 1:
        case 2:
            return SymbolicIntValue(table_, static_cast<int>(value())).getId(table_);
        case 3:
            return name(below(2) == 0 ? "true" : "false");
        case 10:
            return SymbolicFcnCall1UExpr(table_, name("defined"), name(below(2) == 0 ? "A" : "D")).getId(table_);
        case 11:
            return below(3) == 0 ? SymbolicDoubleValue(table_, 0.5).getId(table_) : name("S_z");
        default:
            const std::string& variable = variables[below(variables.size())];
            if (variable.size() == 1)
                return name(variable);
            return SymbolicMemberValue(table_, name("S"), variable.substr(2)).getId(table_);
        }
    }

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

struct Asked {
    Truth truth;
    std::string text;
};

/// Asks the preprocessor about the conditions that have a value.
void askAll(Preprocessor& preprocessor, Quiz& quiz, const std::vector<Asked>& conditions, const Assignment& values) {
    for (const Asked& condition : conditions)
        if (const auto value = condition.truth.under(values)) {
            preprocessor.ask(condition.text);
            quiz.ask(condition.text, *value != 0 ? 1 : 0);
        }
}

TEST(Decisions, RandomConditionsInDirectives) {
    SymbolicExprTable table;
    Expressions expressions(table, CTextUse::Directive);
    std::vector<Asked> conditions;
    while (conditions.size() < 4500) {
        const SymbolicExprId id = expressions.make(4);
        if (findCTextObstacles(table, id, CTextUse::Directive).empty())
            conditions.push_back(
                {Truth(table, id, Arithmetic::C), PreprocessorVCExpr(table, false, id % 2 == 0).print(id)});
    }
    Preprocessor preprocessor;
    Quiz quiz;
    for (int round = 0; round < 40; ++round) {
        Assignment values;
        for (const char* const name : {"A", "B", "C", "S.x", "S.y", "S_z"})
            if (expressions.below(10) != 0)
                values[name] = expressions.value();
        preprocessor.define(values);
        values["(sim)"] = values["(codegen)"] = values["@default"] = 1; // which no definition can do
        askAll(preprocessor, quiz, conditions, values);
    }
    EXPECT_GE(quiz.asked.size(), 100'000U);
    quiz.expectRight(preprocessor.decide());
}

/// What the library makes of a condition, the preprocessor decides as it decides the condition.
TEST(Decisions, AnyConditionsSimplifiedAndShortened) {
    struct Form {
        ExactValue condition;
        ExactValue form;
        std::string text;
    };

    const VCServiceHandle service;
    SymbolicExprTable& table = service->table();
    const ConditionWorld world{.reals = false, .calls = false};
    std::mt19937_64 random(41);
    std::vector<Form> forms;
    while (forms.size() < 4000) {
        const SymbolicExprId id = anyCondition(table, random, 2 + random() % 10, world);
        if (!booleanOps.contains(table.get(id)->op()))
            continue;
        for (const SymbolicExprId form :
             {service->simplify(id, false).id(), service->shortestCondition(id, false).id()})
            if (findCTextObstacles(table, form, CTextUse::Directive).empty())
                forms.push_back({ExactValue(table, id), ExactValue(table, form),
                                 PreprocessorVCExpr(table, false, true).print(form)});
    }
    Preprocessor preprocessor;
    Quiz quiz;
    for (int round = 0; round < 30; ++round) {
        const Assignment values = anyAssignment(random, world);
        Assignment definitions;
        for (const std::string& name : world.names)
            definitions[name] = values.at(name);
        preprocessor.define(definitions);
        for (const Form& each : forms) {
            const auto right = each.condition.under(values);
            if (!right || !each.form.under(values))
                continue;
            preprocessor.ask(each.text);
            quiz.ask(each.text, right->holds() ? 1 : 0);
        }
    }
    EXPECT_GE(quiz.asked.size(), 40'000U);
    quiz.expectRight(preprocessor.decide());
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
    std::vector<Asked> conditions;
    std::set<std::string> names;
    std::set<std::string> functions;
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
            conditions.push_back({truth, printer.print(id)});
            conditions.push_back({truth, printer.print(simplifier.simplify(id, passes))});
        }
    }
    for (const char* word : {"true", "false", "defined"})
        names.erase(word);
    EXPECT_GT(conditions.size(), 30'000U);
    Preprocessor preprocessor;
    Quiz quiz;
    std::mt19937_64 random(4);
    for (int round = 0; round < 3; ++round) {
        Assignment values;
        for (const std::string& name : names)
            if (functions.contains(name) || random() % 4 != 0)
                values[name] = static_cast<std::int64_t>(random() % 5) - 1;
        preprocessor.define(values, {functions.begin(), functions.end()});
        askAll(preprocessor, quiz, conditions, values);
    }
    quiz.expectRight(preprocessor.decide());
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
