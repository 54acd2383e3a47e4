// vtsym scan: the options of the command. ScanRun does what they ask for.
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/ScanRun.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/findings/source/ScanRules.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <charconv>
#include <filesystem>
#include <memory>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* notes =
    R"(Compares every #if, #ifdef, #ifndef, #elif, #elifdef and #elifndef with the directives around it and those before it in
its chain, and reports branches that no build enters, conditions that always hold, and conditions with a shorter text.
Directories are searched for C and C++ files.  Nothing is concluded about a macro across a #define or #undef of it, and an
included file may define what is not defined.  #if 0 and #if 1 are left alone.  A comment at a directive, such as
/* vtsym: keep, REASON */, suppresses what is found there.  Settings are read from .vtsym.toml.

Exit status: 0 no findings; 1 findings, of --fix those that it left, of --diff new ones; 2 the command line is wrong or a
path could not be read, with or without findings in others.

Examples:
  vtsym scan src include
  vtsym scan --why --assume 'VERSION >= 3' src
  vtsym scan --compile-commands build/compile_commands.json src
  vtsym scan --fix --dry-run src | git apply
  vtsym scan --diff main..HEAD
  vtsym scan --sarif src >findings.sarif)";

/// Joins the options with the settings of the project.
void readProject(ScanOptions& options) {
    std::error_code error;
    const std::string path = options.config.empty() ? settingsName : options.config;
    if (!options.config.empty() || std::filesystem::is_regular_file(path, error)) {
        try {
            options.settings = joined(readSettings(path), options.settings, options.hasSeverity);
        } catch (const FileError& problem) {
            throw UsageError(path, problem.what());
        }
    }
    if (options.settings.paths.empty() && options.range.empty())
        throw UsageError("PATH is required");
    if (options.dryRun && !options.fix)
        throw UsageError("--dry-run", "there is nothing to do without --fix");
}

void addReportOptions(Command& command, const std::shared_ptr<ScanOptions>& options) {
    addFormOptions(command, options->form);
    command.addArgument(
        {"--kinds", "Report these kinds, separated by commas; all or usual for many (usual unless given)", "KINDS"},
        [options](const std::string& list) { options->settings.kinds = kindsOf("--kinds", list); });
    command.addArgument({"--severity", "Report nothing below: note or warning (note unless given)", "LEVEL"},
                        [options](const std::string& name) {
                            options->settings.severity = levelOf("--severity", name);
                            options->hasSeverity = true;
                        });
    command.addFlag("--why", "Add the operands that force each finding", options->settings.why);
    command.addArgument({"--baseline", "Report only what this file does not accept", "FILE"},
                        options->settings.baseline);
    command.addArgument({"--baseline-days", "Report what was accepted more days ago, too", "DAYS"},
                        [options](const std::string& text) {
                            const char* const end = text.data() + text.size();
                            if (const auto [at, error] = std::from_chars(text.data(), end, options->days);
                                error != std::errc() || at != end)
                                throw UsageError("--baseline-days", quotedArgument(text) + " is not a number of days");
                        });
    command.addArgument({"--write-baseline", "Accept all findings, and write them to this file", "FILE"},
                        options->written);
    command.addArgument({"--diff", "Compare two states of a git repository instead", "A..B"}, options->range);
    command.addFlag("--fix", "Write the proposals into the files", options->fix);
    command.addFlag("--dry-run", "With --fix: print a patch instead", options->dryRun);
    command.addFlag("--summary", "Report on standard error how much was read", options->summary);
}

void addBuildOptions(Command& command, const std::shared_ptr<ScanOptions>& options) {
    const auto all = [](std::vector<std::string>& list) {
        return [&list](std::vector<std::string> values) { list = std::move(values); };
    };
    ScanSettings& settings = options->settings;
    command.addArguments({"-D", "Scan for a build that defines a macro", "NAME[=VALUE]"}, all(settings.defines));
    command.addArguments({"-U", "Scan for a build in which a macro is not defined", "NAME"}, all(settings.undefines));
    command.addArguments({"--imacros", "Scan for a build with the macros of a file", "FILE"}, all(settings.macroFiles));
    command.addArgument({"--compile-commands", "Scan for the builds of a compilation database", "FILE"},
                        settings.compileCommands);
    command.addArguments({"--assume", "Scan for builds in which a condition holds, or those of a file", "CONDITION"},
                         [&settings](const std::vector<std::string>& arguments) {
                             for (const std::string& argument : arguments) {
                                 try {
                                     addAssumption(settings.assumptions, argument);
                                 } catch (const FileError& error) {
                                     throw UsageError("--assume", argument + " " + error.what());
                                 }
                             }
                         });
    command.addArguments(
        {"--configuration", "Scan for builds of one of several kinds, each with its assumptions", "NAME=FILE"},
        [&settings](const std::vector<std::string>& arguments) {
            for (const std::string& argument : arguments)
                addConfiguration(settings.configurations, "--configuration", argument);
        });
    command.addFlag("--strict-includes", "Assume that an included file changes any macro", settings.strictIncludes);
}

} // namespace

void addScan(CommandLine& program) {
    Command& command =
        program.add("scan", "Find dead, redundant and shortenable preprocessor conditions in C and C++", notes);
    const auto options = std::make_shared<ScanOptions>();
    const auto take = [options](std::vector<std::string> paths) { options->settings.paths = std::move(paths); };
    command.addArguments({"PATH", "Files and directories"}, take);
    addReportOptions(command, options);
    addBuildOptions(command, options);
    addSizeOption(command, options->settings.mostBytes);
    command.addArguments(
        {"--exclude", "Leave out paths, or folders, of a pattern", "PATTERN"},
        [options](std::vector<std::string> patterns) { options->settings.excluded = std::move(patterns); });
    command.addArgument({"--config", "Read settings from this file rather than .vtsym.toml", "FILE"}, options->config);
    addJobsOption(command, options->jobs);
    command.addArgument({"--cache", "Keep findings in this folder, for files that do not change", "DIR"},
                        options->cache);
    command.exclude("--write-baseline", "--fix");
    command.afterOptions = [options] { readProject(*options); };
    for (const char* const other : {"--fix", "--baseline", "--write-baseline", "--cache"})
        command.exclude("--diff", other);
    command.run = [options](Console& console) -> ExitStatus { return runScan(*options, console); };
    command.onError = SearchResult::Failed;
}

} // namespace vtsym
