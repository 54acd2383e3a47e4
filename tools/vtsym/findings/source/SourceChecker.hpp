// Scans files as the settings of a project say: in its configurations, without what is suppressed.
#pragma once

#include "base/scan/SourceScan.hpp"
#include "tools/vtsym/findings/cache/ContentHash.hpp"
#include "tools/vtsym/findings/source/CompileCommands.hpp"
#include "tools/vtsym/findings/source/ScanSettings.hpp"

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// A finding and the change that resolves it.
struct FileFinding {
    Finding finding;
    std::optional<VT::SourceEdit> edit{}; ///< nothing where it has none, or holds in some configurations alone
};

/// What is found in a file, and what that took.
struct CheckedFile {
    std::vector<FileFinding> findings;
    VT::SourceScanCounts counts;
};

/// Adds up counts.
void addCounts(VT::SourceScanCounts& to, const VT::SourceScanCounts& more);

/// Scans files of one project, in one thread at a time.
class SourceChecker {
public:
    /// Throws UsageError for settings that are wrong, FileError for a file of macros that cannot be read.  `problem`
    /// receives remarks about files that commands of the build include.  The settings outlive the checker.
    SourceChecker(const ScanSettings& settings, const CompileCommands::Problem& problem);

    /// A checker for another thread.  Both share what was read of the build, and nothing that changes.
    SourceChecker(const SourceChecker& other);
    SourceChecker& operator=(const SourceChecker&) = delete;
    ~SourceChecker() = default;

    /// The findings of a file in the order of its lines, with their fingerprints.  A path serves to know the language
    /// and the configurations; nothing is read there.
    std::vector<FileFinding> check(const std::string& path, std::string_view text);

    /// The same, with what it took.
    CheckedFile checkAndCount(const std::string& path, std::string_view text);

    /// Asks before each condition of a file: what `ask` throws ends the check.
    void beforeEachCondition(std::function<void()> ask) { scanner_.beforeEachCondition(std::move(ask)); }

    /// A hash of all files that were read of the build.
    [[nodiscard]] ContentKey buildKey() const noexcept { return build_->files.key(); }

    /// Whether a finding is of a kind and a level that the settings ask for.
    [[nodiscard]] bool isAsked(const Finding& finding) const;

private:
    /// What was read of the build.
    struct Build {
        VT::BuildMacros ofOptions;
        std::optional<CompileCommands> commands;
        ContentHash files;
    };

    void readBuild(Build& build, const CompileCommands::Problem& problem) const;
    void assume();
    void refuseAssumptions() const;

    const ScanSettings& settings_;
    VT::SourceScanner scanner_;
    std::vector<std::string> kinds_;
    std::shared_ptr<const Build> build_;
};

} // namespace vtsym
