// The scan of one file in one configuration.
#pragma once

#include "base/scan/BranchVerdict.hpp"
#include "base/scan/MacroChanges.hpp"
#include "base/scan/SourceScan.hpp"
#include "base/scan/build/BuildAssumptions.hpp"
#include "base/scan/facts/BranchContext.hpp"
#include "base/scan/report/BranchWhy.hpp"

#include <functional>
#include <map>
#include <string>
#include <unordered_map>
#include <vector>

namespace VT {

/// Definitions that enter branches, by the lines of those that they are wanted for; empty where none was found.
using BranchWitnesses = std::map<std::uint64_t, std::string>;

/// One file and what is known of its build.
struct FileScanInput {
    std::string_view text;
    bool isCpp;
    const BuildMacros* build; ///< nullptr for nothing
    const BuildAssumptions& assumptions;
    const SourceScanOptions& options;
    const std::function<void()>& ask;     ///< before each condition; may be empty
    BranchWitnesses* witnesses = nullptr; ///< to find; nullptr for none
};

/// Reports the findings of one file in the order of its lines.  Used once.
class FileScan {
public:
    using Report = std::function<void(BranchFinding&&)>;

    FileScan(SymbolicExprTable& table, BranchJudge& judge, const FileScanInput& input, SourceScanCounts& counts,
             Report report)
        : table_(table),
          judge_(judge),
          input_(input),
          text_(input.text),
          counts_(counts),
          report_(std::move(report)),
          changes_(states_, input.options.strictIncludes),
          unknowns_(table, states_),
          conditions_(table, states_, unknowns_, input.isCpp, input.build),
          assumptions_(input.assumptions, states_, unknowns_, conditions_),
          context_(table, unknowns_) {}

    void run();

private:
    struct Chain {
        std::size_t firstFact;
        std::size_t branchFact; ///< the first of the branch's condition
        bool silentAround;      ///< nothing is reported about the whole chain
        bool silent = false;    ///< nothing is reported inside the branch
        bool hasFact = false;   ///< the branch's condition is the last facts
        bool hadElse = false;
        bool switchedOn = false;               ///< a branch before is entered by a switch
        BranchCause cause = BranchCause::Code; ///< of what follows
        bool needsDefinitions = false;         ///< what follows
        std::optional<BranchReason> always{};  ///< the branch that is always entered, so that later ones never are
    };

    /// What is known where a condition is judged.  The facts are those of the build, assumptions, and directives.
    struct Known {
        std::vector<MacroUnknownId> build;    ///< unknowns with a value
        std::vector<std::size_t> assumptions; ///< facts
        std::vector<std::size_t> directives;  ///< facts of the context
        KnownConditions conditions;
    };

    [[nodiscard]] bool isSilent() const {
        return !chains_.empty() && (chains_.back().silentAround || chains_.back().silent);
    }

    void beginBranch(const Directive& directive);
    void leaveBranch();
    void readBranch(const Directive& directive);
    void noteValues(const DirectiveCondition& condition);
    Known knownFor(const DirectiveCondition& condition);
    void judgeBranch(const Directive& directive, const DirectiveCondition& condition);
    [[nodiscard]] bool isSingle(SymbolicExprId condition) const;
    [[nodiscard]] bool isSpelledOut(const Known& known, const std::vector<std::size_t>& reasons) const;
    [[nodiscard]] BranchCause causeOf(const Known& known, const std::vector<std::size_t>& reasons) const;
    void findWitness(const Directive& directive, const DirectiveCondition& condition, const Known& known);
    [[nodiscard]] BranchFinding finding(BranchFindingKind kind, const Directive& directive) const;
    void report(BranchFinding finding, const Directive& directive, std::string proposed);
    [[nodiscard]] std::vector<BranchReason> reasonsOf(const Known& known, std::size_t fact) const;
    [[nodiscard]] std::vector<BranchReason> definitionsOf(const BuildFact& fact) const;
    [[nodiscard]] BranchReason reasonOf(const BranchFact& fact) const;
    BranchWhy why(const Directive& directive, const DirectiveCondition& condition, const BranchVerdict& verdict,
                  const Known& known, const std::vector<std::size_t>& reasons);

    SymbolicExprTable& table_;
    BranchJudge& judge_;
    const FileScanInput& input_;
    std::string_view text_;
    SourceScanCounts& counts_;
    Report report_;
    MacroStates states_;
    MacroChanges changes_;
    MacroUnknowns unknowns_;
    DirectiveConditionReader conditions_;
    FileAssumptions assumptions_;
    BranchContext context_;
    std::unordered_map<MacroUnknownId, BuildFact> values_; ///< of unknowns, by the build
    std::vector<Chain> chains_;
    std::vector<DirectiveReader> kept_; ///< whose tokens are in use
};

} // namespace VT
