// A model checked.
#pragma once

#include "base/choices/BlockConditions.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/service/VCServiceHandle.hpp"
#include "host/embedded/EmbeddedModel.hpp"
#include "tools/vtsym/findings/Findings.hpp"

#include <string>
#include <unordered_map>
#include <vector>

namespace vtsym {

/// Checks the conditions of blocks, the choices of each block against each other, and the ports.
class ModelCheck {
public:
    /// What was found about the choices of a block.
    struct ChoiceSet {
        const VTBlock* block;
        VT::ChoiceSetReport report;
        std::vector<Finding> findings;
    };

    /// `file` is what places are told in.  The model outlives the check.
    ModelCheck(const VTRootBD& model, std::string file, bool bits32);

    /// Writes what is found, block by block; once.  Blocks in one that is never active are left out.
    void run(FindingWriter& writer);

    /// The sets in the order of the model, as far as they were checked.
    [[nodiscard]] const std::vector<ChoiceSet>& choiceSets() const noexcept { return choiceSets_; }

    /// What was found about other blocks and about ports.
    [[nodiscard]] const std::vector<Finding>& otherFindings() const noexcept { return otherFindings_; }

    /// Sentences on what could not be read or decided.
    [[nodiscard]] const std::vector<std::string>& problems() const noexcept { return problems_; }

    [[nodiscard]] const std::string& file() const noexcept { return file_; }

    /// The text of a witness; "any values" of one without unknowns.
    [[nodiscard]] std::string witnessText(const VT::Witness& witness) const;

private:
    [[nodiscard]] std::string print(VT::SymbolicExprId condition) const;
    void write(std::vector<Finding>& kept, Finding finding);
    void problem(const Place& place, const std::string& sentence);
    bool readConditions();
    VT::ChoiceSetReport checkBlock(const VTBlock& block);
    VT::ChoiceSetReport checkChoices(const VTBlock& block);
    void checkPort(const vtPort& port);
    Finding findingOf(const VTBlock& set, std::span<const VTBlock* const> blocks, const VT::ChoiceFinding& finding);
    void tellUndecided(const VTBlock& set, std::span<const VTBlock* const> blocks, const VT::ChoiceFinding& finding);
    void tellShortened(Finding& finding, const VTBlock& block, VT::SymbolicExprId proposed) const;
    [[nodiscard]] VT::SymbolicExprId contextOf(const VTBlock* block) const;
    [[nodiscard]] VT::SymbolicExprId conditionOf(const vtPort& port) const;
    [[nodiscard]] Place placeOf(const VTBlock& block) const;
    [[nodiscard]] std::vector<RelatedPlace> conditionsAround(const VTBlock* block) const;

    const VTRootBD& model_;
    std::string file_;
    VT::VCServiceHandle handle_;
    VT::BlockConditions conditions_;
    VT::ChoiceSetChecker checker_;
    /// Where a block is active, without the conditions that follow from those around them.
    std::unordered_map<const VTBlock*, VT::SymbolicExprId> contexts_;
    FindingWriter* writer_ = nullptr;
    std::vector<ChoiceSet> choiceSets_;
    std::vector<Finding> otherFindings_;
    std::vector<std::string> problems_;
};

} // namespace vtsym
