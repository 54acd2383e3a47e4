// Calls of the library in which one allocation fails, or all from one on.  The error passes, nothing is left behind,
// the service is as consistent as before: the same call then has the answer that it has where nothing fails.
//
// A scenario is a call with a pair of conditions.  It runs in this process, so that an injection costs what the call
// does.
#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/decide/Assumptions.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/DimensionProofs.hpp"
#include "base/decide/shorten/StringifyImpliedCondition.hpp"
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/scan/SourceScan.hpp"
#include "base/scan/changes/BranchMeanings.hpp"
#include "base/service/SymbolRegistry.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/DimensionLists.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"
#include "base/transform/Symbols.hpp"
#include "host/Diagnostics.hpp"
#include "tests/campaign/Campaign.hpp"
#include "tests/memory/FailingMemory.hpp"
#include "tests/support/TreeText.hpp"

#include <algorithm>
#include <array>
#include <csignal>
#include <cstdio>
#include <exception>
#include <numeric>
#include <unistd.h>
#include <vector>

namespace VT::Campaign {

namespace {

using Testing::FailingMemory::How;
namespace Memory = Testing::FailingMemory;

struct Texts {
    std::string a;
    std::string b;
};

/// Conditions, and those that each is compared with: its own and those of the next rows.
constexpr std::size_t partners = 4;
const std::array<Texts, 9> texts{{{"A > 2 && A != 3 && A < 5", "A == 4"},
                                  {"A == 1 || A == 2", "A != 2 && (A > 2 || B)"},
                                  {"A * 2 > B && B > A * 2 - 2", "2 * A == B + 1"},
                                  {"f(A, B) / 2 + 3 * x.y != 1 && B", "f(A, B) > 4 || !(x.y < 2.5)"},
                                  {"A % 4 == 1 || A & 8", "(A << 2) > B ? 1 : A"},
                                  {"(sim) || !(A <= 7 && (B != A))", "(codegen) && B == A"},
                                  {"A && (B || (C && (A || !B)))", "C || !C"},
                                  {"A + B*3 - -2 >= 1.5", "A - B == C*C"},
                                  {"true", "A &&"}}};

struct Task {
    VCService& service;
    const Texts& texts;

    [[nodiscard]] SymbolicExprTable& table() const { return service.table(); }

    [[nodiscard]] SymbolicExprId a() const { return service.parseC(texts.a); }

    [[nodiscard]] SymbolicExprId b() const { return service.parseC(texts.b); }

    [[nodiscard]] std::string shown(SymbolicExprId id) const {
        return table().has(id) ? service.printCExprNoConversion(id) : "nothing";
    }

    [[nodiscard]] std::string shown(const VCSymbolicExprId& id) const { return shown(id.id()); }

    [[nodiscard]] std::string shown(const Decision& decision) const {
        return std::to_string(static_cast<int>(decision.answer)) +
               (decision.witness ? service.printWitness(*decision.witness) : "");
    }

    [[nodiscard]] std::string shown(const std::vector<VCSymbolicExprId>& ids) const {
        std::string all;
        for (const VCSymbolicExprId& id : ids)
            all += shown(id) + ";";
        return all;
    }

