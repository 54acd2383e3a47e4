// Scans files for branches that are dead, always entered, or enterable by a shorter condition.
//
// Method: a file is scanned without its configurations, then for each of them; findings about one directive that are
// equal become one, which knows the configurations that it holds for.
// Cost: that of FileScan for each configuration, limits::scanConfigurations at most.
#include "base/scan/SourceScan.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/FileScan.hpp"

#include <algorithm>
#include <unordered_map>
#include <utility>

namespace VT {

namespace {

/// The findings of one file in all of its configurations.
class FileFindings {
public:
    /// Adds the findings of a configuration; nothing for those that hold in every build.
    void add(std::vector<BranchFinding> found, std::optional<std::size_t> configuration) {
        const std::size_t known = all_.size();
        for (BranchFinding& finding : found) {
            BranchFinding* const same = configuration ? find(finding, known) : nullptr;
            if (same == nullptr) {
                if (configuration)
                    finding.configurations = {*configuration};
                byLine_.emplace(finding.region.line, all_.size());
                all_.push_back(std::move(finding));
            } else if (!same->configurations.empty()) { // not in every build
                same->configurations.push_back(*configuration);
                same->hasOtherReasons = same->hasOtherReasons || same->reasons != finding.reasons;
            }
        }
    }

    /// All in the order of their lines.
    std::vector<BranchFinding> take() {
        std::ranges::stable_sort(all_, {}, [](const BranchFinding& finding) { return finding.region.line; });
        return std::move(all_);
    }

private:
    /// Returns a finding about the same directive that is equal, among the first `known`.
    BranchFinding* find(const BranchFinding& finding, std::size_t known) {
        const auto [begin, end] = byLine_.equal_range(finding.region.line);
        for (auto each = begin; each != end; ++each) {
            BranchFinding& other = all_[each->second];
            if (each->second < known && other.kind == finding.kind && other.proposed == finding.proposed)
                return &other;
        }
        return nullptr;
    }

    std::vector<BranchFinding> all_;
    std::unordered_multimap<std::uint64_t, std::size_t> byLine_; ///< positions
};

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
    FileFindings all;
    all.add(state_->scan(file, nullptr), std::nullopt);
    const std::size_t most = std::min(file.configurations.size(), limits::scanConfigurations);
    for (std::size_t i = 0; i < most; ++i)
        all.add(state_->scan(file, file.configurations[i]), i);
    state_->counts.leftOut += file.configurations.size() - most;
    std::ranges::for_each(all.take(), report);
}

void SourceScanner::scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report) {
    scan(SourceFile{text, isCpp}, report);
}

const SourceScanCounts& SourceScanner::counts() const noexcept {
    return state_->counts;
}

} // namespace VT
