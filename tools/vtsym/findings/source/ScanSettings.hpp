// What a scan is to do: options of the command line, and the file .vtsym.toml of a project.
#pragma once

#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// The file of a project's settings, in the folder where the program starts.
inline constexpr const char* settingsName = ".vtsym.toml";

/// A set of assumptions of which one holds: what one architecture promises.
struct AssumedConfiguration {
    std::string name;
    std::vector<std::string> assumptions; ///< lines
};

struct ScanSettings {
    std::vector<std::string> paths;    ///< files and folders
    std::vector<std::string> excluded; ///< patterns of paths, as a shell has them
    std::vector<std::string> kinds;    ///< of findings that are reported; empty for the usual ones
    FindingLevel severity = FindingLevel::Note;
    bool strictIncludes = false;
    bool why = false;
    std::vector<std::string> defines;   ///< texts after -D
    std::vector<std::string> undefines; ///< names
    std::vector<std::string> macroFiles;
    std::vector<std::string> assumptions;             ///< lines: conditions, meanings of calls, settled macros
    std::vector<AssumedConfiguration> configurations; ///< alternatives
    std::string compileCommands;
    std::string baseline;
    std::size_t mostBytes = vtsym::mostBytes;
};

/// Reads a file of settings: its table [scan].  Paths in it are relative to its folder.  Throws FileError for a file
/// that cannot be read, or says something else.
ScanSettings readSettings(const std::string& path);

/// Adds what the command line says to the settings of a project: paths, kinds and a severity replace those of the
/// project, everything else is added.  Throws UsageError for a configuration that both have.
ScanSettings joined(ScanSettings project, const ScanSettings& commandLine, bool hasSeverity);

/// Adds an assumption: a condition, or the lines of a file that VT::SourceScanner::assume() takes, without comments and
/// empty ones.  A comment begins with # and is neither #define nor #pragma.  A file is an argument that ends in
/// `.assume`, or the path of a regular file.  Throws FileError.
void addAssumption(std::vector<std::string>& conditions, const std::string& argument);

/// Adds an alternative: "NAME=FILE", whose file is in a folder.  Throws UsageError about the option.
void addConfiguration(std::vector<AssumedConfiguration>& configurations, const std::string& option,
                      const std::string& argument, const std::string& folder = {});

/// Returns the kinds of a list such as "dead,always-true", or of "all".  Throws UsageError about the option for an
/// unknown one.
std::vector<std::string> kindsOf(const std::string& option, const std::string& list);

/// Returns a level by its name; throws UsageError about the option.
FindingLevel levelOf(const std::string& option, const std::string& name);

} // namespace vtsym
