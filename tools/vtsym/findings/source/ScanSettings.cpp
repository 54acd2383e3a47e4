// Reads settings of a project with toml++ and joins them with those of the command line.
#include "tools/vtsym/findings/source/ScanSettings.hpp"

#include "tools/vtsym/findings/source/ScanRules.hpp"
#include "tools/vtsym/io/CommandLine.hpp"

#include <toml++/toml.h>

#include <algorithm>
#include <filesystem>
#include <functional>
#include <system_error>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

constexpr const char* usualKindsExclude = "spelled-out";

[[noreturn]] void refuse(const toml::node& node, const std::string& what) {
    throw FileError("line " + std::to_string(node.source().begin.line) + ": " + what);
}

/// A path of a settings file, from where the program is.
std::string pathIn(const std::string& folder, const std::string& path) {
    return folder.empty() || fs::path(path).is_absolute() ? path
                                                          : (fs::path(folder) / path).lexically_normal().string();
}

/// Reads the members of the table [scan].
class SettingsReader {
public:
    explicit SettingsReader(const std::string& path) : folder_(fs::path(path).parent_path().string()) {}

    ScanSettings read(const toml::table& whole);

private:
    static std::string textOf(const toml::key& key, const toml::node& node) {
        if (!node.is_string())
            refuse(node, "'" + std::string(key.str()) + "' holds something else than a text in quotes");
        return node.as_string()->get();
    }

    static bool flagOf(const toml::key& key, const toml::node& node) {
        if (!node.is_boolean())
            refuse(node, "'" + std::string(key.str()) + "' is neither true nor false");
        return node.as_boolean()->get();
    }

    static std::vector<std::string> textsOf(const toml::key& key, const toml::node& node) {
        if (!node.is_array())
            refuse(node, "'" + std::string(key.str()) + "' is no list: write [\"...\"]");
        std::vector<std::string> texts;
        for (const toml::node& each : *node.as_array())
            texts.push_back(textOf(key, each));
        return texts;
    }

    std::vector<std::string> pathsOf(const toml::key& key, const toml::node& node) const {
        std::vector<std::string> paths = textsOf(key, node);
        for (std::string& path : paths)
            path = pathIn(folder_, path);
        return paths;
    }

    void take(const toml::key& key, const toml::node& node);

    std::string folder_;
    ScanSettings settings_;
};

void SettingsReader::take(const toml::key& key, const toml::node& node) {
    const std::string_view name = key.str();
    const std::string option(name);
    if (name == "paths") {
        settings_.paths = pathsOf(key, node);
    } else if (name == "exclude") {
        settings_.excluded = pathsOf(key, node);
    } else if (name == "kinds") {
        for (const std::string& kind : textsOf(key, node))
            for (std::string& each : kindsOf(option, kind))
                settings_.kinds.push_back(std::move(each));
    } else if (name == "severity") {
        settings_.severity = levelOf(option, textOf(key, node));
    } else if (name == "strict-includes") {
        settings_.strictIncludes = flagOf(key, node);
    } else if (name == "why") {
        settings_.why = flagOf(key, node);
    } else if (name == "define") {
        settings_.defines = textsOf(key, node);
    } else if (name == "undefine") {
        settings_.undefines = textsOf(key, node);
    } else if (name == "imacros") {
        settings_.macroFiles = pathsOf(key, node);
    } else if (name == "assume") {
        settings_.assumptions = textsOf(key, node);
    } else if (name == "assume-files") {
        for (const std::string& path : pathsOf(key, node)) {
            try {
                addAssumption(settings_.assumptions, path);
            } catch (const FileError& error) {
                throw UsageError(option, path + " " + error.what());
            }
        }
    } else if (name == "configurations") {
        for (const std::string& argument : textsOf(key, node))
            addConfiguration(settings_.configurations, option, argument, folder_);
    } else if (name == "compile-commands") {
        settings_.compileCommands = pathIn(folder_, textOf(key, node));
    } else if (name == "baseline") {
        settings_.baseline = pathIn(folder_, textOf(key, node));
    } else {
        refuse(node, "there is no setting '" + option + "' in [scan]");
    }
}

ScanSettings SettingsReader::read(const toml::table& whole) {
    for (const auto& [name, node] : whole) {
        if (name.str() != "scan" || !node.is_table())
            refuse(node, "'" + std::string(name.str()) + "' is not the table [scan]");
        for (const auto& [key, value] : *node.as_table()) {
            try {
                take(key, value);
            } catch (const UsageError& error) {
                refuse(value, error.what());
            }
        }
    }
    return settings_;
}

