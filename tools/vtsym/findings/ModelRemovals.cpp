// Finds the dead choices that can be taken out of a model's text.
//
// Method: an element goes with the comma before it; those at the front of the list, which have none before them or one
// that may go too, with the comma after them.  So no two removals share a byte, and a list stays one whichever are
// made.
#include "tools/vtsym/findings/ModelRemovals.hpp"

#include <algorithm>

namespace vtsym {

namespace {

constexpr std::string_view blanks = " \t\r\n";

/// Extends removals, which are elements of one list in their order, over what separates them.
void addSeparators(std::vector<RemovableChoice>& choices, std::string_view text) {
    std::size_t front = text.npos; // the end of the last element, while all so far are removed
    for (RemovableChoice& choice : choices) {
        auto& [begin, end] = choice.removal;
        const std::size_t before = begin == 0 ? text.npos : text.find_last_not_of(blanks, begin - 1);
        const std::size_t elementBefore =
            before == text.npos || before == 0 ? text.npos : text.find_last_not_of(blanks, before - 1);
        const std::size_t after = text.find_first_not_of(blanks, end);
        const bool isFirst = before != text.npos && text[before] == '[';
        const bool isInFront = isFirst || (front != text.npos && elementBefore + 1 == front);
        if (isInFront && after != text.npos && text[after] == ',') {
            front = end;
            end = std::min(text.find_first_not_of(blanks, after + 1), text.size());
        } else if (before != text.npos && text[before] == ',') {
            begin = before;
        }
    }
}

} // namespace

std::unordered_set<const VTBlock*> joinedBlocks(const VTRootBD& model) {
    std::unordered_set<const VTBlock*> joined;
    const auto add = [&](const VTBlock* block) {
        while (block != nullptr && joined.insert(block).second)
            block = block->parent();
    };
    for (const vtPort& port : model.ports()) {
        add(&port.source());
        std::ranges::for_each(port.destinations(), add);
    }
    return joined;
}

std::vector<RemovableChoice> removableChoices(const ModelCheck::ChoiceSet& set,
                                              const std::unordered_set<const VTBlock*>& joined, std::string_view text) {
    std::vector<RemovableChoice> choices;
    const std::vector<VT::ChoiceFinding>& findings = set.report.findings;
    for (std::size_t i = 0; i < findings.size(); ++i) {
        const VTBlock& choice = *set.block->choices()[findings[i].choice];
        if (findings[i].fault == VT::ChoiceFault::Dead && !joined.contains(&choice))
            choices.push_back({i, {choice.textRange().begin, choice.textRange().end}});
    }
    if (choices.size() >= set.block->choices().size())
        return {};
    std::ranges::sort(choices, {}, [](const RemovableChoice& each) { return each.removal.begin; });
    addSeparators(choices, text);
    return choices;
}

} // namespace vtsym
