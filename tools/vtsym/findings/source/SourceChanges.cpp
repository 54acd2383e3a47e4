// Compares the findings of two states of a file by their fingerprints.
#include "tools/vtsym/findings/source/SourceChanges.hpp"

#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/findings/source/ScanRules.hpp"

#include <algorithm>
#include <set>

namespace vtsym {

std::vector<Finding> changesOf(SourceChecker& checker, const FileStates& states) {
    std::vector<FileFinding> before = checker.check(states.path, states.before);
    std::vector<FileFinding> after = checker.check(states.path, states.after);
    const auto fingerprints = [](const std::vector<FileFinding>& findings) {
        std::set<std::string> all;
        for (const FileFinding& each : findings)
            all.insert(each.finding.fingerprint);
        return all;
    };
    const std::set<std::string> known = fingerprints(before);
    const std::set<std::string> found = fingerprints(after);
    std::vector<Finding> changes;
    for (FileFinding& each : after) {
        each.finding.state = known.contains(each.finding.fingerprint) ? "unchanged" : "new";
        changes.push_back(std::move(each.finding));
    }
    for (const VT::ChangedBranch& branch :
         VT::changedBranches(states.before, states.after, isCppPath(states.path), states.lines)) {
        Finding changed = changedBranch(states.path, branch);
        changed.state = "updated";
        if (checker.isAsked(changed))
            changes.push_back(std::move(changed));
    }
    std::ranges::stable_sort(changes, {}, [](const Finding& each) { return each.place.line; });
    for (FileFinding& each : before) {
        if (found.contains(each.finding.fingerprint))
            continue;
        each.finding.state = "absent";
        changes.push_back(std::move(each.finding));
    }
    return changes;
}

} // namespace vtsym
