// vtsym compare: the relation of two conditions, with the assignments that prove it.
// The decider answers; this prints its decision as text or JSON.
#include "tools/vtsym/answers/ReasonText.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/Pairs.hpp"
#include "tools/vtsym/findings/UndecidedText.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <array>

namespace vtsym {

namespace {

constexpr const char* compareNotes =
    R"(Conditions are over integers without bounds unless --bits is given.  The relation is exact: equivalent, disjoint,
implies, implied by or overlaps.  Assignments prove it: for which values the first holds alone, the second alone, or
both.  A question that takes too many steps, or has products and bits of unknowns that no solver decides, stays undecided.

Examples:
  vtsym compare 'A<B && B<C' 'A<C'
  vtsym compare --from quill 'A == 1 | A == 2' 'A > 0 & A < 3'
  vtsym compare --bits 32 'A < 2147483647' 'A != 2147483647'
  vtsym compare --why 'Mode == 1 && Gear > 2' 'Sport && Gear <= 1'
  vtsym compare --assume 'N >= 1 && N <= 64' 'N > 0' 'N != 65'
  vtsym compare --json < pairs.txt)";

/// In the order of VT::RelationKind.
constexpr std::array<const char*, 6> relations{"equivalent", "disjoint", "implies",
                                               "implied by", "overlaps", "undecided"};

class Comparer {
public:
    explicit Comparer(const PairOptions& options)
        : conditions(options.bits32, options, options.assumptions),
          options_(options) {}

    void answer(const std::string& text, std::string& out) {
        conditions.makeRoomFor(text);
        const ConditionPair pair = readPair(conditions, options_, text);
        const VT::Relation relation = conditions.service().compare(pair.first, pair.second);
        if (options_.json)
            appendJson(pair, relation, out);
        else
            appendText(relation, out);
        if (options_.why && relation.kind == VT::RelationKind::Equivalent)
            appendBothWays(conditions.service().explainEquivalent(pair.first, pair.second), out);
        const VT::Reasons reasons = options_.why ? reasonsOf(pair, relation) : VT::Reasons{};
        if (reasons.isProven && options_.json)
            appendMember(out, "because", reasonsJson(conditions, options_, reasons));
        else if (reasons.isProven && !reasons.operands.empty())
            out.append("; because: ").append(reasonsText(conditions, options_, reasons));
    }

    Conditions conditions;

private:
    /// The operands that force the relation; an overlap needs none.
    [[nodiscard]] VT::Reasons reasonsOf(const ConditionPair& pair, const VT::Relation& relation) const {
        VT::VCService& service = conditions.service();
        switch (relation.kind) {
        case VT::RelationKind::Disjoint:
            return service.explainDisjoint({pair.first, pair.second});
        case VT::RelationKind::Implies:
            return service.explainImplies(pair.first, pair.second);
        case VT::RelationKind::ImpliedBy:
            return service.explainImplies(pair.second, pair.first);
        default:
            return {};
        }
    }

    /// Why each of two equivalent conditions implies the other.
    void appendBothWays(const VT::EquivalenceReasons& reasons, std::string& out) const {
        std::string json;
        const auto append = [&](const std::string& which, const char* member, const VT::Reasons& each) {
            if (!each.isProven)
                return;
            if (options_.json)
                appendMember(json, member, reasonsJson(conditions, options_, each));
            else if (each.operands.empty())
                out.append("; " + which + " always holds");
            else
                out.append("; " + which + " because: ").append(reasonsText(conditions, options_, each));
        };
        append("second", "a", reasons.secondFromFirst);
        append("first", "b", reasons.firstFromSecond);
        if (!json.empty())
            appendMember(out, "because", "{" + json.substr(1) + "}");
    }

    /// Why a relation is undecided.
    [[nodiscard]] std::string reasonOf(const VT::Relation& relation) const {
        return "it " + undecidedText(relation.bound, conditions.stepsUsedUp());
    }

    void appendText(const VT::Relation& relation, std::string& out) const {
        out.append(relations.at(static_cast<std::size_t>(relation.kind)));
        if (relation.kind == VT::RelationKind::Undecided)
            out.append(": ").append(reasonOf(relation));
        const auto append = [&](const char* who, const VT::Decision& decision) {
            if (decision.witness)
                out.append("; ").append(who).append(witnessText(conditions, options_, *decision.witness));
        };
        append("first alone: ", relation.onlyA);
        append("second alone: ", relation.onlyB);
        if (relation.kind == VT::RelationKind::Overlaps || relation.kind == VT::RelationKind::Undecided)
            append("both: ", relation.both);
    }

    void appendJson(const ConditionPair& pair, const VT::Relation& relation, std::string& out) const {
        appendMember(out, "a", jsonString(pair.firstText));
        appendMember(out, "b", jsonString(pair.secondText));
        appendMember(out, "relation", jsonString(relations.at(static_cast<std::size_t>(relation.kind))));
        if (relation.kind == VT::RelationKind::Undecided)
            appendMember(out, "reason", jsonString(reasonOf(relation)));
        std::string witnesses;
        const auto append = [&](const char* who, const VT::Decision& decision) {
            if (decision.witness)
                appendMember(witnesses, who, witnessJson(conditions, options_, *decision.witness));
        };
        append("only_a", relation.onlyA);
        append("only_b", relation.onlyB);
        append("both", relation.both);
        if (!witnesses.empty())
            appendMember(out, "witness", "{" + witnesses.substr(1) + "}");
    }

    const PairOptions& options_;
};

} // namespace

void addCompare(CommandLine& program) {
    Command& command =
        program.add("compare", "Compare two conditions: equivalent, disjoint, implied or overlapping", compareNotes);
    const auto options = std::make_shared<PairOptions>();
    addPairOptions(command, *options, "A", "B");
    command.run = [options](Console& console) {
        return answerTexts(*options, console, [&] {
            Answering answering = answeringBy(std::make_shared<Comparer>(*options));
            answering.writesInput = true;
            return answering;
        });
    };
}

} // namespace vtsym
