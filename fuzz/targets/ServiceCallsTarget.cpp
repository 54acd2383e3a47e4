// Calls of the service in any order, with identifiers of its conditions and of none, against a model: a condition is
// the set of assignments of three names for which it holds, and the service is a list of conditions, assumptions and
// aliases.
#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <bitset>
#include <map>

namespace VT::Fuzz {

namespace {

constexpr std::int64_t lowest = -2;
constexpr std::int64_t highest = 2;
constexpr std::size_t points = 125;
using Holding = std::bitset<points>;
const std::vector<std::string> names{"A", "B", "C"};

Holding holdingOf(const SymbolicExprTable& table, SymbolicExprId id) {
    const Testing::Truth truth(table, id);
    Holding holding;
    std::size_t point = 0;
    Testing::forEachAssignment(names, lowest, highest, [&](const Testing::Assignment& values) {
        holding[point++] = truth.under(values).value_or(0) != 0;
    });
    return holding;
}

struct Modelled {
    SymbolicExprId id;
    Holding holding;
};

class Session {
public:
    explicit Session(Choices& choices) : choices_(choices) {
        service_.setSolver(false);
        conditions_.push_back({service_.parseC("true"), Holding().set()});
        conditions_.push_back({service_.parseC("false"), Holding()});
    }

    void run() {
        for (int left = 64; left > 0 && !choices_.areUsedUp(); --left) {
            const std::size_t call = choices_.below(16);
            if (choices_.below(16) == 15)
                callWithNothing();
            else if (call < 4)
                read();
            else if (call < 8)
                combine();
            else if (call < 11)
                rewrite();
            else if (call < 13)
                ask();
            else if (call == 13)
                assume();
            else if (call == 14)
                print();
            else
                nameThings();
        }
    }

private:
    const Modelled& any() { return conditions_[choices_.byte() % conditions_.size()]; }

    /// Keeps a condition that has to hold for these assignments, as far as `where` goes.
    void keep(SymbolicExprId id, const Holding& holding, const char* what, const Holding& where = Holding().set()) {
        demand(service_.table().has(id), "a result is a condition", what);
        const Holding held = holdingOf(service_.table(), id);
        demand((held & where) == (holding & where), "a result holds where the model does",
               std::string(what) + ": " + service_.printCExpr(id));
        conditions_.push_back({id, held});
    }

    void read() {
        static const std::vector<std::string> operators{"==", "~=", "<", "<=", ">", ">="};
        const std::string name = choices_.of(names);
        const std::string value = std::to_string(choices_.below(4));
        const std::string op = choices_.of(operators);
        const std::size_t kind = choices_.below(8);
        const std::string left = kind == 0   ? "2*" + name
                                 : kind == 1 ? name + "+" + choices_.of(names)
                                 : kind == 2 ? name + "*" + choices_.of(names)
                                             : name;
        const SymbolicExprId quill = service_.parseQ(left + op + value);
        const SymbolicExprId c = service_.parseC(left + (op == "~=" ? "!=" : op) + value);
        demand(quill == c, "a condition is the same nodes in both languages", left + op + value);
        conditions_.push_back({c, holdingOf(service_.table(), c)});
    }

    void combine() {
        const Modelled a = any();
        const Modelled b = any();
        const bool simplify = choices_.below(2) == 0;
        switch (choices_.below(3)) {
        case 0: {
            const SymbolicExprId both = service_.AND(a.id, b.id, simplify).id();
            demand(both == service_.AND(a.id, b.id, simplify).id(), "a call repeated has the same result");
            return keep(both, a.holding & b.holding, "AND");
        }
        case 1:
            return keep(service_.OR(a.id, b.id, simplify).id(), a.holding | b.holding, "OR");
        default:
            return keep(service_.NOT(a.id, simplify).id(), ~a.holding, "NOT");
        }
    }

    void rewrite() {
        const Modelled a = any();
        const bool isQuill = choices_.below(2) == 0;
        switch (choices_.below(4)) {
        case 0: {
            const SymbolicExprId simple = service_.simplify(a.id, isQuill).id();
            demand(service_.simplify(simple, isQuill).id() == simple, "simplifying again changes nothing",
                   service_.printCExpr(a.id));
            return keep(simple, a.holding, "simplify");
        }
        case 1:
            return keep(service_.shortestCondition(a.id, isQuill).id(), a.holding, "shortestCondition", assumed_);
        case 2: {
            const Modelled known = any();
            return keep(service_.getImpliedCondition(a.id, known.id, isQuill).id(), a.holding, "getImpliedCondition",
                        known.holding & assumed_);
        }
        default: {
            const std::unordered_map<std::string, std::string> map{{"A", "B"}, {"B", "A"}};
            const SymbolicExprId there = service_.replaceSymbolsInExpression(a.id, map).id();
            const SymbolicExprId back = service_.replaceSymbolsInExpression(there, map).id();
            demand(back == a.id, "names exchanged twice are as before", service_.printCExpr(a.id));
            conditions_.push_back({there, holdingOf(service_.table(), there)});
        }
        }
    }

