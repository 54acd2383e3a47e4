// Scans files for branches that are dead, always entered, or enterable by a shorter condition.
//
// Method: a file is scanned without its configurations, then for each of them; findings about one directive that are
// equal become one, which knows the configurations that it holds for.
// Cost: that of FileScan for each configuration, limits::scanConfigurations at most.  Where only what they all have in
// common is reported, a file without candidates ends after its first: 21 configurations of a large tree cost little
// more than one.
#include "base/scan/SourceScan.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/FileScan.hpp"

#include <algorithm>
#include <deque>
#include <map>
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
                same->needsDefinitions = same->needsDefinitions || finding.needsDefinitions;
            }
        }
    }

    /// Whether some finding holds in each of the first configurations, and not in every build.
    [[nodiscard]] bool hasCommon(std::size_t configurations) const {
        return std::ranges::any_of(
            all_, [&](const BranchFinding& each) { return each.configurations.size() == configurations; });
    }

    /// Leaves out what holds in some of the configurations alone.
    void keepCommon(std::size_t configurations) {
        std::erase_if(all_, [&](const BranchFinding& each) {
            return !each.configurations.empty() && each.configurations.size() != configurations;
        });
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
    /// What is assumed of every build, or of those of one kind.
    struct Assumptions {
        BuildAssumptions common;
        std::deque<BuildAssumptions> alternatives;
    };

    explicit State(const SourceScanOptions& given) : options(given) { renew(); }

    State(const SourceScanOptions& given, std::shared_ptr<Assumptions> shared)
        : options(given),
          assumed(std::move(shared)) {
        renew();
    }

    /// The assumptions to add to, which no other scanner has.
    Assumptions& ownAssumptions() {
        if (assumed.use_count() > 1)
            assumed = std::make_shared<Assumptions>(*assumed);
        return *assumed;
    }

    void renew() {
        judge.reset();
        table = std::make_unique<SymbolicExprTable>();
        judge = std::make_unique<BranchJudge>(*table);
    }

    /// A configuration of a file.
    struct Configuration {
        const BuildMacros* build;
        const BuildAssumptions* assumptions;
    };

    std::vector<BranchFinding> scan(const SourceFile& file, const Configuration& in, BranchWitnesses* witnesses);
    [[nodiscard]] std::vector<Configuration> configurationsOf(const SourceFile& file) const;
    void addWitnesses(const SourceFile& file, const std::vector<Configuration>& configurations,
                      std::vector<BranchFinding>& found);

    SourceScanOptions options;
    SourceScanCounts counts;
    bool commonOnly = false;
    std::function<void()> ask;                                              ///< before each condition; may be empty
    std::shared_ptr<Assumptions> assumed = std::make_shared<Assumptions>(); ///< shared with scanners of other threads
    std::unique_ptr<SymbolicExprTable> table;
    std::unique_ptr<BranchJudge> judge;
};

/// Scans a file in one configuration.  Only the scan without one counts what it reads.
std::vector<BranchFinding> SourceScanner::State::scan(const SourceFile& file, const Configuration& in,
                                                      BranchWitnesses* witnesses = nullptr) {
    if (table->size() > limits::scanNodes)
        renew();
    const std::uint64_t stepsBefore = judge->steps();
    const std::uint64_t givenUpBefore = judge->givenUp();
    judge->beginFile();
    std::vector<BranchFinding> found;
    SourceScanCounts uncounted;
    const FileScanInput input{file.text, file.isCpp, in.build, *in.assumptions, options, ask, witnesses};
    const bool isCounted = in.build == nullptr && in.assumptions == &assumed->common;
    FileScan(*table, *judge, input, isCounted ? counts : uncounted, [&](BranchFinding&& finding) {
        found.push_back(std::move(finding));
    }).run();
    counts.undecided += judge->givenUp() - givenUpBefore;
    counts.steps += judge->steps() - stepsBefore;
    return found;
}

