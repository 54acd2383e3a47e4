// Scans files for branches that are dead, always entered, or enterable by a shorter condition.
//
// Method: a file is scanned without its configurations, then for each of them; findings about one directive that are
// equal become one, which knows the configurations that it holds for.
// Cost: that of FileScan for each configuration, limits::scanConfigurations at most.
#include "base/scan/SourceScan.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/FileScan.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

/// Adds the findings of a configuration to those of the file.
void merge(std::vector<BranchFinding>& all, std::vector<BranchFinding> found, std::size_t configuration) {
    const std::size_t known = all.size();
    for (BranchFinding& finding : found) {
        const auto end = all.begin() + static_cast<std::ptrdiff_t>(known);
        const auto same = std::find_if(all.begin(), end, [&](const BranchFinding& other) {
            return other.region.line == finding.region.line && other.kind == finding.kind &&
                   other.proposed == finding.proposed;
        });
        if (same == end) {
            finding.configurations = {configuration};
            all.push_back(std::move(finding));
        } else if (!same->configurations.empty()) { // not in every build
            same->configurations.push_back(configuration);
            same->hasOtherReasons = same->hasOtherReasons || same->reasons != finding.reasons;
        }
    }
}

} // namespace

struct SourceScanner::State {
    explicit State(const SourceScanOptions& given) : options(given) { renew(); }

    void renew() {
        judge.reset();
        table = std::make_unique<SymbolicExprTable>();
        judge = std::make_unique<BranchJudge>(*table);
    }

    std::vector<BranchFinding> scan(const SourceFile& file, const BuildMacros* build);

    SourceScanOptions options;
    SourceScanCounts counts;
    BuildAssumptions assumptions;
    std::unique_ptr<SymbolicExprTable> table;
    std::unique_ptr<BranchJudge> judge;
};

/// Scans a file in one configuration.  Only the scan without one counts what it reads.
std::vector<BranchFinding> SourceScanner::State::scan(const SourceFile& file, const BuildMacros* build) {
    if (table->size() > limits::scanNodes)
        renew();
    const std::uint64_t stepsBefore = judge->steps();
    const std::uint64_t givenUpBefore = judge->givenUp();
    judge->beginFile();
    std::vector<BranchFinding> found;
    SourceScanCounts uncounted;
    const FileScanInput input{file.text, file.isCpp, build, assumptions, options};
    FileScan(*table, *judge, input, build == nullptr ? counts : uncounted, [&](BranchFinding&& finding) {
        found.push_back(std::move(finding));
    }).run();
    counts.undecided += judge->givenUp() - givenUpBefore;
    counts.steps += judge->steps() - stepsBefore;
    return found;
}

SourceScanner::SourceScanner(const SourceScanOptions& options) : state_(std::make_unique<State>(options)) {}

SourceScanner::SourceScanner(SourceScanner&&) noexcept = default;
SourceScanner& SourceScanner::operator=(SourceScanner&&) noexcept = default;
SourceScanner::~SourceScanner() = default;

std::optional<std::string> SourceScanner::assume(std::string_view condition) {
    return state_->assumptions.add(condition);
}

bool SourceScanner::assumptionsCanHold() {
    return state_->assumptions.canHold();
}

void SourceScanner::scan(const SourceFile& file, const std::function<void(const BranchFinding&)>& report) {
    std::vector<BranchFinding> all = state_->scan(file, nullptr);
    const std::size_t most = std::min(file.configurations.size(), limits::scanConfigurations);
    for (std::size_t i = 0; i < most; ++i)
        merge(all, state_->scan(file, file.configurations[i]), i);
    state_->counts.leftOut += file.configurations.size() - most;
    std::ranges::stable_sort(all, {}, [](const BranchFinding& finding) { return finding.region.line; });
    std::ranges::for_each(all, report);
}

void SourceScanner::scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report) {
    scan(SourceFile{text, isCpp}, report);
}

const SourceScanCounts& SourceScanner::counts() const noexcept {
    return state_->counts;
}

} // namespace VT
