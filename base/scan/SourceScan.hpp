// Finds branches of C and C++ files that are never entered, always entered, or entered by a condition that is too long.
#pragma once

#include "base/scan/build/BuildMacros.hpp"
#include "base/scan/report/ConditionEdit.hpp"
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

/// What is wrong with the condition of a branch, the worse kinds first.
enum class BranchFindingKind : std::uint8_t {
    Dead,       ///< the branch is never entered
    AlwaysTrue, ///< it is entered whenever its directive is reached
    Removable,  ///< a shorter condition enters it in the same cases
    SpelledOut, ///< it repeats that those before it in its chain do not hold: a matter of taste
};

/// Where a reason comes from.
enum class BranchReasonKind : std::uint8_t {
    Directive,  ///< of the file
    Build,      ///< a definition of the build
    Assumption, ///< a condition that is assumed
    Absence,    ///< a macro that is assumed to be defined nowhere
};

/// What a finding needs besides the code, the strongest that it needs last.
enum class BranchCause : std::uint8_t {
    Code,          ///< nothing
    Configuration, ///< definitions of the build, or assumptions
    Absence,       ///< that a macro is defined nowhere
};

/// What a finding follows from.
struct BranchReason {
    SourceRegion region;   ///< a definition has the line in its file alone, or 0; an assumption has none
    std::string directive; ///< "#if A > 2", "-DN=4", "N >= 1", the name of a macro that is defined nowhere
    bool holds;            ///< at the finding: true for a directive around it, false for one before it in its chain
    BranchReasonKind kind = BranchReasonKind::Directive;
    std::string file{}; ///< of a definition
    bool operator==(const BranchReason&) const = default;
};

/// A finding about one directive, with the directives that prove it.
struct BranchFinding {
    BranchFindingKind kind;
    SourceRegion region;   ///< of the directive, from # to its last token
    std::string directive; ///< "#elifdef A"
    std::string condition; ///< "defined(A)"; empty for #else
    std::string proposed;  ///< a condition to write instead; empty for #else
    std::vector<BranchReason> reasons;
    BranchCause cause = BranchCause::Code;
    std::optional<SourceRegion> replaced; ///< the region to replace by `edit.text` for the proposed condition
    SourceEdit edit;                      ///< the same in bytes; comments, blanks and line splices stay
    /// The operands that force the finding, as written or negated; none unless they are asked for.
    std::vector<std::string> because{};
    bool isMinimal = false; ///< without any one of them the finding does not follow
    /// Operands that a shorter condition leaves out, as written; none unless they are asked for.
    std::vector<std::string> redundant{};
    /// Configurations of the build that the finding holds for, by number; none for one that holds in every build.
    std::vector<std::size_t> configurations{};
    bool hasOtherReasons = false; ///< in some of the configurations
    /// Whether it needs definitions of the build, as its reasons or as those of the branch before it in its chain that
    /// is always entered.
    bool needsDefinitions = false;
    std::string witness{};     ///< definitions that enter a branch that is dead in other configurations alone
    std::size_t witnessOf = 0; ///< the configuration that has them
};

/// Options of a scanner, for all of its files.
struct SourceScanOptions {
    bool strictIncludes = false; ///< whether an included file may change any macro, not only undefined ones
    bool why = false;            ///< whether findings come with the operands that force them
};

/// Totals over all files of a scanner.
struct SourceScanCounts {
    std::uint64_t branches = 0;  ///< that begin with a condition or #else
    std::uint64_t unread = 0;    ///< conditions that were read as one unknown
    std::uint64_t undecided = 0; ///< conditions about which a decision took too many steps and was given up
    std::uint64_t steps = 0;     ///< that decisions took
    std::uint64_t leftOut = 0;   ///< configurations of files beyond limits::scanConfigurations
};

/// A file to scan.
struct SourceFile {
    std::string_view text; ///< any bytes
    bool isCpp = false;    ///< whether true and false are constants; otherwise they are macros like others
    /// The configurations that the file is built in; none where nothing is known.
    std::vector<const BuildMacros*> configurations{};
};

/// Compares the condition of every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef with those around it and those
/// before it in its chain.
///
/// Every finding of a file without configurations holds for every build: for macros defined as integers of 64 bits,
/// signed or unsigned, and for macros that are not defined.  A macro that is defined or undefined on the way to a
/// branch is a new unknown after it; so is one that the file defines by such a macro.  Macros that other files define
/// are assumed to be self-contained: in parentheses where they are expressions, and independent of macros that this
/// file changes.  An included or imported file may define macros that are not defined.  Macros that join tokens, or
/// that depend on the place where they are read, are new unknowns with each reading.
///
/// Nothing is reported about a file that preprocessors read in different ways (trigraphs, carriage returns that end
/// lines), about #if 0 and #if 1, which are switches, about code that they switch off, or inside dead branches.  A
/// defined(X) beside a use of X is not reported as redundant: that X is 0 where it is not defined serves to find dead
/// branches, not to shorten conditions.
///
/// With configurations, a file is scanned without them first, and then for each: macros are what the build defines,
/// until the file changes them.  Definitions stay through included files.  Assumptions are conditions that hold for
/// macros that the file did not change, wherever they are read.  Alternatives are sets of assumptions of which one
/// holds: each makes a configuration of each that the file has, or one by itself.
///
/// A scanner keeps its decisions from file to file.  It is used by one thread at a time; scanners of several threads
/// may work at once, and read the same definitions of a build.
class VTSYM_API SourceScanner {
public:
    explicit SourceScanner(const SourceScanOptions& options = {});
    /// A scanner with the same options and assumptions, which both keep once, for another thread.  The other one may
    /// be scanning meanwhile.
    SourceScanner(const SourceScanner& other);
    SourceScanner(SourceScanner&&) noexcept;
    SourceScanner& operator=(const SourceScanner&) = delete;
    SourceScanner& operator=(SourceScanner&&) noexcept;
    ~SourceScanner();

    /// Assumes a condition, as #if has them, in every file from now on.  Returns what is wrong with it, a part of a
    /// sentence that follows its quotation; nothing where it is assumed.
    std::optional<std::string> assume(std::string_view condition);
    /// Asks before each condition of a file: what `ask` throws ends the scan of the file, and the scanner is as good as
    /// before.
    void beforeEachCondition(std::function<void()> ask);
    /// Begins an alternative, which has what was assumed so far, and takes what is assumed from now on.
    void beginAlternative();
    /// Reports from now on only what holds in all configurations of a file, or in every build; or all again.  A file is
    /// not scanned for further ones once nothing is left that holds in those so far.
    void reportCommonOnly(bool only) noexcept;
    /// Whether all assumptions can hold together, as far as that is decided.
    [[nodiscard]] bool assumptionsCanHold();

    /// Reports the findings of a file in the order of its lines.  The text may be any bytes.  About linear in the text:
    /// beyond limits::scanSteps for a file and limits::scanStepsPerBranch for each condition, conditions are given up;
    /// so for each of its configurations.  The findings of a file do not depend on the files scanned before it.
    void scan(const SourceFile& file, const std::function<void(const BranchFinding&)>& report);
    /// The same for a file without configurations.
    void scan(std::string_view text, bool isCpp, const std::function<void(const BranchFinding&)>& report);

    /// Totals of all files so far.
    [[nodiscard]] const SourceScanCounts& counts() const noexcept;

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
