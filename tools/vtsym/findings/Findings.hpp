// What a search through files found, and the forms in which it is told.
#pragma once

#include "tools/vtsym/io/Console.hpp"
#include "tools/vtsym/io/ExitStatus.hpp"

#include <CLI/CLI.hpp>

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// A place in a file.  Lines and columns begin at 1, columns count code points, a byte that is no UTF-8 as one; 0 is
/// unknown.  The end is behind the last column.
struct Place {
    std::string file;
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::uint64_t endLine = 0;
    std::uint64_t endColumn = 0;
    std::string name; ///< of the thing there, where the file gives it one: "Engine/Gear"
};

/// Another place that a finding follows from.
struct RelatedPlace {
    Place place;
    std::string text; ///< what stands there
};

/// A change that settles a finding: the region of a place, which has a line and columns, replaced by a text.
struct Fix {
    std::string description; ///< a sentence
    Place region;
    std::string text;
};

/// A kind of findings.
struct FindingRule {
    std::string_view kind;    ///< "dead"
    std::string_view summary; ///< a sentence
    std::string_view help;    ///< what it means and what to do, in sentences
};

struct Finding {
    Place place;
    std::string_view kind; ///< of a rule
    std::string message;   ///< a sentence without its full stop
    std::string condition;
    std::optional<std::string> proposed; ///< condition to write instead
    std::vector<RelatedPlace> follows;
    std::optional<Fix> fix;
    std::string witness; ///< "A=3, B=0", or empty
};

enum class FindingForm : std::uint8_t { Compiler, Json, Sarif };

/// Writes findings in the order in which they come: `file:line: message` lines, one JSON object a line, or a SARIF
/// 2.1.0 log.  Counts them.
class FindingWriter {
public:
    virtual ~FindingWriter() = default;

    void write(const Finding& finding);
    /// Tells on standard error that something could not be searched, or not to its end: the search fails.
    void problem(const Place& place, const std::string& sentence);
    /// Tells on standard error something about the whole search, which does not fail.
    void note(const std::string& sentence);
    /// Ends the output: nothing may follow.  What the search ends with.
    SearchResult finish();

    [[nodiscard]] std::uint64_t found() const noexcept { return found_; }

    /// Whether a problem was told.
    [[nodiscard]] bool failed() const noexcept { return failed_; }

protected:
    explicit FindingWriter(Console& console) : console_(console) {}

    [[nodiscard]] Console& console() const noexcept { return console_; }

private:
    virtual void add(const Finding& finding) = 0;

    virtual void addProblem(const Place&, const std::string&) {}

    virtual void addNote(const std::string&) {}

    virtual void end() {}

    Console& console_;
    std::uint64_t found_ = 0;
    bool failed_ = false;
};

/// The rules are all kinds that will be written.  Throws OutputError, as does all that writes.
std::unique_ptr<FindingWriter> makeFindingWriter(FindingForm form, Console& console,
                                                 std::span<const FindingRule> rules);

/// Gives a command --json and --sarif.
void addFormOptions(CLI::App& command, FindingForm& form);

} // namespace vtsym