    void ask() {
        const Modelled a = any();
        const Modelled b = any();
        const Holding here = a.holding & assumed_;
        const Holding there = b.holding & assumed_;
        const std::string texts = service_.printCExpr(a.id) + "\n" + service_.printCExpr(b.id);
        demand(here.none() || !service_.canHold(a.id).isNo(), "what holds somewhere can hold", texts);
        demand(here == assumed_ || !service_.mustHold(a.id).isYes(), "what fails somewhere need not hold", texts);
        demand((here & ~there).none() || !service_.implies(a.id, b.id).isYes(), "an implication has no exception",
               texts);
        demand(here == there || !service_.isEquivalent(a.id, b.id).isYes(), "equivalent conditions do not differ",
               texts);
        demand((here & there).none() || !service_.isDisjoint(a.id, b.id).isYes(), "disjoint conditions do not meet",
               texts);
        const SetDecision covers = service_.covers({a.id, b.id});
        demand((here | there) == assumed_ || !covers.isYes(), "a cover leaves nothing out", texts);
        const Reasons reasons = service_.explainImplies(a.id, b.id);
        demand((here & ~there).none() || !reasons.isProven, "no reason proves what does not hold", texts);
    }

    void assume() {
        if (choices_.below(3) == 0) {
            service_.clearAssumptions();
            assumed_.set();
            demand(service_.assumptions().empty(), "nothing is assumed after all");
            return;
        }
        const Modelled a = any();
        if ((a.holding & assumed_).none())
            return; // the model knows no assignments of other numbers
        demand(service_.assume(a.id), "a condition can be assumed");
        assumed_ &= a.holding;
    }

    void print() {
        const Modelled a = any();
        const std::string c = service_.printCExprNoConversion(a.id);
        const SymbolicExprId again = service_.parseC(c);
        demand(holdingOf(service_.table(), again) == a.holding, "C text means what it prints", c);
        const std::string quill = service_.printQExprWithConversion(a.id);
        demand(holdingOf(service_.table(), service_.parseQ(quill)) == a.holding ||
                   quill.find("idivide") != std::string::npos,
               "Quill text means what it prints", quill);
        demand(service_.isEqual(a.id, a.id), "a condition is equal to itself");
    }

    void nameThings() {
        const std::string name = choices_.of(names);
        const std::string alias = "alias" + std::to_string(choices_.below(3));
        service_.addParameterAlias(name, alias);
        aliases_.emplace(name, alias); // the first one stays
        demand(service_.getParameterAlias(name) == aliases_.at(name), "an alias is the first one given");
        std::vector<std::string> symbols;
        service_.getSymbolsFromExpression(any().id, symbols, VCSymbolType::Identifier);
        for (const std::string& symbol : symbols)
            demand(symbol == "A" || symbol == "B" || symbol == "C" || symbol == "true" || symbol == "false",
                   "symbols are those of the condition", symbol);
    }

    /// Calls with identifiers that are not of the table.
    void callWithNothing() {
        const std::vector<SymbolicExprId> wrong{invalidId, service_.table().size() + 100'000, invalidId - 1};
        const SymbolicExprId bad = choices_.of(wrong);
        const SymbolicExprId good = any().id;
        const auto isNothing = [&](const VCSymbolicExprId& result) { return !service_.table().has(result.id()); };
        const SymbolicExprId always = conditions_[0].id;
        demand(isNothing(service_.NOT(bad, true)) && isNothing(service_.simplify(bad, false)),
               "nothing becomes nothing");
        demand(isNothing(service_.AND(bad, always, false)) && isNothing(service_.OR(always, bad, true)),
               "a combination with nothing is nothing");
        const std::string text = service_.printCExpr(good);
        demand(service_.canHold(bad).isUndecided(), "it is not decided whether nothing holds");
        demand(service_.implies(bad, good).isUndecided(), "it is not decided what nothing implies", text);
        demand(service_.compare(good, bad).kind == RelationKind::Undecided, "nothing compares with nothing", text);
        demand(service_.covers({good, bad}).isUndecided(), "a set with nothing in it is not decided", text);
        demand(!service_.assume(bad), "nothing cannot be assumed");
        demand(service_.isEqual(bad, bad) && !service_.isEqual(bad, good), "nothing is equal to itself alone");
        demand(isNothing(service_.shortestCondition(bad, false)) && isNothing(service_.getImpliedCondition(bad, good)),
               "nothing has no shorter form");
        try {
            static_cast<void>(service_.printCExpr(bad));
            demand(false, "nothing is not printed");
        } catch (const std::out_of_range&) { // as documented
        }
    }

    Choices& choices_;
    VCService service_;
    std::vector<Modelled> conditions_;
    Holding assumed_ = Holding().set();
    std::map<std::string, std::string> aliases_;
};

} // namespace

void fuzzServiceCalls(Input input) {
    Choices choices(input);
    Session(choices).run();
}

} // namespace VT::Fuzz
