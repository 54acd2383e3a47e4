// Conditions, their normal and their short forms decided by real preprocessors, cpp and, where it is installed, clang,
// as brute force decides the condition.  Pairs of a condition and values count where C defines what is computed.
#include "base/VCService.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "tests/campaign/Campaign.hpp"
#include "tests/preprocessor/Judges.hpp"
#include "tests/support/generators/AnyCondition.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <vector>

namespace VT::Campaign {

namespace {

constexpr std::size_t conditionsOfFile = 300;
constexpr std::size_t assignmentsOfFile = 24;

class PreprocessorPairs final : public Job {
public:
    void run(std::uint64_t seed, std::uint64_t item) override {
        std::mt19937_64 random = randomOf(seed, item);
        VCService service;
        service.setSolver(false);
        const Testing::ConditionWorld world{.names = {"A", "B", "C"}, .reals = false, .calls = false};
        std::vector<Form> forms;
        while (forms.size() < 3 * conditionsOfFile) {
            const Testing::ConditionShape shape{.symbolPairs = true, .truthValues = true};
            const SymbolicExprId id = random() % 2 == 0
                                          ? service.parseC(Testing::randomCondition(random, 1 + random() % 6, shape))
                                          : Testing::anyCondition(service.table(), random, 1 + random() % 8, world);
            for (const SymbolicExprId form :
                 {id, service.simplify(id, false).id(), service.shortestCondition(id, false).id()})
                add(forms, service.table(), id, form);
        }
        Testing::Preprocessor file;
        std::vector<const Form*> asked;
        std::vector<std::int64_t> right;
        for (std::size_t i = 0; i < assignmentsOfFile; ++i) {
            Testing::Assignment values = Testing::anyAssignment(random, world);
            values.erase("(sim)");
            values.erase("(codegen)");
            file.define(values);
            for (const Form& form : forms) {
                const auto value = form.condition.under(values);
                if (!value || !form.form.under(values))
                    continue; // C does not define what it computes
                file.ask(form.text);
                asked.push_back(&form);
                right.push_back(*value != 0 ? 1 : 0);
            }
        }
        judge(file.decide(), asked, right, "cpp");
        if (hasClang())
            judge(file.decide("clang -E -P -undef -x c conditions.h -o decided"), asked, right, "clang");
    }

    [[nodiscard]] std::string figure() const override {
        std::string words;
        for (const auto& [judge, count] : answers_)
            words += (words.empty() ? "" : ", ") + std::to_string(count) + " answers of " + judge;
        return words + (hasClang() ? "" : ", clang is not installed");
    }

private:
    struct Form {
        Testing::Truth condition;
        Testing::Truth form;
        std::string text;
    };

    static bool hasClang() {
        static const bool has = Testing::TemporaryFolder().run("command -v clang >/dev/null") == 0;
        return has;
    }

    static void add(std::vector<Form>& forms, const SymbolicExprTable& table, SymbolicExprId condition,
                    SymbolicExprId form) {
        using Testing::Arithmetic;
        if (findCTextObstacles(table, form, CTextUse::Directive).empty() &&
            findCTextObstacles(table, condition, CTextUse::Directive).empty() &&
            booleanOps.contains(table.get(condition)->op()))
            forms.push_back({Testing::Truth(table, condition, Arithmetic::C),
                             Testing::Truth(table, form, Arithmetic::C), PreprocessorVCExpr(table, false).print(form)});
    }

    void judge(const std::vector<std::int64_t>& answers, const std::vector<const Form*>& asked,
               const std::vector<std::int64_t>& right, const std::string& name) {
        Fuzz::demand(answers.size() == right.size(), "every question is answered", name);
        for (std::size_t i = 0; i < right.size(); ++i)
            Fuzz::demand(answers[i] == right[i], "a preprocessor decides a form as its condition",
                         name + ": " + asked[i]->text + " is " + std::to_string(answers[i]));
        answers_[name] += answers.size();
    }

    std::map<std::string, std::uint64_t> answers_;
};

} // namespace

std::unique_ptr<Job> makePreprocessorPairs(const std::string& /*name*/) {
    return std::make_unique<PreprocessorPairs>();
}

} // namespace VT::Campaign