void append(std::vector<std::string>& to, const std::vector<std::string>& from) {
    to.insert(to.end(), from.begin(), from.end());
}

void append(std::vector<AssumedConfiguration>& to, const std::string& option, AssumedConfiguration added) {
    if (std::ranges::find(to, added.name, &AssumedConfiguration::name) != to.end())
        throw UsageError(option, quotedArgument(added.name) + " is given twice; write another name");
    to.push_back(std::move(added));
}

bool isComment(std::string_view line) {
    return line.starts_with('#') && !line.starts_with("#define") && !line.starts_with("#pragma");
}

void addLines(std::vector<std::string>& conditions, const std::string& text) {
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t end = std::min(text.find('\n', at), text.size());
        const std::string_view line(text.data() + at, end - at);
        const std::size_t first = line.find_first_not_of(" \t\r");
        if (first != std::string_view::npos && !isComment(line.substr(first)))
            conditions.emplace_back(line.substr(first, line.find_last_not_of(" \t\r") - first + 1));
        at = end + 1;
    }
}

} // namespace

ScanSettings readSettings(const std::string& path) {
    const std::string text = readFile(path, mostBytes);
    try {
        return SettingsReader(path).read(toml::parse(text));
    } catch (const toml::parse_error& error) {
        throw FileError("line " + std::to_string(error.source().begin.line) + ": " + std::string(error.description()));
    }
}

ScanSettings joined(ScanSettings project, const ScanSettings& commandLine, bool hasSeverity) {
    const auto replace = [](auto& to, const auto& from) {
        if (!from.empty())
            to = from;
    };
    replace(project.paths, commandLine.paths);
    replace(project.kinds, commandLine.kinds);
    replace(project.compileCommands, commandLine.compileCommands);
    replace(project.baseline, commandLine.baseline);
    if (hasSeverity)
        project.severity = commandLine.severity;
    append(project.excluded, commandLine.excluded);
    append(project.defines, commandLine.defines);
    append(project.undefines, commandLine.undefines);
    append(project.macroFiles, commandLine.macroFiles);
    append(project.assumptions, commandLine.assumptions);
    for (const AssumedConfiguration& configuration : commandLine.configurations)
        append(project.configurations, "--configuration", configuration);
    project.strictIncludes = project.strictIncludes || commandLine.strictIncludes;
    project.why = project.why || commandLine.why;
    project.mostBytes = commandLine.mostBytes;
    return project;
}

void addAssumption(std::vector<std::string>& conditions, const std::string& argument) {
    std::error_code error;
    if (!argument.ends_with(".assume") && !fs::is_regular_file(argument, error)) {
        conditions.push_back(argument);
        return;
    }
    addLines(conditions, readFile(argument, mostBytes));
}

void addConfiguration(std::vector<AssumedConfiguration>& configurations, const std::string& option,
                      const std::string& argument, const std::string& folder) {
    const std::size_t equals = argument.find('=');
    if (equals == std::string::npos || equals == 0)
        throw UsageError(option, quotedArgument(argument) + " has no name; write NAME=FILE");
    if (equals + 1 == argument.size())
        throw UsageError(option, quotedArgument(argument) + " has no file; write NAME=FILE");
    AssumedConfiguration added{argument.substr(0, equals), {}};
    const std::string path = pathIn(folder, argument.substr(equals + 1));
    try {
        addLines(added.assumptions, readFile(path, mostBytes));
    } catch (const FileError& error) {
        throw UsageError(option, path + " " + error.what());
    }
    append(configurations, option, std::move(added));
}

std::vector<std::string> kindsOf(const std::string& option, const std::string& list) {
    std::vector<std::string> all;
    std::vector<std::string> usual;
    for (const FindingRule& rule : scanRules()) {
        all.emplace_back(rule.kind);
        if (rule.kind != usualKindsExclude)
            usual.emplace_back(rule.kind);
    }
    std::vector<std::string> kinds;
    for (std::size_t at = 0; at <= list.size();) {
        const std::size_t end = std::min(list.find(',', at), list.size());
        const std::string kind = list.substr(at, end - at);
        if (kind == "all")
            append(kinds, all);
        else if (kind == "usual")
            append(kinds, usual);
        else {
            std::vector<std::string> words{"all", "usual"};
            append(words, all);
            requireOneOf(option, kind, words);
            kinds.push_back(kind);
        }
        at = end + 1;
    }
    return kinds;
}

FindingLevel levelOf(const std::string& option, const std::string& name) {
    requireOneOf(option, name, {"note", "warning"});
    return name == "note" ? FindingLevel::Note : FindingLevel::Warning;
}

} // namespace vtsym
