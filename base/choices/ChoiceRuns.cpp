// Joins the choices of a set in halves of halves.
//
// Method: neighbours by the range of the name that most choices confine are joined, level by level, so that a question
// about a run settles it for all of its choices.
// Cost: n log n for n choices, and one node for each run.
#include "base/choices/ChoiceRuns.hpp"

#include "base/core/Nodes.hpp"

#include <algorithm>

namespace VT {

std::vector<ChoiceRun> joinedInHalves(SymbolicExprTable& table, std::span<const SymbolicExprId> holds) {
    std::vector<NameRanges> ranges;
    ranges.reserve(holds.size());
    for (const SymbolicExprId each : holds)
        ranges.push_back(rangesOf(table, each));
    std::vector<ChoiceRun> runs;
    std::vector<std::size_t> level;
    for (const std::size_t position : sortedByRange(ranges)) {
        if (holds[position] == table.getIdFALSE())
            continue;
        level.push_back(runs.size());
        runs.push_back({holds[position], std::move(ranges[position]), 1, position, position});
    }
    if (runs.empty())
        runs.push_back({table.getIdFALSE(), {}, 0, 0, 0});
    while (level.size() > 1) {
        std::size_t next = 0;
        for (std::size_t i = 0; i < level.size(); i += 2) {
            std::size_t run = level[i];
            if (i + 1 < level.size()) {
                const std::size_t right = level[i + 1];
                const SymbolicExprId either = SymbolicOrExpr(table, runs[run].holds, runs[right].holds).getId(table);
                runs.push_back({either, joined(runs[run].ranges, runs[right].ranges),
                                runs[run].count + runs[right].count, run, right});
                run = runs.size() - 1;
            }
            level[next++] = run;
        }
        level.resize(next);
    }
    return runs;
}

std::optional<std::vector<std::size_t>> choicesNear(const std::vector<ChoiceRun>& runs, const NameRanges& ranges,
                                                    std::size_t most,
                                                    const std::function<bool(std::size_t)>& isWanted) {
    std::vector<std::size_t> near;
    for (std::vector<std::size_t> open{runs.size() - 1}; !open.empty();) {
        const ChoiceRun& run = runs[open.back()];
        open.pop_back();
        if (run.count == 0 || areApart(run.ranges, ranges))
            continue;
        if (!run.isSingle()) {
            open.push_back(run.left);
            open.push_back(run.right);
        } else if (isWanted(run.left)) {
            if (near.size() == most)
                return std::nullopt;
            near.push_back(run.left);
        }
    }
    std::ranges::sort(near);
    return near;
}

} // namespace VT
