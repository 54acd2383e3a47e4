// Joins the conditions around a branch into one, and shortens it.
//
// Method: the directives before the branch are read once more, so that macros have the states that they have in a scan;
// the conditions of the chains around it are read, and joined by &&.  Their shortest form (ShortestForm) is proven
// equal under the laws of macros: one that is not defined is 0, and an #include leaves a defined one alone.  Its parts
// are written in the words of the directives.
// Cost: linear in the text, and limits::shortenSteps.
#include "base/scan/regions/BuiltCondition.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/shorten/ShortestForm.hpp"
#include "base/scan/MacroChanges.hpp"
#include "base/scan/facts/BranchContext.hpp"
#include "base/scan/report/ConditionProposal.hpp"
#include "base/scan/report/DirectiveTexts.hpp"
#include "base/scan/report/WitnessText.hpp"

#include <algorithm>
#include <map>
#include <optional>
#include <set>
#include <tuple>
#include <unordered_map>

namespace VT {

namespace {

/// The branches that decide about one: of the chains around it, those up to the one around it.
std::vector<BuiltPart> partsOf(const ConditionalRegions& regions, std::uint32_t region) {
    std::unordered_map<std::uint32_t, std::uint32_t> around; // by chain
    for (std::uint32_t at = region; at != ConditionalRegions::none; at = regions[at].parent)
        around.emplace(regions[at].chain, at);
    std::vector<BuiltPart> parts;
    for (std::uint32_t at = 0; at <= region; ++at)
        if (const auto found = around.find(regions[at].chain); found != around.end() && at <= found->second)
            parts.push_back({at, at == found->second});
    return parts;
}

/// The conditions of one file up to a branch.
class BuiltReader {
public:
    explicit BuiltReader(bool isCpp)
        : unknowns_(table_, states_),
          changes_(states_, false),
          conditions_(table_, states_, unknowns_, isCpp),
          decider_(table_, {.keywordsInForce = false, .steps = limits::branchDecisionSteps}),
          printer_(table_, false) {
        table_.addBoolSymbols();
    }

    void read(std::string_view text, const std::vector<BuiltPart>& parts);
    void describe(BuiltCondition& built);

private:
    void add(const Directive& directive, bool holds);
    SymbolicExprId known();
    SymbolicExprId shortest(SymbolicExprId condition, SymbolicExprId known);
    [[nodiscard]] bool areDifferent(const std::vector<SymbolicExprId>& unknowns) const;
    std::string textOf(SymbolicExprId condition);
    std::optional<std::string> textOfComparison(SymbolicOp op, SymbolicExprId left, SymbolicExprId right);
    std::optional<std::string> textOfPart(SymbolicExprId part, bool isNegated);