/// Each definition of macros with each alternative.  Alternatives that have nothing to say about a file are left out.
std::vector<SourceScanner::State::Configuration> SourceScanner::State::configurationsOf(const SourceFile& file) const {
    const std::deque<BuildAssumptions>& alternatives = assumed->alternatives;
    std::vector<const BuildMacros*> builds = file.configurations;
    if (builds.empty() &&
        std::ranges::any_of(alternatives, [&](const BuildAssumptions& each) { return each.mayConcern(file.text); }))
        builds.push_back(nullptr);
    std::vector<Configuration> all;
    for (const BuildMacros* const build : builds) {
        if (alternatives.empty())
            all.push_back({build, &assumed->common});
        for (const BuildAssumptions& each : alternatives)
            all.push_back({build, &each});
    }
    return all;
}

/// Adds how branches that are dead in some configurations are entered in others.
void SourceScanner::State::addWitnesses(const SourceFile& file, const std::vector<Configuration>& configurations,
                                        std::vector<BranchFinding>& found) {
    std::map<std::size_t, BranchWitnesses> wanted; // by configuration
    for (const BranchFinding& finding : found) {
        if (finding.kind != BranchFindingKind::Dead || finding.configurations.empty())
            continue;
        std::size_t other = 0;
        while (other < finding.configurations.size() && finding.configurations[other] == other)
            ++other;
        if (other < configurations.size())
            wanted[other].emplace(finding.region.line, "");
    }
    for (auto& [configuration, witnesses] : wanted) {
        scan(file, configurations[configuration], &witnesses);
        for (BranchFinding& finding : found) {
            const auto witness = witnesses.find(finding.region.line);
            const bool isOther =
                std::ranges::find(finding.configurations, configuration) == finding.configurations.end();
            if (witness == witnesses.end() || finding.kind != BranchFindingKind::Dead || !isOther ||
                finding.configurations.empty() || witness->second.empty())
                continue;
            finding.witness = witness->second;
            finding.witnessOf = configuration;
        }
    }
}

SourceScanner::SourceScanner(const SourceScanOptions& options) : state_(std::make_unique<State>(options)) {}

SourceScanner::SourceScanner(const SourceScanner& other)
    : state_(std::make_unique<State>(other.state_->options, other.state_->assumed)) {}

SourceScanner::SourceScanner(SourceScanner&&) noexcept = default;
SourceScanner& SourceScanner::operator=(SourceScanner&&) noexcept = default;
SourceScanner::~SourceScanner() = default;

std::optional<std::string> SourceScanner::assume(std::string_view condition) {
    State::Assumptions& own = state_->ownAssumptions();
    return (own.alternatives.empty() ? own.common : own.alternatives.back()).add(condition);
}

void SourceScanner::beginAlternative() {
    State::Assumptions& own = state_->ownAssumptions();
    own.alternatives.push_back(own.common);
}

void SourceScanner::reportCommonOnly(bool only) noexcept {
    state_->commonOnly = only;
}

void SourceScanner::beforeEachCondition(std::function<void()> ask) {
    state_->ask = std::move(ask);
}

bool SourceScanner::assumptionsCanHold() {
    const State::Assumptions& assumed = *state_->assumed;
    return assumed.common.canHold() &&
           std::ranges::all_of(assumed.alternatives, [](const BuildAssumptions& each) { return each.canHold(); });
}

void SourceScanner::scan(const SourceFile& file, const std::function<void(const BranchFinding&)>& report) {
    FileFindings all;
    all.add(state_->scan(file, {nullptr, &state_->assumed->common}), std::nullopt);
    std::vector<State::Configuration> configurations = state_->configurationsOf(file);
    const std::size_t most = std::min(configurations.size(), limits::scanConfigurations);
    state_->counts.leftOut += configurations.size() - most;
    configurations.resize(most);
    for (std::size_t i = 0; i < most; ++i) {
        if (state_->commonOnly && i > 0 && !all.hasCommon(i))
            break;
        all.add(state_->scan(file, configurations[i]), i);
    }
    if (state_->commonOnly)
        all.keepCommon(most);
    std::vector<BranchFinding> found = all.take();
    if (state_->options.why && !state_->commonOnly && !state_->assumed->alternatives.empty())
        state_->addWitnesses(file, configurations, found);
    std::ranges::for_each(found, report);
}

void SourceScanner::scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report) {
    scan(SourceFile{text, isCpp}, report);
}

const SourceScanCounts& SourceScanner::counts() const noexcept {
    return state_->counts;
}

} // namespace VT
