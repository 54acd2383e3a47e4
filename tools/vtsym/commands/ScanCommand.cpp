// vtsym scan: reads C and C++ files and prints the findings of SourceScanner as messages, JSON or SARIF with fixes.
// A file that cannot be read is reported and does not end the scan; the status is 2 then.
#include "base/scan/SourceScan.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <array>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* scanNotes =
    R"(Compares every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef with the directives around it and those before it in
its chain, and reports branches that no build enters, conditions that always hold, and conditions with a shorter text.
Directories are searched for C and C++ files.  Nothing is concluded about a macro across a #define or #undef of it, and an
included file may define what is not defined.  #if 0 and #if 1 are left alone.

Exit status: 0 no findings, 1 findings, 2 a path could not be read, with or without findings in others.

Examples:
  vtsym scan src include
  vtsym scan --sarif src >findings.sarif)";

constexpr auto scanRules = std::to_array<FindingRule>({
    {"dead", "A branch is never entered.",
     "The condition contradicts a directive around the branch or before it in its chain, so that no definition of the "
     "macros enters the branch. Correct the condition, or remove the branch."},
    {"always-true", "A condition always holds.",
     "The directives around the branch and before it in its chain imply the condition, so that later branches of the "
     "chain are dead. Correct the condition, or remove it."},
    {"removable", "A condition has a shorter text that enters the branch in the same cases.",
     "The directives around the branch and before it in its chain make a part of the condition redundant. Correct the "
     "condition, or write the shorter one."},
    {"spelled-out", "A condition repeats that those before it in its chain do not hold.",
     "An #elif is reached only where the conditions before it in its chain do not hold, so that a part of its "
     "condition "
     "says so again. That is a matter of taste: keep it, or write the shorter condition."},
});

struct ScanOptions {
    std::vector<std::string> paths;
    std::size_t mostBytes = vtsym::mostBytes;
    bool strictIncludes = false;
    bool summary = false;
    FindingForm form = FindingForm::Compiler;
};

Place placeOf(const std::string& file, const VT::SourceRegion& region) {
    return {file, region.line, region.column, region.endLine, region.endColumn, {}};
}

/// "since '#if A' (line 1) holds and '#if B' (line 2) does not hold here".
std::string reasonsText(const std::vector<VT::BranchReason>& reasons) {
    std::string text = "since ";
    for (std::size_t i = 0; i < reasons.size(); ++i) {
        text.append(i == 0 ? "" : i + 1 == reasons.size() ? " and " : ", ").append("'").append(reasons[i].directive);
        text.append("' (line ").append(std::to_string(reasons[i].region.line)).append(")");
        text.append(reasons[i].holds ? " holds" : " does not hold");
    }
    return text + " here";
}

std::string messageOf(const VT::BranchFinding& found) {
    std::string text = "'" + found.directive + "' ";
    const char* alone = "";
    switch (found.kind) {
    case VT::BranchFindingKind::Dead:
        text.append("is dead");
        alone = ", the condition contradicts itself";
        break;
    case VT::BranchFindingKind::AlwaysTrue:
        text.append("always holds");
        alone = ", whatever the macros are";
        break;
    default:
        text.append("can be '").append(found.directive, 0, found.directive.find(' ') + 1).append(found.proposed);
        text.append("'");
    }
    return found.reasons.empty() ? text + alone : text + ", " + reasonsText(found.reasons);
}

Finding findingOf(const std::string& file, const VT::BranchFinding& found) {
    Finding finding;
    finding.place = placeOf(file, found.region);
    finding.kind = scanRules[static_cast<std::size_t>(found.kind)].kind;
    finding.message = messageOf(found);
    finding.condition = found.condition;
    if (!found.proposed.empty())
        finding.proposed = found.proposed;
    for (const VT::BranchReason& reason : found.reasons)
        finding.follows.push_back({placeOf(file, reason.region), reason.directive});
    if (found.replaced && VT::shownText(found.edit.text) == found.edit.text) // a log can hold only UTF-8
        finding.fix = Fix{"Write the shorter condition.", placeOf(file, *found.replaced), found.edit.text};
    return finding;
}

SearchResult scan(const ScanOptions& options, Console& console) {
    const auto writer = makeFindingWriter(options.form, console, scanRules);
    const FileProblem problem = [&](const std::string& path, const std::string& sentence) {
        writer->problem(placeOf(path, {}), sentence);
    };
    VT::SourceScanner scanner({.strictIncludes = options.strictIncludes});
    std::uint64_t files = 0;
    for (const std::string& path : sourceFiles(options.paths, problem)) {
        std::string text;
        try {
            text = readFile(path, options.mostBytes);
        } catch (const FileError& error) {
            problem(path, error.what());
            continue;
        }
        ++files;
        scanner.scan(text, isCppPath(path),
                     [&](const VT::BranchFinding& found) { writer->write(findingOf(path, found)); });
    }
    if (files == 0 && !writer->failed())
        problem(options.paths.front(), "there is no C or C++ file: name a folder of sources, or a file");
    if (const std::uint64_t undecided = scanner.counts().undecided; undecided > 0)
        writer->note(std::to_string(undecided) + " decisions were given up: findings that depend on them are missing");
    const SearchResult result = writer->finish();
    if (options.summary) {
        const VT::SourceScanCounts& counts = scanner.counts();
        console.err("vtsym: " + std::to_string(files) + " files, " + std::to_string(counts.branches) + " branches, " +
                    std::to_string(writer->found()) + " findings; " + std::to_string(counts.unread) +
                    " conditions not understood, " + std::to_string(counts.undecided) + " decisions given up\n");
    }
    return result;
}

} // namespace

void addScan(CommandLine& program) {
    Command& command =
        program.add("scan", "Find dead, redundant and shortenable preprocessor conditions in C and C++", scanNotes);
    const auto options = std::make_shared<ScanOptions>();
    const auto take = [options](std::vector<std::string> paths) { options->paths = std::move(paths); };
    command.addArguments({"PATH", "Files and directories"}, take);
    command.require("PATH");
    addFormOptions(command, options->form);
    addSizeOption(command, options->mostBytes);
    command.addFlag("--strict-includes", "Assume that an included file changes any macro", options->strictIncludes);
    command.addFlag("--summary", "Report on standard error how much was read", options->summary);
    command.run = [options](Console& console) { return scan(*options, console); };
    command.onError = SearchResult::Failed;
}

} // namespace vtsym
