// Findings that are accepted for now.
#pragma once

#include "tools/vtsym/findings/Findings.hpp"

#include <chrono>
#include <cstddef>
#include <map>
#include <span>
#include <string>
#include <string_view>

namespace vtsym {

/// Accepted findings by their fingerprints, with the day on which each was accepted.
class Baseline {
public:
    /// Reads a baseline; throws FileError for a text that is not one.
    static Baseline read(std::string_view text);

    /// Accepts a finding, from `today` on if it was not accepted before.
    void accept(const Finding& finding, std::chrono::sys_days today);

    /// Whether a finding was accepted, `days` before `today` at most.  It is found then.
    bool covers(const Finding& finding, std::chrono::sys_days today, std::size_t days);

    /// How many accepted findings of a level or a higher one were not found in files, ordered by name, or are in files
    /// that do not exist any more.  Of other files nothing is known.
    [[nodiscard]] std::size_t notFound(std::span<const std::string> files, FindingLevel least) const;

    /// The text of those that were accepted or found since it was read, in the order of their files.
    [[nodiscard]] std::string text() const;

private:
    struct Entry {
        std::string file;
        std::string kind;
        std::string condition;
        std::chrono::sys_days since;
        FindingLevel level = FindingLevel::Warning;
        bool isFound = false;
    };

    std::map<std::string, Entry> entries_; ///< by fingerprint
};

/// The day by the clock of the system, or by SOURCE_DATE_EPOCH where that is set.
std::chrono::sys_days today();

} // namespace vtsym
