// Scans files as the settings of a project say: in its configurations, without what is suppressed.
#pragma once

#include "base/scan/SourceScan.hpp"
#include "tools/vtsym/findings/source/CompileCommands.hpp"
#include "tools/vtsym/findings/source/ScanSettings.hpp"

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

/// Scans files of one project.
class SourceChecker {
public:
    /// Throws UsageError for settings that are wrong, FileError for a file of macros that cannot be read.  `problem`
    /// receives remarks about files that commands of the build include.
    SourceChecker(const ScanSettings& settings, const CompileCommands::Problem& problem);

    /// The findings of a file in the order of its lines, with their fingerprints.  A path serves to know the language
    /// and the configurations; nothing is read there.
    std::vector<FileFinding> check(const std::string& path, std::string_view text);

    /// Whether a finding is of a kind and a level that the settings ask for.
    [[nodiscard]] bool isAsked(const Finding& finding) const;

    [[nodiscard]] const VT::SourceScanCounts& counts() const noexcept { return scanner_.counts(); }

private:
    struct MacroFile {
        std::string path;
        std::string text;
    };

    void addOptions(VT::BuildMacros& build) const;
    const ScanSettings& settings_;
    VT::SourceScanner scanner_;
    std::vector<std::string> kinds_;
    std::vector<MacroFile> macroFiles_;
    VT::BuildMacros build_; ///< of the options
    std::optional<CompileCommands> commands_;
};

} // namespace vtsym
