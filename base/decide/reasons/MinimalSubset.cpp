// Finds a minimal part of a list that still suffices.
//
// Method: the last elements, each time twice as many, until they suffice; then whole runs of them are left out, half of
// them first and single ones last (as QuickXplain does: Junker, "Preferred explanations and relaxations for
// over-constrained problems", 2004).  What suffices does so with further elements too, so an element that could not be
// left out once can never be.
// Cost: about k log n questions for k elements of n that are needed, at most some 2n.
#include "base/decide/reasons/MinimalSubset.hpp"

#include <algorithm>
#include <numeric>

namespace VT {

MinimalSubset minimalSubset(std::size_t count, const SubsetQuestion& suffices) {
    MinimalSubset result;
    std::vector<std::size_t>& kept = result.positions;
    if (count == 0)
        return result;
    const Answer withoutAll = suffices(kept);
    if (withoutAll == Answer::Yes)
        return result;
    for (std::size_t length = 1; kept.size() < count; length = length * 2 + 1) {
        kept.resize(std::min(length, count));
        std::iota(kept.begin(), kept.end(), count - kept.size());
        if (kept.size() < count && suffices(kept) == Answer::Yes)
            break;
    }
    for (std::size_t length = std::max<std::size_t>(kept.size() / 2, 1); length > 0; length /= 2) {
        for (std::size_t i = 0; i < kept.size();) {
            const std::size_t rest = std::min(i + length, kept.size());
            std::vector<std::size_t> without(kept.begin(), kept.begin() + static_cast<std::ptrdiff_t>(i));
            without.insert(without.end(), kept.begin() + static_cast<std::ptrdiff_t>(rest), kept.end());
            const Answer answer = without.empty() ? withoutAll : suffices(without);
            if (answer == Answer::Yes) {
                kept = std::move(without);
                continue;
            }
            if (length == 1 && answer == Answer::Undecided)
                result.isMinimal = false;
            i = rest;
        }
    }
    return result;
}

} // namespace VT