    [[nodiscard]] std::string shown(const Reasons& reasons) const { return std::to_string(reasons.isProven); }
};

std::string joined(const std::vector<std::string>& parts) {
    return std::accumulate(parts.begin(), parts.end(), std::string());
}

std::string joined(const std::optional<std::vector<std::string>>& parts) {
    return parts ? joined(*parts) : "unproven";
}

std::string shownReport(const ChoiceSetReport& report) {
    std::string all;
    for (const ChoiceFinding& finding : report.findings)
        all += " " + std::to_string(static_cast<int>(finding.fault)) + ":" + std::to_string(finding.choice);
    return all + "," + std::to_string(report.undecided.size());
}

std::string checked(const Task& task, ChoicePolicy policy, bool hasDefault) {
    const std::array choices{task.a(), task.b(), task.service.parseC("A == 9")};
    ChoiceSetChecker checker(task.service, {.reasons = true, .merges = true});
    const SymbolicExprId parent = task.service.parseC("A < 20");
    return shownReport(
               checker.check(parent, choices, hasDefault ? std::optional<std::size_t>(2) : std::nullopt, policy)) +
           shownReport(checker.checkCondition(parent, choices[0]));
}

std::string scanned(const std::string& text) {
    SourceScanner scanner({.why = true});
    std::string all = scanner.assume("LEVEL > 1").value_or("");
    scanner.scan(text, true, [&](const BranchFinding& finding) {
        all += finding.directive + finding.proposed + joined(finding.because);
    });
    return all;
}

std::string fileOf(const Task& task) {
    return "#if " + task.texts.a + "\n#if " + task.texts.b + "\nint a;\n#elif " + task.texts.a +
           "\nint b;\n#endif\n#else\n#define A 2\n#endif\n";
}

struct Call {
    const char* name;
    std::string (*run)(const Task& task);
};

constexpr auto calls = std::to_array<Call>({
    {"parse Quill", [](const Task& t) { return t.shown(t.service.parseQ("[" + t.texts.a + ", max(N', {2})]")); }},
    {"parse both", [](const Task& t) { return t.shown(t.a()) + t.shown(t.b()); }},
    {"AND", [](const Task& t) { return t.shown(t.service.AND(t.a(), t.b(), true)); }},
    {"OR", [](const Task& t) { return t.shown(t.service.OR(t.a(), t.b(), true)); }},
    {"NOT", [](const Task& t) { return t.shown(t.service.NOT(t.a(), true)) + t.shown(t.service.NOT(t.b(), false)); }},
    {"simplify", [](const Task& t) { return t.shown(t.service.simplify(t.a(), false)); }},
    {"simplify in Quill", [](const Task& t) { return t.service.simplifyQExprFromCCondition(t.texts.a); }},
    {"simplify without checks",
     [](const Task& t) { return t.service.simplifyExpressionWithoutEvalChecks(t.texts.a, false, true); }},
    {"print", [](const Task& t) { return t.service.printCExpr(t.a()) + t.service.printQExpr(t.b()); }},
    {"convert", [](const Task& t) { return t.service.convertExprBetweenQandC(t.texts.a, false, true); }},
    {"isEqual", [](const Task& t) { return std::to_string(t.service.isEqual(t.a(), t.b())); }},
    {"aliases",
     [](const Task& t) {
         t.service.addParameterAlias("A", "-4");
         return t.service.getParameterAlias("A") + t.shown(t.a());
     }},
    {"symbols",
     [](const Task& t) {
         std::vector<std::string> names;
         t.service.getSymbolsFromExpression(t.a(), names, VCSymbolType::Identifier);
         return joined(names);
     }},
    {"replace", [](const Task& t) { return t.shown(t.service.replaceSymbolsInExpression(t.a(), {{"A", "B"}, {"B", "A"}})); }},
    {"canHold", [](const Task& t) { return t.shown(t.service.canHold(t.a())) + t.shown(t.service.mustHold(t.b())); }},
    {"implies", [](const Task& t) { return t.shown(t.service.implies(t.a(), t.b())); }},
    {"isEquivalent", [](const Task& t) { return t.shown(t.service.isEquivalent(t.a(), t.b())); }},
    {"isDisjoint", [](const Task& t) { return t.shown(t.service.isDisjoint(t.a(), t.b())); }},
    {"isTighterThan", [](const Task& t) { return t.shown(t.service.isTighterThan(t.a(), t.b())); }},
    {"compare", [](const Task& t) { return std::to_string(static_cast<int>(t.service.compare(t.a(), t.b()).kind)); }},
    {"covers",
     [](const Task& t) {
         return std::to_string(t.service.coversFromCConditions({t.texts.a, t.texts.b, "A > 9"}).isYes());
     }},
    {"are disjoint",
     [](const Task& t) {
         return std::to_string(t.service.isDisjoint(std::vector<VCSymbolicExprId>{t.a(), t.b(), t.service.parseC("A > 9")}).isNo());
     }},
    {"assume",
     [](const Task& t) {
         t.service.clearAssumptions();
         t.service.assume(t.a());
         const std::string answer = t.shown(t.service.mustHold(t.b())) + t.shown(t.service.assumptions());
         t.service.clearAssumptions();
         return answer;
     }},
    {"explain implies", [](const Task& t) { return joined(t.service.explainImpliesFromCConditions(t.texts.a, t.texts.b)); }},
    {"explain equivalent",
     [](const Task& t) { return std::to_string(t.service.explainEquivalentFromCConditions(t.texts.a, t.texts.b).has_value()); }},
    {"explain disjoint", [](const Task& t) { return joined(t.service.explainDisjointFromCConditions({t.texts.a, t.texts.b})); }},
    {"explain given",
     [](const Task& t) {
         const VCSymbolicExprId implied = t.service.getImpliedCondition(t.a(), t.b());
         return std::to_string(t.service.explainImpliedCondition(t.a(), implied, t.b()).because.isProven);
     }},
    {"operands",
     [](const Task& t) {
         return t.shown(t.service.computeUniqueOrOperandsId(t.a())) + t.shown(t.service.computeUniqueAndOperandsId(t.b()));
     }},
    {"shortest",
     [](const Task& t) {
         std::vector<ShortForm> forms;
         return t.shown(t.service.shortestCondition(t.a(), false, &forms)) + std::to_string(forms.size());
     }},
    {"shortest in Quill", [](const Task& t) { return t.service.shortestQExprFromCCondition(t.texts.a); }},
    {"given", [](const Task& t) { return t.service.getImpliedCExprFromCConditions(t.texts.a, t.texts.b); }},
    {"a decider",
     [](const Task& t) {
         Decider decider(t.table(), {.bits32 = true});
         return t.shown(decider.overlaps(t.a(), t.b())) + t.shown(decider.equivalentGiven(t.a(), t.b(), t.a()));
     }},
    {"dimensions",
     [](const Task& t) {
         Decider decider(t.table());
         Assumptions assumptions(t.table());
         assumptions.add(t.a());
         DimensionProofs proofs(t.table(), decider, assumptions);
         const SymbolicExprId sum = t.service.parseQ("A*2+2");
         return t.shown(proofs.isNonNegative(sum)) + t.shown(proofs.isDivisible(sum, 2));
     }},
    {"evaluate",
     [](const Task& t) {
         t.table().registerValue("A", 1);
         t.table().registerValue("B", 2);
         t.table().registerValue("C", 3);
         PreparedExpr prepared = SymbolicExprEval(t.table()).prepare(t.a());
         static_cast<void>(prepared.run());
         return std::to_string(SymbolicExprEval(t.table()).eval(t.a()) == prepared.run());
     }},
    {"evaluate rows",
     [](const Task& t) {
         std::vector<double> results(300);
         PreparedExpr prepared = SymbolicExprEval(t.table()).prepare(t.service.parseQ("A*2+1"));
         t.table().registerValue("A", 4);
         prepared.runMany({}, results.size(), [&](ScalarType) { return results.data(); });
         return std::to_string(results.size());
     }},
    {"copy",
     [](const Task& t) {
         SymbolicExprTable other;
         return Testing::treeText(other, SymbolicExprCopy(t.table(), other)(t.a()));
     }},
    {"convert shapes",
     [](const Task& t) { return t.shown(SymbolicExprQ2C(t.table())(SymbolicExprC2Q(t.table())(t.a()))); }},
    {"rewrite dimensions",
     [](const Task& t) {
         const SymbolicExprId dimension = t.service.parseQ("[A*2/2, [3 4]]");
         return t.shown(SymbolicExprDimensionLists(t.table())(dimension));
     }},
    {"print a directive",
     [](const Task& t) {
         const std::string text = PreprocessorVCExpr(t.table(), false).print(t.a());
         return text + std::to_string(findCTextObstacles(t.table(), t.b(), CTextUse::Directive).size());
     }},
    {"print what is left", [](const Task& t) { return StringifyImpliedCondition(t.table(), false, false, t.b()).print(t.a()); }},
    {"register",
     [](const Task& t) {
         SymbolRegistry registry(t.table());
         return registry.registerExpression(nullptr, t.service.parseQ("A*2+1")) + joined(registry.registeredBy(nullptr));
     }},
    {"check, one choice", [](const Task& t) { return checked(t, ChoicePolicy::Unique, false); }},
    {"check, the first", [](const Task& t) { return checked(t, ChoicePolicy::First, true); }},
    {"scan", [](const Task& t) { return scanned(fileOf(t)); }},
    {"changes",
     [](const Task& t) {
         std::string all;
         for (const ChangedBranch& branch : changedBranches(fileOf(t), "#if A\nint a;\n#endif\n", true, {{1, 8, 1, 3}}))
             all += branch.directive + branch.witness;
         return all;
     }},
});

/// What runs, for a process that ends without more.
char running[200] = "";

extern "C" void sayWhatRuns(int number) {
    static_cast<void>(!write(2, running, std::char_traits<char>::length(running)));
    std::signal(number, SIG_DFL);
    std::raise(number);
}

class LibraryMemory final : public Job {
public:
    LibraryMemory() {
        for (const int number : {SIGSEGV, SIGABRT, SIGFPE, SIGBUS, SIGILL})
            std::signal(number, sayWhatRuns);
        for (const Call& call : calls)
            for (std::size_t i = 0; i < partners * texts.size(); ++i) {
                const Texts pair{texts[i % texts.size()].a, texts[(i + i / texts.size()) % texts.size()].b};
                Scenario scenario{&call, pair, "", 0, total_};
                for (int round = 0; round < 2; ++round) { // what is made once for all is made in the first
                    VCService service;
                    service.setSolver(false);
                    Memory::arm(~std::size_t{0}, How::Once);
                    scenario.expected = answer({service, pair}, call);
                    scenario.allocations = Memory::disarm();
                }
                total_ += 2 * scenario.allocations;
                scenarios_.push_back(std::move(scenario));
            }
    }

