// Conditions of the preprocessor in C and C++ files, held against each other.
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

/// A region of a file.  Lines and columns begin at 1, columns count code points, a byte that is no UTF-8 as one.  The
/// end is behind the last column.
struct SourceRegion {
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::uint64_t endLine = 0;
    std::uint64_t endColumn = 0;
    bool operator==(const SourceRegion&) const = default;
};

enum class BranchFindingKind : std::uint8_t {
    Dead,       ///< the branch is never entered
    AlwaysTrue, ///< it is entered whenever its directive is reached
    Removable,  ///< a shorter condition enters it in the same cases
};

/// A directive that a finding follows from.
struct BranchReason {
    SourceRegion region;
    std::string directive; ///< "#if A > 2"
    bool holds;            ///< where the finding is: a directive around it; before it in its chain otherwise
};

struct BranchFinding {
    BranchFindingKind kind;
    SourceRegion region;   ///< of the directive, from # to its last token
    std::string directive; ///< "#elifdef A"
    std::string condition; ///< "defined(A)"; empty for #else
    std::string proposed;  ///< a condition to write instead; empty for #else
    std::vector<BranchReason> reasons;
    std::optional<SourceRegion> replaced; ///< what to replace by `replacement` to have the proposed condition
    std::string replacement;
};

struct SourceScanOptions {
    bool strictIncludes = false; ///< an included file may change any macro; only those not defined otherwise
};

struct SourceScanCounts {
    std::uint64_t branches = 0;  ///< that begin with a condition or #else
    std::uint64_t unread = 0;    ///< conditions that were not understood as a whole
    std::uint64_t undecided = 0; ///< conditions about which a decision took too many steps and was given up
    std::uint64_t steps = 0;     ///< that decisions took
};

/// Holds the condition of every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef against those around it and those
/// before it in its chain.
///
/// What is found is true for every definition of the macros as integers of 64 bits, signed or unsigned, and for macros
/// that are not defined.  A macro that is defined or undefined on the way to a branch is another one behind; so is one
/// that the file defines by such a macro.  What other files define is taken to stand alone: in parentheses where it is
/// an expression, not hanging on what this file changes.  An included or imported file may define what is not defined.
/// Macros that join tokens, or that hang on the place where they are read, are others with each reading.
///
/// Nothing is told of a file that preprocessors read in different ways (trigraphs, carriage returns that end lines),
/// about #if 0 and #if 1, which are switches, nor about what they switch off, nor inside dead branches.
/// That a defined(X) is not needed beside a use of X is no finding: X being 0 where it is not defined is used to find
/// dead branches, not to shorten conditions.
///
/// A scanner keeps what it decided from file to file.  It is used by one thread at a time.
class VTSYM_API SourceScanner {
public:
    explicit SourceScanner(const SourceScanOptions& options = {});
    SourceScanner(SourceScanner&&) noexcept;
    SourceScanner& operator=(SourceScanner&&) noexcept;
    ~SourceScanner();

    /// Tells the findings of a file in the order of its lines.  The text may be any bytes.  About linear in the text:
    /// beyond limits::scanSteps for a file and limits::scanStepsPerBranch for each condition, conditions are given up.
    /// What is told of a file does not depend on the files before it.
    ///
    /// @param isCpp  whether true and false are constants; either may be anything otherwise
    void scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& found);

    /// Of all files so far.
    [[nodiscard]] const SourceScanCounts& counts() const noexcept;

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
