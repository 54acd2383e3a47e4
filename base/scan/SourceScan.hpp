// Finds branches of C and C++ files that are never entered, always entered, or entered by a condition that is too long.
#pragma once

#include "host/Export.hpp"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// A region of a file.  Lines and columns begin at 1, columns count code points, a byte that is not UTF-8 as one.  The
/// end is after the last column.
struct SourceRegion {
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::uint64_t endLine = 0;
    std::uint64_t endColumn = 0;
    bool operator==(const SourceRegion&) const = default;
};

/// What is wrong with the condition of a branch.
enum class BranchFindingKind : std::uint8_t {
    Dead,       ///< the branch is never entered
    AlwaysTrue, ///< it is entered whenever its directive is reached
    Removable,  ///< a shorter condition enters it in the same cases
};

/// A directive that a finding follows from.
struct BranchReason {
    SourceRegion region;
    std::string directive; ///< "#if A > 2"
    bool holds;            ///< at the finding: true for a directive around it, false for one before it in its chain
};

/// A finding about one directive, with the directives that prove it.
struct BranchFinding {
    BranchFindingKind kind;
    SourceRegion region;   ///< of the directive, from # to its last token
    std::string directive; ///< "#elifdef A"
    std::string condition; ///< "defined(A)"; empty for #else
    std::string proposed;  ///< a condition to write instead; empty for #else
    std::vector<BranchReason> reasons;
    std::optional<SourceRegion> replaced; ///< the region to replace by `replacement` for the proposed condition
    std::string replacement;
};

/// Options of a scanner, for all of its files.
struct SourceScanOptions {
    bool strictIncludes = false; ///< whether an included file may change any macro, not only undefined ones
};

/// Totals over all files of a scanner.
struct SourceScanCounts {
    std::uint64_t branches = 0;  ///< that begin with a condition or #else
    std::uint64_t unread = 0;    ///< conditions that were read as one unknown
    std::uint64_t undecided = 0; ///< conditions about which a decision took too many steps and was given up
    std::uint64_t steps = 0;     ///< that decisions took
};

/// Compares the condition of every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef with those around it and those
/// before it in its chain.
///
/// Every finding holds for every build: for macros defined as integers of 64 bits, signed or unsigned, and for macros
/// that are not defined.  A macro that is defined or undefined on the way to a branch is a new unknown after it; so is
/// one that the file defines by such a macro.  Macros that other files define are assumed to be self-contained: in
/// parentheses where they are expressions, and independent of macros that this file changes.  An included or imported
/// file may define macros that are not defined.  Macros that join tokens, or that depend on the place where they are
/// read, are new unknowns with each reading.
///
/// Nothing is reported about a file that preprocessors read in different ways (trigraphs, carriage returns that end
/// lines), about #if 0 and #if 1, which are switches, about code that they switch off, or inside dead branches.  A
/// defined(X) beside a use of X is not reported as redundant: that X is 0 where it is not defined serves to find dead
/// branches, not to shorten conditions.
///
/// A scanner keeps its decisions from file to file.  It is used by one thread at a time.
class VTSYM_API SourceScanner {
public:
    explicit SourceScanner(const SourceScanOptions& options = {});
    SourceScanner(SourceScanner&&) noexcept;
    SourceScanner& operator=(SourceScanner&&) noexcept;
    ~SourceScanner();

    /// Reports the findings of a file in the order of its lines.  The text may be any bytes.  About linear in the text:
    /// beyond limits::scanSteps for a file and limits::scanStepsPerBranch for each condition, conditions are given up.
    /// The findings of a file do not depend on the files scanned before it.
    ///
    /// @param isCpp   whether true and false are constants; otherwise they are macros like others
    /// @param report  called for each finding
    void scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report);

    /// Totals of all files so far.
    [[nodiscard]] const SourceScanCounts& counts() const noexcept;

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
