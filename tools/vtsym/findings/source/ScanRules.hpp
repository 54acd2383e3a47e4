// The kinds of findings of a scan, and findings of the scanner as messages.
#pragma once

#include "base/scan/SourceScan.hpp"
#include "base/scan/changes/BranchMeanings.hpp"
#include "base/scan/report/Suppressions.hpp"
#include "tools/vtsym/findings/Findings.hpp"

#include <optional>
#include <span>
#include <string>

namespace vtsym {

/// The kinds, the worst first; those of VT::BranchFindingKind in its order at the beginning.
std::span<const FindingRule> scanRules();

/// The rule of a kind; nullptr for an unknown one.
const FindingRule* scanRule(std::string_view kind);

/// The program's own text of a cause, as findings have it; nothing for an unknown one.
std::optional<std::string_view> findingCause(std::string_view text);

/// Returns a finding of the scanner in a file that is built in so many configurations.  It is a note where it holds in
/// some of them alone, or where what the build defines decides it.
Finding findingOf(const std::string& file, const VT::BranchFinding& found, std::size_t configurations);

/// The findings about a suppression: what is wrong with it, or that nothing is found where it is.
Finding malformedSuppression(const std::string& file, const VT::Suppression& suppression, const std::string& problem);
Finding staleSuppression(const std::string& file, const VT::Suppression& suppression);

/// A branch that two states of a file build in different cases.
Finding changedBranch(const std::string& file, const VT::ChangedBranch& branch);

} // namespace vtsym
