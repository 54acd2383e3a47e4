// Findings in files, and the forms in which they are written: messages like a compiler's, JSON lines, SARIF.
// `scan` and `check` share them; a new form is one class in Findings.cpp.
#pragma once

#include "tools/vtsym/io/Console.hpp"
#include "tools/vtsym/io/ExitStatus.hpp"

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

class Command;

/// A place in a file.  Lines and columns begin at 1; 0 is unknown.  Columns count code points, and a byte that is not
/// UTF-8 as one.  The end column is the one after the last.
struct Place {
    std::string file;
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::uint64_t endLine = 0;
    std::uint64_t endColumn = 0;
    std::string name; ///< of the block or port there: "Engine/Gear"
};

/// Another place that a finding follows from.
struct RelatedPlace {
    Place place;
    std::string text; ///< of the condition or directive there, or of what is known of the build
};

/// A change that resolves a finding: replaces a region, which has a line and columns, by a text.
struct Fix {
    std::string description; ///< a sentence
    Place region;
    std::string text;
};

/// How much a finding matters, the least first.
enum class FindingLevel : std::uint8_t { Note, Warning };

/// A kind of findings.
struct FindingRule {
    std::string_view kind;    ///< "dead"
    std::string_view summary; ///< a sentence
    std::string_view help;    ///< meaning and remedy, in sentences
    FindingLevel level = FindingLevel::Warning;
};

struct Finding {
    Place place;
    std::string_view kind; ///< of a rule
    std::string message;   ///< a sentence without its full stop
    std::string condition;
    std::optional<std::string> proposed; ///< condition to write instead
    std::vector<RelatedPlace> follows;
    std::optional<Fix> fix;
    std::string witness;                     ///< "A=3, B=0", or empty
    std::vector<std::string> because = {};   ///< operands that force the finding
    bool mayNeedFewer = false;               ///< not all operands were shown to be needed
    std::vector<std::string> redundant = {}; ///< operands that the proposal leaves out
    FindingLevel level = FindingLevel::Warning;
    std::string fingerprint = {}; ///< of the content, the same wherever it moves; empty for none
    /// Against another state of the file: "new", "unchanged", "absent", "updated"; empty where there is none.
    std::string state = {};
    /// Configurations of the build that the finding holds for, from 1, of so many; none where it holds in every build.
    std::vector<std::size_t> configurations = {};
    std::size_t ofConfigurations = 0;
    std::vector<std::string> configurationNames = {}; ///< of those that have names
    std::string_view cause = {}; ///< what the finding needs besides the code: "configuration", "undefined-name"
};

/// The message with its reasons.
std::string sentenceOf(const Finding& finding);

/// Bytes of a text that are taken out, from `begin` to before `end`.
struct Removal {
    std::size_t begin;
    std::size_t end;
};

/// Returns a text with fixes of regions in it that do not overlap, each on one line, and without some of its bytes.
/// Linear in the text, plus sorting.
std::string fixed(const std::string& text, std::vector<Fix> fixes, std::vector<Removal> removals);

enum class FindingForm : std::uint8_t { Compiler, Json, Sarif };

/// Receives what a search finds.
class FindingListener {
public:
    virtual ~FindingListener() = default;

    virtual void write(const Finding& finding) = 0;
    /// A place could not be searched completely; the search fails.
    virtual void problem(const Place& place, const std::string& sentence) = 0;
    /// A remark about the whole search; the search does not fail.
    virtual void note(const std::string& sentence) = 0;
    /// Sentences about a place that are no findings.  `members` are those of a JSON object about them, each after a
    /// comma.
    virtual void remark(const Place& place, std::span<const std::string> sentences, const std::string& members) = 0;
};

/// Writes findings as they are found, and counts them.  Problems and notes go to standard error.  Throws OutputError.
class FindingWriter : public FindingListener {
public:
    void write(const Finding& finding) override;
    void problem(const Place& place, const std::string& sentence) override;
    void note(const std::string& sentence) override;
    void remark(const Place& place, std::span<const std::string> sentences, const std::string& members) override;

    /// Writes what is no finding of this state: the search finds nothing by it.
    void remark(const Finding& finding) { add(finding); }

    /// Ends the output, after which nothing may be written.  Returns the outcome.
    SearchResult finish();

    [[nodiscard]] std::uint64_t found() const noexcept { return found_; }

    /// Whether a problem was reported.
    [[nodiscard]] bool failed() const noexcept { return failed_; }

protected:
    explicit FindingWriter(Console& console) : console_(console) {}

    [[nodiscard]] Console& console() const noexcept { return console_; }

private:
    virtual void add(const Finding& finding) = 0;

    virtual void addProblem(const Place&, const std::string&) {}

    virtual void addNote(const std::string&) {}

    virtual void addRemark(const Place&, std::span<const std::string> sentences, const std::string& members) = 0;

    virtual void end() {}

    Console& console_;
    std::uint64_t found_ = 0;
    bool failed_ = false;
};

/// Makes a writer: `file:line: message` lines, one JSON object a line, or a SARIF 2.1.0 log.  `rules` holds every kind
/// of finding that will be written, and outlives the writer.  Throws OutputError.
std::unique_ptr<FindingWriter> makeFindingWriter(FindingForm form, Console& console,
                                                 std::span<const FindingRule> rules);

/// Adds --json and --sarif to a command.
void addFormOptions(Command& command, FindingForm& form);

} // namespace vtsym
