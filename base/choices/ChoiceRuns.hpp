// The choices of a set, joined in halves of halves.
#pragma once

#include "base/choices/ChoiceRanges.hpp"

#include <functional>
#include <optional>
#include <span>
#include <vector>

namespace VT {

/// A run of choices whose conditions are joined by Or.
struct ChoiceRun {
    SymbolicExprId holds; ///< where one of them is active
    NameRanges ranges;    ///< of names there
    std::size_t count;
    std::size_t left; ///< positions of its halves in the runs; of a single choice its own among the choices
    std::size_t right;

    [[nodiscard]] bool isSingle() const noexcept { return count < 2; }
};

/// Returns the runs of the choices that are not FALSE, sorted by their ranges; halves come before what they are joined
/// to, so the last run is all of them.  Interns one node for each run.
std::vector<ChoiceRun> joinedInHalves(SymbolicExprTable& table, std::span<const SymbolicExprId> holds);

/// Returns the positions, in ascending order, of the wanted choices that ranges do not show to be apart from these;
/// nothing where there are more than `most`.
std::optional<std::vector<std::size_t>> choicesNear(const std::vector<ChoiceRun>& runs, const NameRanges& ranges,
                                                    std::size_t most, const std::function<bool(std::size_t)>& isWanted);

} // namespace VT
