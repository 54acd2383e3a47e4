// Scans a file for branches that are dead, always entered, or enterable by a shorter condition.
//
// Method: one pass over the directives with a stack of open chains.  For each condition, the facts around it that are
// about the same macros are collected, the condition is judged under them, and the reasons are reduced to those that
// suffice.
// Cost: about linear in the text; limits::scanSteps and limits::scanStepsPerBranch bound the decisions.
// Relies on: DirectiveReader, DirectiveConditionReader, BranchContext, BranchJudge.
#include "base/scan/SourceScan.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/BranchContext.hpp"
#include "base/scan/BranchVerdict.hpp"
#include "base/scan/ConditionProposal.hpp"
#include "base/scan/SourcePlaces.hpp"

#include <utility>

namespace VT {

namespace {

using ReportFinding = std::function<void(const BranchFinding&)>;

std::string_view keywordText(DirectiveKind kind) {
    switch (kind) {
    case DirectiveKind::If:
        return "#if";
    case DirectiveKind::Ifdef:
        return "#ifdef";
    case DirectiveKind::Ifndef:
        return "#ifndef";
    case DirectiveKind::Elif:
        return "#elif";
    case DirectiveKind::Elifdef:
        return "#elifdef";
    case DirectiveKind::Elifndef:
        return "#elifndef";
    default:
        return "#else";
    }
}

bool isExpression(DirectiveKind kind) {
    return kind == DirectiveKind::If || kind == DirectiveKind::Elif;
}

bool opensChain(DirectiveKind kind) {
    return kind == DirectiveKind::If || kind == DirectiveKind::Ifdef || kind == DirectiveKind::Ifndef;
}

std::string directiveText(const Directive& directive) {
    std::string text(keywordText(directive.kind));
    if (directive.kind != DirectiveKind::Else && !directive.tokens.empty())
        text.append(" ").append(
            spelledTokens(isExpression(directive.kind) ? directive.tokens : directive.tokens.first(1)));
    return text;
}

/// Returns a directive as a reason quotes it.
std::string quoted(std::string text) {
    if (text.size() > limits::quotedBytes)
        text.replace(limits::quotedBytes, std::string::npos, "...");
    return text;
}

std::string conditionText(const Directive& directive) {
    if (isExpression(directive.kind))
        return spelledTokens(directive.tokens);
    const bool negated = directive.kind == DirectiveKind::Ifndef || directive.kind == DirectiveKind::Elifndef;
    std::string text(negated ? "!defined(" : "defined(");
    return text.append(directive.tokens.front().text).append(")");
}

/// One file.
class FileScan {
public:
    FileScan(SymbolicExprTable& table, BranchJudge& judge, const SourceScanOptions& options, SourceScanCounts& counts,
             std::string_view text, bool isCpp, const ReportFinding& reportFinding)
        : table_(table),
          judge_(judge),
          options_(options),
          counts_(counts),
          text_(text),
          report_(reportFinding),
          unknowns_(table, states_),
          conditions_(table, states_, unknowns_, isCpp),
          context_(table, unknowns_) {}

    void run();

private:
    struct Chain {
        std::size_t firstFact;
        bool silentAround;    ///< nothing is reported about the whole chain
        bool silent = false;  ///< nothing is reported inside the branch
        bool hasFact = false; ///< the branch's condition is the last fact
        bool hadElse = false;
        bool switchedOn = false;              ///< a branch before is entered by a switch
        std::optional<BranchReason> always{}; ///< the branch that is always entered, so that later ones never are
    };

    [[nodiscard]] bool isSilent() const {
        return !chains_.empty() && (chains_.back().silentAround || chains_.back().silent);
    }

    void changeMacros(const Directive& directive);
    void beginBranch(const Directive& directive);
    void leaveBranch();
    void readBranch(const Directive& directive);
    void judgeBranch(const Directive& directive, const DirectiveCondition& condition);
    [[nodiscard]] bool isSingle(SymbolicExprId condition) const;
    [[nodiscard]] BranchFinding finding(BranchFindingKind kind, const Directive& directive) const;
    void report(BranchFinding finding, const Directive& directive, std::string proposed);
    [[nodiscard]] BranchReason reasonOf(const BranchFact& fact) const;