    void run(std::uint64_t /*seed*/, std::uint64_t item) override {
        std::uint64_t step = total_ * 5 / 13 + 1; // without a common divisor it leaps through all
        while (std::gcd(step, total_) != 1)
            ++step;
        const std::uint64_t number = item * step % total_;
        const auto after = std::ranges::upper_bound(scenarios_, number, {}, &Scenario::first);
        const Scenario& scenario = *std::prev(after);
        const std::uint64_t within = number - scenario.first;
        inject(scenario, within / 2, within % 2 == 0 ? How::Once : How::FromThenOn);
        ++done_;
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(done_) + " of " + std::to_string(total_) + " injections in " +
               std::to_string(scenarios_.size()) + " scenarios, " + std::to_string(unseen_) + " of them without effect";
    }

    [[nodiscard]] std::uint64_t items() const override { return total_; }

private:
    struct Scenario {
        const Call* call;
        Texts pair;
        std::string expected;
        std::uint64_t allocations;
        std::uint64_t first; ///< of its injections, two for each allocation
    };

    static std::string answer(const Task& task, const Call& call) {
        try {
            return call.run(task);
        } catch (const HostDiagnostic&) {
            return "refused";
        }
    }

    void inject(const Scenario& scenario, std::uint64_t number, How how) {
        std::snprintf(running, sizeof running,
                      "broken: running out of memory ends no call: %s, %s; %s, allocation %llu %s\n",
                      scenario.call->name, scenario.pair.a.c_str(), scenario.pair.b.c_str(),
                      static_cast<unsigned long long>(number), how == How::Once ? "once" : "from then on");
        const std::size_t before = Memory::living();
        std::string first;
        std::string second;
        bool returned = false;
        {
            VCService service;
            service.setSolver(false);
            const Task task{service, scenario.pair};
            returned = Memory::attempt(
                number, [&] { first = answer(task, *scenario.call); }, how);
            Fuzz::demand(!returned || first == scenario.expected, "an answer that comes is right", running + first);
            second = answer(task, *scenario.call);
        }
        Fuzz::demand(second == scenario.expected, "the call repeated is right", running + second);
        std::string().swap(first);
        std::string().swap(second);
        const bool isClean = Memory::living() == before;
        Fuzz::demand(isClean, "nothing is left behind", running);
        unseen_ += returned ? 1 : 0;
    }

    std::vector<Scenario> scenarios_;
    std::uint64_t total_ = 0;
    std::uint64_t done_ = 0;
    std::uint64_t unseen_ = 0;
};

} // namespace

std::unique_ptr<Job> makeLibraryMemory(const std::string& /*name*/) {
    return std::make_unique<LibraryMemory>();
}

} // namespace VT::Campaign
