// Scans files as the settings of a project say.
//
// Method: all findings of a file, those that are not asked for included, are compared with its suppressions; one that
// covers none of them is a finding itself.
// Cost: that of the scanner.
#include "tools/vtsym/findings/source/SourceChecker.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/report/Suppressions.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/findings/source/Fingerprints.hpp"
#include "tools/vtsym/findings/source/ScanRules.hpp"
#include "tools/vtsym/io/CommandLine.hpp"

#include <algorithm>
#include <unordered_map>

namespace vtsym {

namespace {

/// Why a suppression cannot be read; nothing where it can.
std::optional<std::string> problemOf(const VT::Suppression& suppression) {
    if (suppression.isMalformed)
        return "write vtsym: keep, and after a comma the reason";
    if (!suppression.line)
        return "there is no condition on its line or the next";
    for (const std::string& kind : suppression.kinds)
        if (scanRule(kind) == nullptr)
            return "there is no kind " + quotedArgument(kind);
    return std::nullopt;
}

struct MacroFile {
    std::string path;
    std::string text;
};

/// Adds the macros that options define.
void addOptions(const ScanSettings& settings, const std::vector<MacroFile>& macroFiles, VT::BuildMacros& build) {
    for (const std::string& definition : settings.defines) {
        const std::string name = definition.substr(0, definition.find_first_of("=("));
        if (std::ranges::find(settings.undefines, name) != settings.undefines.end())
            throw UsageError("-D", quotedArgument(name) + " is undefined by -U too; leave out one of them");
        if (!build.define(definition))
            throw UsageError("-D", quotedArgument(definition) + " does not begin with a name; write NAME=VALUE");
    }
    for (const std::string& name : settings.undefines)
        if (!build.undefine(name))
            throw UsageError("-U", quotedArgument(name) + " is not a name");
    for (const MacroFile& file : macroFiles)
        build.addFile(file.path, file.text, isCppPath(file.path));
}

} // namespace

SourceChecker::SourceChecker(const ScanSettings& settings, const CompileCommands::Problem& problem)
    : settings_(settings),
      scanner_({.strictIncludes = settings.strictIncludes, .why = settings.why}),
      kinds_(settings.kinds.empty() ? kindsOf("--kinds", "usual") : settings.kinds) {
    assume();
    if (!scanner_.assumptionsCanHold())
        refuseAssumptions();
    auto build = std::make_shared<Build>();
    readBuild(*build, problem);
    build_ = std::move(build);
}

SourceChecker::SourceChecker(const SourceChecker& other) = default;

void SourceChecker::assume() {
    for (const std::string& condition : settings_.assumptions)
        if (const auto wrong = scanner_.assume(condition))
            throw UsageError("--assume", quotedArgument(condition) + " " + *wrong);
    for (const AssumedConfiguration& configuration : settings_.configurations) {
        scanner_.beginAlternative();
        for (const std::string& line : configuration.assumptions)
            if (const auto wrong = scanner_.assume(line))
                throw UsageError("--configuration", quotedArgument(line) + " of " + configuration.name + " " + *wrong);
    }
}

/// Names the option whose conditions contradict each other.
void SourceChecker::refuseAssumptions() const {
    VT::SourceScanner scanner;
    for (const std::string& condition : settings_.assumptions)
        scanner.assume(condition);
    if (!scanner.assumptionsCanHold())
        throw UsageError("--assume", "the conditions contradict each other; leave out some of them");
    for (const AssumedConfiguration& configuration : settings_.configurations) {
        scanner.beginAlternative();
        for (const std::string& line : configuration.assumptions)
            scanner.assume(line);
        if (!scanner.assumptionsCanHold())
            throw UsageError("--configuration", "the conditions of " + quotedArgument(configuration.name) +
                                                    " contradict each other or those of --assume; leave out some");
    }
}

/// Reads the macros that options and commands define.
void SourceChecker::readBuild(Build& build, const CompileCommands::Problem& problem) const {
    std::vector<MacroFile> macroFiles;
    for (const std::string& path : settings_.macroFiles) {
        try {
            macroFiles.push_back({path, readFile(path, settings_.mostBytes)});
            build.files.add(macroFiles.back().text);
        } catch (const FileError& error) {
            throw UsageError("--imacros", path + " " + error.what());
        }
    }
    addOptions(settings_, macroFiles, build.ofOptions);
    if (settings_.compileCommands.empty())
        return;
    try {
        const std::string database = readFile(settings_.compileCommands, settings_.mostBytes);
        build.commands = CompileCommands::read(
            database, [&](VT::BuildMacros& macros) { addOptions(settings_, macroFiles, macros); }, problem,
            &build.files);
    } catch (const FileError& error) {
        throw UsageError("--compile-commands", settings_.compileCommands + " " + error.what());
    }
}

bool SourceChecker::isAsked(const Finding& finding) const {
    return finding.level >= settings_.severity && std::ranges::find(kinds_, finding.kind) != kinds_.end();
}

void addCounts(VT::SourceScanCounts& to, const VT::SourceScanCounts& more) {
    to.branches += more.branches;
    to.unread += more.unread;
    to.undecided += more.undecided;
    to.steps += more.steps;
    to.leftOut += more.leftOut;
}

CheckedFile SourceChecker::checkAndCount(const std::string& path, std::string_view text) {
    const VT::SourceScanCounts before = scanner_.counts();
    CheckedFile checked{check(path, text), scanner_.counts()};
    VT::SourceScanCounts& counts = checked.counts;
    counts.branches -= before.branches;
    counts.unread -= before.unread;
    counts.undecided -= before.undecided;
    counts.steps -= before.steps;
    counts.leftOut -= before.leftOut;
    return checked;
}

std::vector<FileFinding> SourceChecker::check(const std::string& path, std::string_view text) {
    VT::SourceFile file{text, isCppPath(path)};
    if (build_->commands)
        file.configurations = build_->commands->of(path);
    if (file.configurations.empty() && !build_->ofOptions.empty())
        file.configurations = {&build_->ofOptions};
    const std::size_t alternatives = settings_.configurations.size();
    const std::size_t builds = file.configurations.size();
    const std::size_t configurations = std::min(
        alternatives == 0 ? builds : std::max<std::size_t>(builds, 1) * alternatives, VT::limits::scanConfigurations);

    const std::vector<VT::Suppression> suppressions = VT::readSuppressions(text);
    std::unordered_multimap<std::uint64_t, std::size_t> byLine; // of directives
    for (std::size_t i = 0; i < suppressions.size(); ++i)
        if (suppressions[i].line)
            byLine.emplace(*suppressions[i].line, i);
    std::vector<bool> isUsed(suppressions.size(), false);
    std::vector<Finding> findings;
    std::vector<std::optional<VT::SourceEdit>> edits;
    std::vector<bool> isKept;
    const auto add = [&](Finding finding, std::optional<VT::SourceEdit> edit, bool isReported) {
        findings.push_back(std::move(finding));
        edits.push_back(std::move(edit));
        isKept.push_back(isReported && isAsked(findings.back()));
    };
    // What holds in some configurations alone is a note, which only a suppression may need besides.
    scanner_.reportCommonOnly(settings_.severity > FindingLevel::Note && suppressions.empty());
    const std::uint64_t undecidedBefore = scanner_.counts().undecided;
    scanner_.scan(file, [&](const VT::BranchFinding& found) {
        Finding finding = findingOf(path, found, configurations);
        if (alternatives != 0)
            for (const std::size_t configuration : found.configurations)
                finding.configurationNames.push_back(settings_.configurations[configuration % alternatives].name);
        bool isSuppressed = false;
        const auto [begin, end] = byLine.equal_range(found.region.line);
        for (auto each = begin; each != end; ++each) {
            if (!suppressions[each->second].covers(found.region.line, finding.kind))
                continue;
            isUsed[each->second] = true;
            isSuppressed = true;
        }
        const bool isInEvery = found.configurations.empty() || found.configurations.size() == configurations;
        add(std::move(finding), found.replaced && isInEvery ? std::optional(found.edit) : std::nullopt, !isSuppressed);
    });
    const bool isDecided = scanner_.counts().undecided == undecidedBefore;
    for (std::size_t i = 0; i < suppressions.size(); ++i) {
        if (const auto problem = problemOf(suppressions[i]))
            add(malformedSuppression(path, suppressions[i], *problem), {}, true);
        else if (!isUsed[i] && isDecided)
            add(staleSuppression(path, suppressions[i]), {}, true);
    }
    addFingerprints(findings); // whatever is asked for
    std::vector<FileFinding> asked;
    for (std::size_t i = 0; i < findings.size(); ++i)
        if (isKept[i])
            asked.push_back({std::move(findings[i]), std::move(edits[i])});
    std::ranges::stable_sort(asked, {}, [](const FileFinding& each) { return each.finding.place.line; });
    return asked;
}

} // namespace vtsym