    SymbolicExprTable& table_;
    BranchJudge& judge_;
    const SourceScanOptions& options_;
    SourceScanCounts& counts_;
    std::string_view text_;
    const ReportFinding& report_;
    MacroStates states_;
    MacroUnknowns unknowns_;
    DirectiveConditionReader conditions_;
    BranchContext context_;
    std::vector<Chain> chains_;
    std::vector<MacroStates::Name> names_; ///< in the definition that is read
    bool expandsToPragma_ = false;         ///< any line of code may change macros by one of the file's
};

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
            changeMacros(directive);
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

void FileScan::changeMacros(const Directive& directive) {
    if (directive.kind == DirectiveKind::Include) {
        if (options_.strictIncludes)
            states_.changeAll();
        else
            states_.include();
        return;
    }
    if (directive.kind == DirectiveKind::Pragma) {
        if (pragmaChangesMacros(directive.tokens))
            states_.changeAll();
        return;
    }
    const std::span<const DirectiveToken> tokens = directive.tokens;
    if (tokens.empty())
        return;
    const bool isCut = tokens.size() > 1 && isOddName(tokens[1]) && tokens[1].begin == tokens[0].end;
    if (tokens[0].kind != DirectiveTokenKind::Name || isOddName(tokens[0]) || isCut) { // the macro is unknown
        states_.changeAll();
        return;
    }
    const auto nameOf = [&](const DirectiveToken& token) { // a text of the file, but for a token with splices inside
        return states_.nameOf(token.text, token.end - token.begin == token.text.size());
    };
    const MacroStates::Name macro = nameOf(tokens[0]);
    states_.change(macro);
    if (directive.kind == DirectiveKind::Undef)
        return;
    names_.clear();
    for (const DirectiveToken& token : tokens.subspan(1))
        if (token.kind == DirectiveTokenKind::Name)
            names_.push_back(nameOf(token));
    const MacroBody body = readMacroBody(tokens.subspan(1));
    states_.addBody(macro, body, names_);
    expandsToPragma_ = expandsToPragma_ || body.hasPragma;
}

void FileScan::beginBranch(const Directive& directive) {
    if (expandsToPragma_)
        states_.changeAll();
    if (opensChain(directive.kind)) {
        const bool silent = isSilent();
        states_.open();
        chains_.push_back({context_.size(), silent});
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
        report(std::move(dead), directive, "0");
    }
    chain.hadElse = directive.kind == DirectiveKind::Else;
    if (!isSilent() && !chain.hadElse)
        readBranch(directive);
}

void FileScan::leaveBranch() {
    states_.nextBranch();
    Chain& chain = chains_.back();
    if (chain.hasFact)
        context_.negateLast();
    chain.hasFact = false;
}

void FileScan::readBranch(const Directive& directive) {
    DirectiveCondition condition = conditions_.read(directive);
    counts_.unread += condition.understood ? 0U : 1U;
    Chain& chain = chains_.back();
    if (condition.constant) {
        chain.silent = !*condition.constant;
        chain.switchedOn = *condition.constant;
        return;
    }
    judgeBranch(directive, condition);
    chain.hasFact = true;
    context_.push(
        {condition.node, false, directive.line, directive.begin, directive.end, std::move(condition.unknowns)});
}

/// Whether a condition has no && or ||.
bool FileScan::isSingle(SymbolicExprId condition) const {
    const SymbolicExpr* node = table_.get(condition);
    while (node->op() == SymbolicOp::Not)
        node = table_.get(node->getInput(0));
    return node->op() != SymbolicOp::And && node->op() != SymbolicOp::Or;
}

void FileScan::judgeBranch(const Directive& directive, const DirectiveCondition& condition) {
    const std::vector<std::size_t> related = context_.related(condition);
    if ((related.empty() && isSingle(condition.node)) || !judge_.beginBranch())
        return;
    BranchContext::Laws laws = context_.laws(condition, related);
    KnownConditions known{{}, std::move(laws.includeLaws), std::move(laws.undefinedLaws)};
    for (const std::size_t fact : related)
        known.facts.push_back(context_[fact].node);
    const BranchVerdict verdict = judge_.judge(condition.node, known);
    if (verdict.kind == BranchVerdictKind::None)
        return;
    std::string proposed = verdict.kind == BranchVerdictKind::Dead ? "0" : "1";
    if (verdict.kind == BranchVerdictKind::Removable) {
        auto shorter = proposalText(table_, unknowns_, condition, directive.tokens, verdict.shorter);
        if (!shorter || shorter->size() >= conditionText(directive).size())
            return;
        proposed = *std::move(shorter);
    }
    BranchFinding result = finding(verdict.kind == BranchVerdictKind::Dead         ? BranchFindingKind::Dead
                                   : verdict.kind == BranchVerdictKind::AlwaysTrue ? BranchFindingKind::AlwaysTrue
                                                                                   : BranchFindingKind::Removable,
                                   directive);
    for (const std::size_t at : judge_.reasons(condition.node, verdict, known))
        result.reasons.push_back(reasonOf(context_[related[at]]));
    Chain& chain = chains_.back();
    chain.silent = verdict.kind == BranchVerdictKind::Dead;
    if (verdict.kind == BranchVerdictKind::AlwaysTrue)
        chain.always = BranchReason{result.region, quoted(result.directive), true};
    report(std::move(result), directive, std::move(proposed));
}

BranchReason FileScan::reasonOf(const BranchFact& fact) const {
    DirectiveReader reader(text_.substr(fact.begin, std::min(fact.end - fact.begin, 2 * limits::quotedBytes)));
    Directive directive{};
    BranchReason reason{regionOf(text_, fact.begin, fact.line, fact.begin, fact.end), {}, !fact.negated};
    if (reader.next(directive))
        reason.directive = quoted(directiveText(directive));
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
        const bool whole = !isExpression(directive.kind);
        if (!directive.hasComment) { // replacing would drop a comment inside
            const std::size_t begin = whole ? directive.keyword : directive.tokens.front().begin;
            finding.replaced = regionOf(text_, directive.begin, directive.line, begin, directive.end);
            finding.replacement = whole ? opensChain(directive.kind) ? "if " : "elif " : "";
            finding.replacement.append(proposed);
        }
        finding.proposed = std::move(proposed);
    }
    report_(finding);
}

} // namespace

