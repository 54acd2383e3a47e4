// Dead choices that can be taken out of a model's text.
#pragma once

#include "tools/vtsym/findings/ModelCheck.hpp"

#include <cstddef>
#include <string_view>
#include <unordered_set>
#include <vector>

namespace vtsym {

/// The blocks that a port of a model is joined to, and all blocks around them.
std::unordered_set<const VTBlock*> joinedBlocks(const VTRootBD& model);

/// A dead choice of a set that can be removed.
struct RemovableChoice {
    std::size_t finding; ///< the position in the findings of the set
    Removal removal;     ///< of the choice, with the comma and the blanks that separate it from another one
};

/// The dead choices of a set that no port is joined to, in the order of the text; none where no choice would be left.
/// Any of the removals can be made, alone or with others.  Linear in the choices and the blanks around them.
std::vector<RemovableChoice> removableChoices(const ModelCheck::ChoiceSet& set,
                                              const std::unordered_set<const VTBlock*>& joined, std::string_view text);

} // namespace vtsym
