// Finds a smallest set of choices that touches every overlapping pair (a minimum vertex cover).
//
// Method: each connected part by itself.  The neighbour of a choice with one overlap goes; then either the choice with
// the most overlaps goes or all its neighbours do, depth first with an explicit stack.  A part is cut off where the
// pairs without a common choice show that it cannot beat the best set so far.
// Cost: limits::removalCases case distinctions over all parts, each linear in the pairs.
#include "base/choices/SmallestRemoval.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>

namespace VT {

namespace {

class RemovalSearch {
public:
    explicit RemovalSearch(std::span<const std::pair<std::size_t, std::size_t>> pairs) {
        for (const auto& [a, b] : pairs) {
            positions_.push_back(a);
            positions_.push_back(b);
        }
        std::ranges::sort(positions_);
        positions_.erase(std::unique(positions_.begin(), positions_.end()), positions_.end());
        neighbours_.resize(positions_.size());
        for (const auto& [a, b] : pairs) {
            if (a == b)
                continue;
            neighbours_[indexOf(a)].push_back(indexOf(b));
            neighbours_[indexOf(b)].push_back(indexOf(a));
        }
        for (std::vector<std::size_t>& each : neighbours_) {
            std::ranges::sort(each);
            each.erase(std::unique(each.begin(), each.end()), each.end());
            degrees_.push_back(each.size());
        }
        gone_.resize(positions_.size(), false);
        matched_.resize(positions_.size(), false);
    }

    ChoiceRemoval run() {
        ChoiceRemoval removal;
        std::vector<bool> seen(positions_.size(), false);
        for (std::size_t i = 0; i < positions_.size(); ++i) {
            if (seen[i])
                continue;
            part_.assign(1, i);
            seen[i] = true;
            for (std::size_t at = 0; at < part_.size(); ++at) {
                for (const std::size_t next : neighbours_[part_[at]]) {
                    if (!seen[next]) {
                        seen[next] = true;
                        part_.push_back(next);
                    }
                }
            }
            std::ranges::sort(part_);
            removal.isSmallest = solvePart() && removal.isSmallest;
            for (const std::size_t each : best_)
                removal.choices.push_back(positions_[each]);
        }
        std::ranges::sort(removal.choices);
        return removal;
    }

private:
    struct Case {
        std::size_t trail;  ///< length before the choice of the case went
        std::size_t choice; ///< that went; its neighbours go next
    };

    [[nodiscard]] std::size_t indexOf(std::size_t position) const {
        return static_cast<std::size_t>(std::ranges::lower_bound(positions_, position) - positions_.begin());
    }

    void remove(std::size_t choice) {
        gone_[choice] = true;
        trail_.push_back(choice);
        for (const std::size_t each : neighbours_[choice])
            if (!gone_[each] && --degrees_[each] == 1)
                single_.push_back(each);
    }

    void restore(std::size_t trail) {
        for (; trail_.size() > trail; trail_.pop_back()) {
            const std::size_t choice = trail_.back();
            gone_[choice] = false;
            for (const std::size_t each : neighbours_[choice])
                if (!gone_[each])
                    ++degrees_[each];
        }
    }

    [[nodiscard]] std::size_t openNeighbour(std::size_t choice) const {
        return *std::ranges::find_if(neighbours_[choice], [&](std::size_t each) { return !gone_[each]; });
    }

    /// Removes the neighbours of choices with one overlap.
    void removeForced() {
        while (!single_.empty()) {
            const std::size_t choice = single_.back();
            single_.pop_back();
            if (gone_[choice] || degrees_[choice] != 1)
                continue;
            const std::size_t other = openNeighbour(choice);
            remove(degrees_[other] == 1 ? std::max(choice, other) : other);
        }
    }

    /// Pairs without a common choice, as many as are found at once: one of each has to go.
    std::size_t disjointPairs() {
        std::size_t count = 0;
        for (const std::size_t each : part_)
            matched_[each] = gone_[each];
        for (const std::size_t each : part_) {
            if (matched_[each])
                continue;
            const auto other =
                std::ranges::find_if(neighbours_[each], [&](std::size_t next) { return !matched_[next]; });
            if (other == neighbours_[each].end())
                continue;
            matched_[each] = matched_[*other] = true;
            ++count;
        }
        return count;
    }

    [[nodiscard]] std::size_t mostOverlaps() const {
        std::size_t most = part_.back();
        std::size_t degree = 0;
        for (auto each = part_.rbegin(); each != part_.rend(); ++each) { // NOLINT(modernize-loop-convert): clang 14
            if (!gone_[*each] && degrees_[*each] > degree) {
                most = *each;
                degree = degrees_[*each];
            }
        }
        return degree == 0 ? positions_.size() : most;
    }

    /// Fills best_; whether it is proven to be smallest.
    bool solvePart() {
        best_ = part_; // larger than any result
        trail_.clear();
        single_.clear();
        for (const std::size_t each : part_)
            if (degrees_[each] == 1)
                single_.push_back(each);
        std::vector<Case> open;
        bool isComplete = true;
        for (;;) {
            removeForced();
            const std::size_t next = mostOverlaps();
            const bool isSolved = next == positions_.size();
            if (isSolved && trail_.size() < best_.size())
                best_ = trail_;
            if (!isSolved && trail_.size() + disjointPairs() < best_.size()) {
                if (casesLeft_ > 0) {
                    --casesLeft_;
                    open.push_back({trail_.size(), next});
                    remove(next);
                    continue;
                }
                isComplete = false;
                if (best_.size() == part_.size()) { // none was found yet: the nearest one
                    remove(next);
                    continue;
                }
            }
            if (open.empty() || !isComplete)
                break;
            const Case last = open.back();
            open.pop_back();
            restore(last.trail);
            single_.clear();
            for (const std::size_t each : neighbours_[last.choice])
                if (!gone_[each])
                    remove(each);
        }
        restore(0);
        return isComplete;
    }

    std::vector<std::size_t> positions_;
    std::vector<std::vector<std::size_t>> neighbours_;
    std::vector<std::size_t> degrees_; ///< to those that are not gone
    std::vector<bool> gone_;
    std::vector<bool> matched_;
    std::vector<std::size_t> trail_;  ///< that are gone, in order
    std::vector<std::size_t> single_; ///< that may have one overlap left
    std::vector<std::size_t> part_;
    std::vector<std::size_t> best_;
    std::size_t casesLeft_ = limits::removalCases;
};

} // namespace

ChoiceRemoval smallestRemoval(std::span<const std::pair<std::size_t, std::size_t>> pairs) {
    return RemovalSearch(pairs).run();
}

} // namespace VT
