// Scans one file in one configuration for branches that are dead, always entered, or enterable by a shorter condition.
//
// Method: one pass over the directives with a stack of open chains.  For each condition, the facts around it that are
// about the same macros are collected, with those of the build and the assumptions; the condition is judged under them,
// and the reasons are reduced to those that suffice.
// Cost: about linear in the text; limits::scanSteps and limits::scanStepsPerBranch bound the decisions.
// Relies on: DirectiveReader, DirectiveConditionReader, BranchContext, BranchJudge.
#include "base/scan/FileScan.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/report/ConditionProposal.hpp"
#include "base/scan/report/ConfigurationText.hpp"
#include "base/scan/report/DirectiveTexts.hpp"
#include "base/scan/report/SourcePlaces.hpp"

#include <utility>

namespace VT {

void FileScan::run() {
    if (hasManyReadings(text_))
        return;
    DirectiveReader reader(text_);
    for (Directive directive; reader.next(directive);) {
        switch (directive.kind) {
        case DirectiveKind::Define:
        case DirectiveKind::Undef:
        case DirectiveKind::Include:
        case DirectiveKind::Pragma:
            changes_.take(directive);
            break;
        case DirectiveKind::Endif:
            if (chains_.empty())
                break;
            context_.pop(chains_.back().firstFact);
            chains_.pop_back();
            states_.close();
            break;
        default:
            beginBranch(directive);
        }
    }
}

void FileScan::beginBranch(const Directive& directive) {
    changes_.beforeCondition();
    if (opensChain(directive.kind)) {
        const bool silent = isSilent();
        states_.open();
        chains_.push_back({context_.size(), context_.size(), silent});
    } else if (chains_.empty()) {
        return;
    } else {
        leaveBranch();
        if (chains_.back().hadElse) { // not a chain with a meaning
            chains_.back().silent = true;
            return;
        }
    }
    ++counts_.branches;
    Chain& chain = chains_.back();
    chain.silent = chain.switchedOn || chain.always.has_value();
    if (chain.always && !chain.switchedOn && !chain.silentAround) {
        BranchFinding dead = finding(BranchFindingKind::Dead, directive);
        dead.reasons.push_back(*chain.always);
        dead.cause = chain.cause;
        dead.needsDefinitions = chain.needsDefinitions;
        report(std::move(dead), directive, "0");
    }
    chain.hadElse = directive.kind == DirectiveKind::Else;
    if (!isSilent() && !chain.hadElse) {
        if (input_.ask)
            input_.ask();
        readBranch(directive);
    }
}

void FileScan::leaveBranch() {
    states_.nextBranch();
    Chain& chain = chains_.back();
    if (chain.hasFact)
        context_.negateFrom(chain.branchFact);
    chain.hasFact = false;
}

void FileScan::readBranch(const Directive& directive) {
    DirectiveCondition condition = conditions_.read(directive);
    noteValues(condition);
    assumptions_.readFor(directive.tokens);
    counts_.unread += condition.understood ? 0U : 1U;
    Chain& chain = chains_.back();
    if (condition.constant) {
        chain.silent = !*condition.constant;
        chain.switchedOn = *condition.constant;
        return;
    }
    judgeBranch(directive, condition);
    chain.hasFact = true;
    chain.branchFact = context_.size();
    if (!input_.options.why)
        condition.spellings.clear();
    context_.push({condition.node, false, directive.line, directive.begin, directive.end, std::move(condition.unknowns),
                   std::move(condition.spellings)});
}

/// Whether a condition has no && or ||.
bool FileScan::isSingle(SymbolicExprId condition) const {
    const SymbolicExpr* node = table_.get(condition);
    while (node->op() == SymbolicOp::Not)
        node = table_.get(node->getInput(0));
    return node->op() != SymbolicOp::And && node->op() != SymbolicOp::Or;
}

/// Remembers the values of unknowns under the build.
void FileScan::noteValues(const DirectiveCondition& condition) {
    for (const BuildFact& fact : condition.known)
        values_.emplace(fact.unknown, fact);
}

FileScan::Known FileScan::knownFor(const DirectiveCondition& condition) {
    Known known;
    std::vector<MacroUnknownId> asked = condition.unknowns;
    const auto ask = [&](const std::vector<MacroUnknownId>& unknowns) {
        asked.insert(asked.end(), unknowns.begin(), unknowns.end());
    };
    if (!assumptions_.facts().empty()) { // which may lead from the branches around to the condition alone
        for (std::size_t i = context_.size(), left = limits::branchesAssumedAbout; i-- > 0 && left > 0; --left)
            if (assumptions_.concern(context_[i].unknowns))
                ask(context_[i].unknowns);
    }
    for (std::size_t assumed = 0;;) { // directives lead to assumptions, and these to directives
        known.directives = context_.related(asked);
        for (const std::size_t fact : known.directives)
            ask(context_[fact].unknowns);
        known.assumptions = assumptions_.relatedTo(asked);
        if (known.assumptions.size() == assumed)
            break;
        assumed = known.assumptions.size();
        for (const std::size_t fact : known.assumptions)
            ask(assumptions_.facts()[fact].condition.unknowns);
    }
    for (const std::size_t fact : known.assumptions)
        noteValues(assumptions_.facts()[fact].condition);
    if (!values_.empty()) {
        std::ranges::sort(asked);
        asked.erase(std::unique(asked.begin(), asked.end()), asked.end());
        for (const MacroUnknownId unknown : asked)
            if (values_.contains(unknown))
                known.build.push_back(unknown);
    }
    std::vector<SymbolicExprId>& facts = known.conditions.facts;
    for (const MacroUnknownId unknown : known.build)
        facts.push_back(values_.at(unknown).node);
    for (const std::size_t fact : known.assumptions)
        facts.push_back(assumptions_.facts()[fact].condition.node);
    for (const std::size_t fact : known.directives)
        facts.push_back(context_[fact].node);
    if (facts.empty() && isSingle(condition.node))
        return known;
    BranchContext::Laws laws = context_.laws(std::move(asked));
    known.conditions.includeLaws = std::move(laws.includeLaws);
    known.conditions.undefinedLaws = std::move(laws.undefinedLaws);
    return known;
}

void FileScan::judgeBranch(const Directive& directive, const DirectiveCondition& condition) {
    const Known known = knownFor(condition);
    if ((known.conditions.facts.empty() && isSingle(condition.node)) || !judge_.beginBranch())
        return;
    const BranchVerdict verdict = judge_.judge(condition.node, known.conditions);
    if (input_.witnesses != nullptr && verdict.kind != BranchVerdictKind::Dead)
        findWitness(directive, condition, known);
    if (verdict.kind == BranchVerdictKind::None)
        return;
    std::string proposed = verdict.kind == BranchVerdictKind::Dead ? "0" : "1";
    if (verdict.kind == BranchVerdictKind::Removable) {
        auto shorter = proposalText(table_, unknowns_, condition, directive.tokens, verdict.shorter);
        if (!shorter || shorter->size() >= conditionText(directive).size())
            return;
        proposed = *std::move(shorter);
    }
    const std::vector<std::size_t> reasons = judge_.reasons(condition.node, verdict, known.conditions).positions;
    BranchFinding result = finding(verdict.kind == BranchVerdictKind::Dead         ? BranchFindingKind::Dead
                                   : isSpelledOut(known, reasons)                  ? BranchFindingKind::SpelledOut
                                   : verdict.kind == BranchVerdictKind::AlwaysTrue ? BranchFindingKind::AlwaysTrue
                                                                                   : BranchFindingKind::Removable,
                                   directive);
    result.cause = causeOf(known, reasons);
    result.needsDefinitions = std::ranges::any_of(reasons, [&](std::size_t at) { return at < known.build.size(); });
    for (const std::size_t at : reasons) {
        for (BranchReason& reason : reasonsOf(known, at))
            if (std::ranges::find(result.reasons, reason) == result.reasons.end())
                result.reasons.push_back(std::move(reason));
    }
    if (input_.options.why) {
        BranchWhy why = this->why(directive, condition, verdict, known, reasons);
        result.because = std::move(why.operands);
        result.isMinimal = why.isMinimal;
        if (verdict.kind == BranchVerdictKind::Removable) {
            const SpelledCondition spelled{
                condition.node, {directive.tokens.begin(), directive.tokens.end()}, condition.spellings};
            result.redundant = lostOperands(table_, unknowns_, spelled, verdict.shorter);
        }
    }
    Chain& chain = chains_.back();
    chain.silent = verdict.kind == BranchVerdictKind::Dead;
    if (verdict.kind == BranchVerdictKind::AlwaysTrue) {
        chain.cause = result.cause;
        chain.needsDefinitions = result.needsDefinitions;
        chain.always = BranchReason{result.region, quotedDirective(result.directive), true};
    }
    report(std::move(result), directive, std::move(proposed));
}

/// Whether a finding follows from the branches before it in its chain alone.
bool FileScan::isSpelledOut(const Known& known, const std::vector<std::size_t>& reasons) const {
    const std::size_t first = known.build.size() + known.assumptions.size();
    return !reasons.empty() && std::ranges::all_of(reasons, [&](std::size_t at) {
        return at >= first && known.directives[at - first] >= chains_.back().firstFact;
    });
}

/// What a finding needs besides the code.
BranchCause FileScan::causeOf(const Known& known, const std::vector<std::size_t>& reasons) const {
    BranchCause cause = BranchCause::Code;
    for (std::size_t at : reasons) {
        const bool isBuild = at < known.build.size();
        at -= isBuild ? 0 : known.build.size();
        if (isBuild)
            cause = std::max(cause, BranchCause::Configuration);
        else if (at < known.assumptions.size()) {
            cause = std::max(cause, assumptions_.facts()[known.assumptions[at]].assumption->kind ==
                                            BuildAssumptions::Item::Kind::Absence
                                        ? BranchCause::Absence
                                        : BranchCause::Configuration);
        }
    }
    return cause;
}

/// Finds definitions that enter a branch, where they are wanted.
void FileScan::findWitness(const Directive& directive, const DirectiveCondition& condition, const Known& known) {
    const auto wanted = input_.witnesses->find(directive.line);
    if (wanted != input_.witnesses->end() && wanted->second.empty()) {
        wanted->second =
            configurationText(unknowns_, judge_.witness(condition.node, known.conditions),
                              [this](std::string_view name) { return input_.assumptions.isLogical(name); });
    }
}

/// The operands that force a verdict, picked from the facts that are its reasons.
BranchWhy FileScan::why(const Directive& directive, const DirectiveCondition& condition, const BranchVerdict& verdict,
                        const Known& known, const std::vector<std::size_t>& reasons) {
    std::vector<SpelledCondition> conditions;
    for (const std::size_t at : reasons) {
        SpelledCondition spelled{known.conditions.facts[at], {}, {}};
        if (at < known.build.size()) {
            for (const BranchReason& definition : definitionsOf(values_.at(known.build[at])))
                spelled.texts.push_back(definition.directive);
        } else if (const std::size_t next = at - known.build.size(); next < known.assumptions.size()) {
            const FileAssumptions::Fact& fact = assumptions_.facts()[known.assumptions[next]];
            spelled.tokens = BuildAssumptions::tokensOf(*fact.assumption);
            if (!fact.assumption->shown.empty())
                spelled.texts.push_back(fact.assumption->shown);
            spelled.spellings = fact.condition.spellings;
        } else {
            const BranchFact& fact = context_[known.directives[next - known.assumptions.size()]];
            spelled.spellings = fact.spellings;
            DirectiveReader reader(text_.substr(fact.begin, fact.end - fact.begin));
            Directive read{};
            if (reader.next(read))
                for (const DirectiveToken& token : read.tokens)
                    spelled.tokens.push_back(token);
            spelled.texts = {};
            kept_.push_back(std::move(reader));
        }
        conditions.push_back(std::move(spelled));
    }
    SymbolicExprId asked = condition.node;
    if (verdict.kind == BranchVerdictKind::Dead) {
        conditions.push_back({condition.node, {directive.tokens.begin(), directive.tokens.end()}, condition.spellings});
        asked = table_.getIdTRUE();
    }
    BranchWhy result = whyOf(table_, unknowns_, judge_, asked, verdict, conditions, known.conditions);
    kept_.clear();
    return result;
}

/// What a fact says: one directive or assumption, or the definitions that a value follows from.
std::vector<BranchReason> FileScan::reasonsOf(const Known& known, std::size_t fact) const {
    if (fact < known.build.size())
        return definitionsOf(values_.at(known.build[fact]));
    fact -= known.build.size();
    if (fact >= known.assumptions.size())
        return {reasonOf(context_[known.directives[fact - known.assumptions.size()]])};
    const BuildAssumptions::Item& assumption = *assumptions_.facts()[known.assumptions[fact]].assumption;
    const bool isAbsence = assumption.kind == BuildAssumptions::Item::Kind::Absence;
    return {{{},
             quotedDirective(assumption.shown.empty() ? assumption.line->substr(assumption.line->find(' ') + 1)
                                                      : assumption.shown),
             true,
             isAbsence ? BranchReasonKind::Absence : BranchReasonKind::Assumption}};
}

std::vector<BranchReason> FileScan::definitionsOf(const BuildFact& fact) const {
    std::vector<BranchReason> definitions;
    for (const std::string& name : fact.macros) {
        if (const BuildMacros::Macro* const macro = input_.build->find(name))
            definitions.push_back(
                {{macro->place.line, 0, 0, 0}, macro->place.text, true, BranchReasonKind::Build, macro->place.file});
    }
    return definitions;
}

BranchReason FileScan::reasonOf(const BranchFact& fact) const {
    DirectiveReader reader(text_.substr(fact.begin, std::min(fact.end - fact.begin, 2 * limits::quotedBytes)));
    Directive directive{};
    BranchReason reason{regionOf(text_, fact.begin, fact.line, fact.begin, fact.end), {}, !fact.negated};
    if (reader.next(directive))
        reason.directive = quotedDirective(directiveText(directive));
    return reason;
}

BranchFinding FileScan::finding(BranchFindingKind kind, const Directive& directive) const {
    BranchFinding result{};
    result.kind = kind;
    result.region = regionOf(text_, directive.begin, directive.line, directive.begin, directive.end);
    result.directive = directiveText(directive);
    return result;
}

/// Reports a finding with the condition to write instead; #else has none.
void FileScan::report(BranchFinding finding, const Directive& directive, std::string proposed) {
    if (directive.kind != DirectiveKind::Else && !directive.tokens.empty()) {
        finding.condition = conditionText(directive);
        finding.edit = conditionEdit(text_, directive, proposed);
        finding.replaced = regionOf(text_, directive.begin, directive.line, finding.edit.begin, finding.edit.end);
        finding.proposed = std::move(proposed);
    }
    report_(std::move(finding));
}

} // namespace VT