struct SourceScanner::State {
    explicit State(const SourceScanOptions& given) : options(given) { renew(); }

    void renew() {
        judge.reset();
        table = std::make_unique<SymbolicExprTable>();
        judge = std::make_unique<BranchJudge>(*table);
    }

    SourceScanOptions options;
    SourceScanCounts counts;
    std::unique_ptr<SymbolicExprTable> table;
    std::unique_ptr<BranchJudge> judge;
};

SourceScanner::SourceScanner(const SourceScanOptions& options) : state_(std::make_unique<State>(options)) {}

SourceScanner::SourceScanner(SourceScanner&&) noexcept = default;
SourceScanner& SourceScanner::operator=(SourceScanner&&) noexcept = default;
SourceScanner::~SourceScanner() = default;

void SourceScanner::scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report) {
    State& state = *state_;
    if (state.table->size() > limits::scanNodes)
        state.renew();
    BranchJudge& judge = *state.judge;
    const std::uint64_t stepsBefore = judge.steps();
    const std::uint64_t givenUpBefore = judge.givenUp();
    judge.beginFile();
    FileScan(*state.table, *state.judge, state.options, state.counts, text, isCpp, report).run();
    state.counts.undecided += judge.givenUp() - givenUpBefore;
    state.counts.steps += judge.steps() - stepsBefore;
}

const SourceScanCounts& SourceScanner::counts() const noexcept {
    return state_->counts;
}

} // namespace VT