    SymbolicExprTable table_;
    MacroStates states_;
    MacroUnknowns unknowns_;
    MacroChanges changes_;
    DirectiveConditionReader conditions_;
    Decider decider_;
    SymbolicExprPrinter printer_;
    std::vector<SymbolicExprId> operands_;
    std::vector<MacroUnknownId> asked_;
    std::map<SymbolicExprId, bool> constants_;                ///< unknowns that stand for constants
    bool isComplete_ = true;                                  ///< every directive has a condition that can be written
    std::unordered_map<SymbolicExprId, std::string> spelled_; ///< parts as they are written first
};

void BuiltReader::read(std::string_view text, const std::vector<BuiltPart>& parts) {
    DirectiveReader reader(text);
    std::size_t depth = 0;
    std::uint32_t region = 0;
    auto part = parts.begin();
    for (Directive directive; part != parts.end() && reader.next(directive);) {
        if (!belongsToChain(directive.kind, depth != 0)) {
            changes_.take(directive);
            continue;
        }
        if (directive.kind == DirectiveKind::Endif) {
            --depth;
            states_.close();
            continue;
        }
        changes_.beforeCondition();
        const bool opens = opensChain(directive.kind);
        depth += opens ? 1U : 0U;
        if (opens)
            states_.open();
        else
            states_.nextBranch();
        if (region++ == part->region)
            add(directive, (part++)->holds);
    }
}

void BuiltReader::add(const Directive& directive, bool holds) {
    if (directive.kind == DirectiveKind::Else)
        return;
    const DirectiveCondition condition = conditions_.read(directive);
    const bool hasText = condition.unknowns.size() != 1 || unknowns_[condition.unknowns.front()].left != "?";
    isComplete_ = isComplete_ && hasText;
    SymbolicExprId node = condition.node;
    if (condition.constant)
        node = *condition.constant ? table_.getIdTRUE() : table_.getIdFALSE();
    operands_.push_back(holds ? node : makeUnary(table_, SymbolicOp::Not, node));
    for (const auto& [unknown, value] : condition.constants)
        constants_.emplace(unknowns_[unknown].node, value);
    asked_.insert(asked_.end(), condition.unknowns.begin(), condition.unknowns.end());
    for (const PartSpelling& spelling : condition.spellings) {
        if (const SymbolicOp op = table_.get(spelling.part)->op(); op != SymbolicOp::And && op != SymbolicOp::Or) {
            if (const auto [place, isNew] = spelled_.try_emplace(spelling.part); isNew)
                place->second =
                    spelledTokens(directive.tokens.subspan(spelling.first, spelling.last - spelling.first + 1));
        }
    }
}

SymbolicExprId BuiltReader::shortest(SymbolicExprId condition, SymbolicExprId known) {
    const SymbolicExprQ2C toC(table_);
    const bool isAnythingKnown = known != table_.getIdTRUE();
    ConditionProofs proofs(decider_, toC, condition, known, isAnythingKnown);
    if (const auto decided = proofs.decided(condition))
        return *decided ? table_.getIdTRUE() : table_.getIdFALSE();
    if (!booleanOps.contains(table_.get(condition)->op())) // a macro alone
        return condition;
    ShortestForm search(table_, printer_, false, proofs);
    return search.find(condition, isAnythingKnown ? known : invalidId, [condition] { return condition; });
}

/// Whether no two unknowns are written in the same way, as those of a macro that changed between them are.
bool BuiltReader::areDifferent(const std::vector<SymbolicExprId>& unknowns) const {
    std::set<std::tuple<bool, std::string_view, std::string_view>> seen;
    return std::ranges::all_of(unknowns, [&](SymbolicExprId id) {
        const MacroUnknown* const unknown = unknowns_.find(id);
        return unknown == nullptr ||
               seen.emplace(unknown->kind == MacroUnknown::Kind::Defined, unknown->left, unknown->right).second;
    });
}

/// The text of a comparison.  An unsigned macro is never compared with a number below 0, of which there is -1 alone.
std::optional<std::string> BuiltReader::textOfComparison(SymbolicOp op, SymbolicExprId left, SymbolicExprId right) {
    const SymbolicExpr* const literal = table_.get(right);
    if (literal->op() == SymbolicOp::IntValue && static_cast<const SymbolicIntValue*>(literal)->getValue() < 0) {
        if (static_cast<const SymbolicIntValue*>(literal)->getValue() != -1 ||
            (op != SymbolicOp::LessThanEqual && op != SymbolicOp::GreaterThan))
            return std::nullopt;
        op = op == SymbolicOp::GreaterThan ? SymbolicOp::GreaterThanEqual : SymbolicOp::LessThan;
        right = SymbolicIntValue(table_, 0).getId(table_);
    }
    const SymbolicExprId comparison = makeBinary(table_, op, left, right);
    if (const auto spelled = spelled_.find(comparison); spelled != spelled_.end())
        return spelled->second;
    return partText(table_, unknowns_, {}, {}, comparison);
}

/// The text of a part that is not a chain, or of its opposite.
std::optional<std::string> BuiltReader::textOfPart(SymbolicExprId part, bool isNegated) {
    if (part == table_.getIdTRUE() || part == table_.getIdFALSE())
        return (part == table_.getIdTRUE()) != isNegated ? "1" : "0";
    const SymbolicExpr& node = *table_.get(part);
    const MacroUnknown* unknown = unknowns_.find(part);
    if (unknown == nullptr && comparisonOps.contains(node.op())) {
        const SymbolicOp op = isNegated ? operatorInfo(node.op()).negated : node.op();
        return textOfComparison(op, node.getInput(0), node.getInput(1));
    }
    if (const auto spelled = spelled_.find(part); spelled != spelled_.end())
        return isNegated ? negatedText(spelled->second) : spelled->second;
    if (unknown == nullptr || unknown->kind == MacroUnknown::Kind::Comparison)
        return std::nullopt;
    const bool isDefined = unknown->kind == MacroUnknown::Kind::Defined;
    const std::string text = isDefined ? "defined(" + unknown->left + ")" : unknown->left;
    return isNegated ? negatedText(text) : text;
}

/// The text of a condition; empty where it has none, or where one name in it would stand for two values.
std::string BuiltReader::textOf(SymbolicExprId condition) {
    std::vector<SymbolicExprId> nodes;
    walkDistinct(
        table_, condition, [&](SymbolicExprId id, const SymbolicExpr&) { nodes.push_back(id); }, [](SymbolicExprId) {});
    if (!areDifferent(nodes))
        return {};
    return chainText(table_, condition, {.bracketed = true, .withoutNots = true},
                     [this](SymbolicExprId part, bool isNegated) { return textOfPart(part, isNegated); })
        .value_or("");
}

/// What always holds: the laws of macros, and the values of constants.
SymbolicExprId BuiltReader::known() {
    const BranchContext::Laws laws = BranchContext(table_, unknowns_).laws(asked_);
    std::vector<SymbolicExprId> all = laws.includeLaws;
    all.insert(all.end(), laws.undefinedLaws.begin(), laws.undefinedLaws.end());
    for (const auto& [unknown, value] : constants_)
        all.push_back(value ? unknown : makeUnary(table_, SymbolicOp::Not, unknown));
    return all.empty() ? table_.getIdTRUE() : makeChain(table_, SymbolicOp::And, all);
}

void BuiltReader::describe(BuiltCondition& built) {
    if (!isComplete_)
        return;
    const SymbolicExprId whole = operands_.empty() ? table_.getIdTRUE() : makeChain(table_, SymbolicOp::And, operands_);
    const SymbolicExprId always = known();
    Decision canHold = decider_.overlaps(whole, always);
    if (canHold.isNo()) {
        built.condition = "0";
        return;
    }
    built.condition = textOf(shortest(whole, always));
    if (!canHold.isYes() || !canHold.witness)
        return;
    std::erase_if(*canHold.witness, [&](const UnknownValue& value) { return constants_.contains(value.unknown); });
    std::vector<SymbolicExprId> named;
    for (const UnknownValue& value : *canHold.witness)
        named.push_back(value.unknown);
    if (areDifferent(named))
        built.witness = witnessText(unknowns_, decider_, *canHold.witness);
}

} // namespace

BuiltCondition builtCondition(std::string_view text, bool isCpp, const ConditionalRegions& regions,
                              std::uint32_t region) {
    BuiltCondition built{partsOf(regions, region), {}, {}};
    for (const BuiltPart& part : built.parts)
        if (part.holds && regions[part.region].isAfterElse)
            return built;
    BuiltReader reader(isCpp);
    reader.read(text, built.parts);
    reader.describe(built);
    return built;
}

} // namespace VT
