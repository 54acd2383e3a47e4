// Checks a model: whether each block can be active, whether its choices exclude each other and leave no gap, and its
// ports. Puts the findings of ChoiceSetChecker into words, with places in the file.
#pragma once

#include "base/choices/BlockConditions.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/decide/Assumptions.hpp"
#include "base/service/VCService.hpp"
#include "host/embedded/EmbeddedModel.hpp"
#include "tools/vtsym/findings/Findings.hpp"

#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace vtsym {

inline constexpr std::size_t shownInSentence = 200;        ///< of a condition in a sentence about a model
inline constexpr std::string_view mergeable = "mergeable"; ///< the kind of choices that can be one

struct ModelCheckOptions {
    bool bits32 = false;
    bool why = false;                              ///< findings come with reasons, sets with counted assignments
    bool merges = false;                           ///< choices that can be merged are findings
    std::vector<std::string> assumptions = {};     ///< in the language of the model
    std::uint64_t steps = VT::limits::choiceSteps; ///< that the whole check may cost
};

/// Checks one model, once, in one thread; several may be checked at once.
class ModelCheck {
public:
    /// The findings about the choices of a block.
    struct ChoiceSet {
        const VTBlock* block;
        VT::ChoiceSetReport report;
        std::vector<Finding> findings;
        std::vector<std::string> advice = {}; ///< sentences on choices to remove and on counted assignments
    };

    /// `file` is the name of the file in places.  The model outlives the check.
    ModelCheck(const VTRootBD& model, std::string file, ModelCheckOptions options);

    /// Writes the findings, block by block.  Leaves out the blocks inside of one that is never active.
    void run(FindingListener& writer);

    /// The sets in the order of the model, as far as they were checked.
    [[nodiscard]] const std::vector<ChoiceSet>& choiceSets() const noexcept { return choiceSets_; }

    /// The findings about other blocks and about ports.
    [[nodiscard]] const std::vector<Finding>& otherFindings() const noexcept { return otherFindings_; }

    /// Sentences about conditions that could not be read or decided.
    [[nodiscard]] const std::vector<std::string>& problems() const noexcept { return problems_; }

    [[nodiscard]] const std::string& file() const noexcept { return file_; }

    /// Says how many overlaps have no finding of their own: "at least 12 more pairs".
    [[nodiscard]] static std::string furtherOverlaps(const VT::ChoiceSetReport& report);

    /// The text of a witness; "any values" for one without unknowns.
    [[nodiscard]] std::string witnessText(const VT::Witness& witness) const;

private:
    [[nodiscard]] std::string print(VT::SymbolicExprId condition) const;
    void write(std::vector<Finding>& kept, Finding finding);
    void problem(const Place& place, const std::string& sentence);
    bool readConditions();
    bool assume();
    VT::VCSymbolicExprId ownAfterOthers(const VTBlock& block);
    [[nodiscard]] VT::ChoiceSetOptions checkerOptions();
    void explain(Finding& finding, const VT::Reasons& reasons) const;
    void writeAdvice(ChoiceSet& set);
    void writeMerges(const VTBlock& set, const VT::ChoiceSetReport& report, std::vector<Finding>& findings);
    bool goUpTo(const VTBlock* parent);
    void goInto(const VTBlock& block, VT::SymbolicExprId condition);
    VT::ChoiceSetReport checkBlock(const VTBlock& block);
    VT::ChoiceSetReport checkChoices(const VTBlock& block);
    void checkPort(const vtPort& port);
    Finding findingOf(const VTBlock& set, std::span<const VTBlock* const> blocks, const VT::ChoiceFinding& finding);
    [[nodiscard]] Finding findingOf(const vtPort& port) const;
    void reportUndecided(const VTBlock& set, std::span<const VTBlock* const> blocks, const VT::ChoiceFinding& finding);
    void describeShorter(Finding& finding, const VTBlock& block, VT::SymbolicExprId proposed) const;
    [[nodiscard]] VT::SymbolicExprId contextOf(const VTBlock* block) const;
    [[nodiscard]] VT::SymbolicExprId conditionOf(const vtPort& port) const;
    [[nodiscard]] Place placeOf(const VTBlock& block) const;
    [[nodiscard]] Place placeOf(const vtPort& port) const;
    [[nodiscard]] Place regionOf(const VT::Embedded::TextPlace& place) const;
    [[nodiscard]] static std::string shown(const std::string& text);
    [[nodiscard]] static bool isUnconditional(const VTBlock& block);
    [[nodiscard]] static Finding findingAt(Place place, VT::ChoiceFault fault, std::string message,
                                           std::string condition);
    [[nodiscard]] std::vector<RelatedPlace> conditionsAround(const VTBlock* block) const;

    const VTRootBD& model_;
    std::string file_;
    ModelCheckOptions options_;
    std::vector<const VT::Embedded::DeclaredSymbol*> unread_; ///< symbols that are not names
    std::string refused_;                                     ///< why an assumption cannot be read
    std::unique_ptr<VT::VCService> service_ = std::make_unique<VT::VCService>();
    VT::BlockConditions conditions_;
    bool isAssumed_; ///< all assumptions were read, before the checker is made

    /// A block around the next one to be checked.
    struct Around {
        const VTBlock* block;
        VT::SymbolicExprId condition;
        std::optional<std::size_t> conditionsBefore = {}; ///< on the path, after a block inside needed it
    };

    VT::Assumptions conditionsOnPath_;
    std::vector<Around> path_; ///< from the outside to the inside
    bool isCertain_ = true;    ///< every block in contexts_ is known to be active somewhere
    VT::ChoiceSetChecker checker_;
    /// The condition under which a block is active, without the parts that are implied by the blocks around it.
    std::unordered_map<const VTBlock*, VT::SymbolicExprId> contexts_;
    /// Where one of the choices before the next one of a block holds, if the first of them counts.
    std::unordered_map<const VTBlock*, VT::SymbolicExprId> earlierChoices_;
    FindingListener* writer_ = nullptr;
    std::vector<ChoiceSet> choiceSets_;
    std::vector<Finding> otherFindings_;
    std::vector<std::string> problems_;
};

} // namespace vtsym
