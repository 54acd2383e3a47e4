// vtsym scan
#include "base/scan/SourceScan.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <array>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Holds every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef against the directives around it and those before
it in its chain, and tells which branches are never entered, which are always entered, and which conditions have a
shorter text.  Directories are searched for C and C++ files.  A macro that a file defines or undefines on the way is
another one behind; an included file may define what is not defined.  #if 0 and #if 1 are left alone.

Exit status: 0 nothing was found, 1 something was, 2 a path could not be read, whatever was found in others.

Examples:
  vtsym scan src include
  vtsym scan --sarif src >findings.sarif)";

constexpr auto rules = std::to_array<FindingRule>({
    {"dead", "A branch is never entered.",
     "The condition contradicts a directive around the branch or before it in its chain, so that no definition of the "
     "macros enters the branch. Correct the condition, or remove the branch."},
    {"always-true", "A condition always holds where it stands.",
     "The directives around the branch and before it in its chain imply the condition, so that it decides nothing and "
     "branches behind it are dead. Correct the condition, or remove it."},
    {"removable", "A condition has a shorter text that enters the branch in the same cases.",
     "The directives around the branch and before it in its chain make a part of the condition redundant. Correct the "
     "condition, or write the shorter one."},
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
    finding.kind = rules[static_cast<std::size_t>(found.kind)].kind;
    finding.message = messageOf(found);
    finding.condition = found.condition;
    if (!found.proposed.empty())
        finding.proposed = found.proposed;
    for (const VT::BranchReason& reason : found.reasons)
        finding.follows.push_back({placeOf(file, reason.region), reason.directive});
    if (found.replaced && VT::shownText(found.replacement) == found.replacement) // logs hold UTF-8 alone
        finding.fix = Fix{"Write the condition that is left.", placeOf(file, *found.replaced), found.replacement};
    return finding;
}

SearchResult scan(const ScanOptions& options, Console& console) {
    const auto writer = makeFindingWriter(options.form, console, rules);
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
        problem(options.paths.front(), "there is no C or C++ file");
    if (const std::uint64_t undecided = scanner.counts().undecided; undecided > 0)
        writer->note(std::to_string(undecided) + " decisions were given up: what depends on them is not reported");
    const SearchResult result = writer->finish();
    if (options.summary) {
        const VT::SourceScanCounts& counts = scanner.counts();
        console.words("vtsym: " + std::to_string(files) + " files, " + std::to_string(counts.branches) + " branches, " +
                      std::to_string(writer->found()) + " findings; " + std::to_string(counts.unread) +
                      " conditions not understood, " + std::to_string(counts.undecided) + " decisions given up\n");
    }
    return result;
}

} // namespace

Command addScan(CLI::App& program) {
    CLI::App* const command =
        program.add_subcommand("scan", "Find dead, redundant and shortenable preprocessor conditions in C and C++");
    const auto options = std::make_shared<ScanOptions>();
    const auto take = [options](std::vector<std::string> paths) { options->paths = std::move(paths); };
    addArguments(*command, "PATH", take, "Files and directories")->required();
    addFormOptions(*command, options->form);
    addSizeOption(*command, options->mostBytes);
    command->add_flag("--strict-includes", options->strictIncludes, "Take it that an included file changes any macro");
    command->add_flag("--summary", options->summary, "Tell on standard error how much was read");
    command->footer(examples);
    return {command, [options](Console& console) { return ExitStatus(scan(*options, console)); },
            ExitStatus(SearchResult::Failed)};
}

} // namespace vtsym
