// Walks the blocks from the outside to the inside.  A block's context, the condition under which it is active, is made
// from its parent's, and every question is asked under it; a dead block ends the walk below it.
//
// ChoiceSetChecker bounds the steps of the whole check; where they are used up, the rest is reported as undecided.
#include "tools/vtsym/findings/ModelCheck.hpp"

#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "host/Diagnostics.hpp"
#include "tools/vtsym/findings/UndecidedText.hpp"

#include <algorithm>
#include <array>
#include <unordered_set>

namespace vtsym {

namespace {

constexpr std::size_t shownUndecided = 20; ///< questions about one set

} // namespace

ModelCheck::ModelCheck(const VTRootBD& model, std::string file, ModelCheckOptions options)
    : model_(model),
      file_(std::move(file)),
      options_(std::move(options)),
      conditions_(*service_),
      isAssumed_(assume()),
      conditionsOnPath_(service_->table()),
      checker_(*service_, checkerOptions()) {}

/// Makes the service assume what the options say; false where that cannot be read.
bool ModelCheck::assume() {
    for (const std::string& text : options_.assumptions) {
        try {
            model_.isQuill() ? service_->assumeFromQCondition(text) : service_->assumeFromCCondition(text);
        } catch (const VT::HostDiagnostic& diagnostic) {
            refused_ = diagnostic.what();
            return false;
        }
    }
    return true;
}

/// The options, with the values that the model declares.
VT::ChoiceSetOptions ModelCheck::checkerOptions() {
    VT::ChoiceSetOptions result{
        .bits32 = options_.bits32, .reasons = options_.why, .merges = options_.merges, .steps = options_.steps};
    const VT::SymbolicExprTable& table = service_->table();
    for (const VT::Embedded::DeclaredSymbol& symbol : model_.symbols()) {
        VT::SymbolicExprId id = VT::invalidId;
        try {
            id = model_.isQuill() ? service_->parseQ(symbol.name) : service_->parseC(symbol.name);
        } catch (const VT::HostDiagnostic&) {
            unread_.push_back(&symbol);
            continue;
        }
        const VT::SymbolicOp op = table.get(id)->op();
        const bool isName = op == VT::SymbolicOp::String || op == VT::SymbolicOp::MemberValue;
        if (!isName || id == table.getIdTRUE() || id == table.getIdFALSE()) {
            unread_.push_back(&symbol);
            continue;
        }
        result.domains.push_back({id, symbol.values, symbol.min, symbol.max});
    }
    return result;
}

void ModelCheck::write(std::vector<Finding>& kept, Finding finding) {
    writer_->write(finding);
    kept.push_back(std::move(finding));
}

void ModelCheck::problem(const Place& place, const std::string& sentence) {
    writer_->problem(place, sentence);
    problems_.push_back(sentence);
}

VT::SymbolicExprId ModelCheck::contextOf(const VTBlock* block) const {
    return block != nullptr ? contexts_.at(block) : service_->table().getIdTRUE();
}

VT::SymbolicExprId ModelCheck::conditionOf(const vtPort& port) const {
    VT::VCSymbolicExprId to = service_->table().getIdFALSE();
    for (const VTBlock* const destination : port.destinations())
        if (contexts_.contains(destination))
            to = service_->OR(to, contextOf(destination), false);
    return service_->AND(contextOf(&port.source()), to, false).id();
}

/// Reads the conditions of all blocks.  Returns whether every one could be read.
bool ModelCheck::readConditions() {
    bool allRead = true;
    std::unordered_set<const VTBlock*> withDefault;
    const auto refuse = [&](const VTBlock& block, const std::string& sentence) {
        problem(placeOf(block), block.path() + ": " + sentence);
        allRead = false;
    };
    if (!isAssumed_) {
        problem({file_, 0, 0, 0, 0, {}}, "--assume: " + refused_);
        allRead = false;
    }
    for (const VT::Embedded::DeclaredSymbol* const symbol : unread_) {
        problem(regionOf(symbol->place), shown(symbol->name) + " is not the name of a symbol.");
        allRead = false;
    }
    for (const VTBlock& block : model_.blocks()) {
        if (VT::BlockConditions::isDefault(block) && !block.isChoice())
            refuse(block, "\"(default)\" is for choices alone: write a condition.");
        else if (VT::BlockConditions::isDefault(block) && !withDefault.insert(block.parent()).second)
            refuse(block, "There is another \"(default)\" choice: write a condition.");
        try {
            conditions_.own(block);
        } catch (const VT::HostDiagnostic& diagnostic) {
            if (!VT::BlockConditions::isDefault(block)) // it reads the other choices, which report their own errors
                refuse(block, diagnostic.what());
        }
    }
    return allRead;
}

/// Where a block is active by its own condition; of choices the first of which counts, where no earlier one is.
VT::VCSymbolicExprId ModelCheck::ownAfterOthers(const VTBlock& block) {
    const VT::VCSymbolicExprId own = conditions_.own(block);
    if (!block.isChoice() || block.parent()->choiceRule() != VT::Embedded::ChoiceRule::First ||
        VT::BlockConditions::isDefault(block))
        return own;
    VT::SymbolicExprId& before =
        earlierChoices_.try_emplace(block.parent(), service_->table().getIdFALSE()).first->second;
    const VT::VCSymbolicExprId active = service_->AND(own, service_->NOT(before, false), false);
    before = service_->OR(before, own, false).id();
    return active;
}

void ModelCheck::run(FindingListener& writer) {
    writer_ = &writer;
    if (!readConditions())
        return;
    for (const VT::VCSymbolicExprId& assumption : service_->assumptions())
        conditionsOnPath_.add(assumption.id());   // it may say something of several names
    std::unordered_set<const VTBlock*> dead;      // and everything inside of them
    std::unordered_set<const VTBlock*> followers; // always active where their parents are
    const auto note = [&](const VT::ChoiceSetReport& report, std::span<const VTBlock* const> blocks) {
        isCertain_ = isCertain_ && report.undecided.empty();
        for (const VT::ChoiceFinding& finding : report.findings) {
            if (finding.fault == VT::ChoiceFault::Dead)
                dead.insert(blocks[finding.choice]);
            if (finding.fault == VT::ChoiceFault::AlwaysActive)
                followers.insert(blocks[finding.choice]);
        }
    };
    for (const VTBlock& block : model_.blocks()) {
        const std::array self{&block};
        if (dead.contains(block.parent()))
            dead.insert(&block);
        else if (!block.isChoice() && !isUnconditional(block))
            note(checkBlock(block), self);
        if (dead.contains(&block))
            continue;
        const VT::SymbolicExprId around = contextOf(block.parent());
        const VT::SymbolicExprId own =
            followers.contains(&block) ? service_->table().getIdTRUE() : ownAfterOthers(block).id();
        contexts_.emplace(&block, service_->AND(around, own, false).id());
        goInto(block, own);
        if (!block.choices().empty())
            note(checkChoices(block), block.choices());
        if (checker_.stepsUsedUp()) {
            problem(placeOf(block),
                    "The steps of the check are used up: later blocks and ports are not checked; split the model.");
            return;
        }
    }
    for (const vtPort& port : model_.ports())
        if (contexts_.contains(&port.source()))
            checkPort(port);
}

/// Leaves blocks on the path until a parent is the last one; whether it is on the path.
bool ModelCheck::goUpTo(const VTBlock* parent) {
    for (; !path_.empty() && path_.back().block != parent; path_.pop_back())
        if (path_.back().conditionsBefore)
            conditionsOnPath_.shrink(*path_.back().conditionsBefore);
    return !path_.empty();
}

/// Adds a block that was checked to the path, if that leads to it from the outside.
void ModelCheck::goInto(const VTBlock& block, VT::SymbolicExprId condition) {
    if (goUpTo(block.parent()) || block.parent() == nullptr)
        path_.push_back({&block, condition});
}

VT::ChoiceSetReport ModelCheck::checkBlock(const VTBlock& block) {
    const VT::SymbolicExprId own = conditions_.own(block).id();
    const VT::SymbolicExprId around = contextOf(block.parent());
    // The blocks around can be active, so conditions that share no name with this one have no say in whether it is
    // without findings. A finding is decided with all of them, so that its witness has all names.
    VT::ChoiceSetReport report;
    const bool isOnPath = goUpTo(block.parent()) && isCertain_;
    for (Around& each : path_) {
        if (!each.conditionsBefore) {
            each.conditionsBefore = conditionsOnPath_.all().size();
            conditionsOnPath_.add(each.condition);
        }
    }
    if (isOnPath)
        report = checker_.checkCondition(conditionsOnPath_.knownOf(std::span(&own, 1)), own);
    if (!isOnPath || !report.findings.empty() || !report.undecided.empty() || report.parentNeverHolds)
        report = checker_.checkCondition(around, own);
    const std::array blocks{&block};
    for (const VT::ChoiceFinding& finding : report.findings)
        write(otherFindings_, findingOf(block, blocks, finding));
    for (const VT::ChoiceFinding& finding : report.undecided)
        reportUndecided(block, blocks, finding);
    return report;
}

VT::ChoiceSetReport ModelCheck::checkChoices(const VTBlock& block) {
    std::vector<VT::SymbolicExprId> choices;
    choices.reserve(block.choices().size());
    for (const VTBlock* const choice : block.choices())
        choices.push_back(conditions_.own(*choice).id());
    const auto defaultChoice = std::ranges::find_if(
        block.choices(), [](const VTBlock* each) { return VT::BlockConditions::isDefault(*each); });
    VT::ChoiceSetReport report =
        checker_.check(contextOf(&block), choices,
                       defaultChoice == block.choices().end()
                           ? std::nullopt
                           : std::optional(static_cast<std::size_t>(defaultChoice - block.choices().begin())),
                       static_cast<VT::ChoicePolicy>(block.choiceRule()));
    std::erase_if(report.findings, [&](const VT::ChoiceFinding& finding) {
        const VTBlock& choice = *block.choices()[finding.choice];
        return finding.fault == VT::ChoiceFault::AlwaysActive && choices.size() == 1 &&
               (isUnconditional(choice) || VT::BlockConditions::isDefault(choice));
    });
    choiceSets_.push_back({&block, report, {}});
    std::vector<Finding>& findings = choiceSets_.back().findings;
    for (const VT::ChoiceFinding& finding : report.findings)
        write(findings, findingOf(block, block.choices(), finding));
    for (std::size_t i = 0; i < std::min(report.undecided.size(), shownUndecided); ++i)
        reportUndecided(block, block.choices(), report.undecided[i]);
    if (report.undecided.size() > shownUndecided && !checker_.stepsUsedUp())
        problem(placeOf(block), "Of " + block.path() + " " + std::to_string(report.undecided.size() - shownUndecided) +
                                    " more questions stay undecided.");
    writeMerges(block, report, findings);
    writeAdvice(choiceSets_.back());
    if (!report.allOverlaps && !checker_.stepsUsedUp()) {
        write(findings, findingAt(placeOf(block), VT::ChoiceFault::Overlap,
                                  furtherOverlaps(report) + " of choices of " + block.path() + " overlap",
                                  block.variantCondition()));
    }
    return report;
}

void ModelCheck::checkPort(const vtPort& port) {
    const bool isJoined = std::ranges::any_of(port.destinations(), [&](const VTBlock* block) {
        return checker_.canHold(conditions_.net(*block).id()).isYes();
    });
    if (!isJoined)
        return; // no destinations, or dead ones that have findings of their own
    const VT::Decision flows = checker_.canHold(conditionOf(port));
    if (flows.isUndecided())
        problem(placeOf(port), "Whether the port " + port.name() + " can be active stays undecided: it " +
                                   undecidedText(flows.bound) + ".");
    if (flows.isNo())
        write(otherFindings_, findingOf(port));
}

} // namespace vtsym
