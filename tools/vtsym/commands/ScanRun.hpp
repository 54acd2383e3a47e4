// A scan of files, or of what changed between two states of a repository.
#pragma once

#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/source/ScanSettings.hpp"
#include "tools/vtsym/io/Console.hpp"

#include <cstddef>
#include <limits>
#include <string>

namespace vtsym {

/// What is asked for on the command line.
struct ScanOptions {
    ScanSettings settings; ///< of the command line, then with those of the project
    std::string config;
    bool hasSeverity = false;
    bool summary = false;
    bool fix = false;
    bool dryRun = false;
    std::string written; ///< baseline to write
    std::string range;   ///< of states to compare
    std::size_t days = std::numeric_limits<std::size_t>::max();
    std::size_t jobs = 0; ///< 0 for all processors
    std::string cache;    ///< folder; empty for none
    FindingForm form = FindingForm::Compiler;
};

/// Writes the findings as messages, JSON or SARIF, or their fixes.  With a range of states, their differences.  A file
/// that cannot be read is reported and does not end the scan; it fails then.
SearchResult runScan(const ScanOptions& options, Console& console);

} // namespace vtsym
