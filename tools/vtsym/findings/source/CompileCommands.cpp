// Reads compilation databases.  Linear in the database and the files that it includes before others.
#include "tools/vtsym/findings/source/CompileCommands.hpp"

#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <array>
#include <filesystem>
#include <optional>
#include <set>
#include <utility>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

using Json = nlohmann::json;

[[noreturn]] void refuseDatabase(const std::string& what) {
    throw FileError("is not a compilation database: " + what);
}

std::string absolutePath(const fs::path& path) {
    return fs::absolute(path).lexically_normal().string();
}

/// A path as messages show it: from the working directory where it is below that.
std::string shownPath(const std::string& path) {
    const fs::path near = fs::path(path).lexically_proximate(fs::current_path());
    return near.empty() || *near.begin() == ".." ? path : near.string();
}

/// The argument of an option at a position of a command, joined or next to it; the position is moved to it.
std::optional<std::string> argumentOf(const std::vector<std::string>& words, std::size_t& at, std::string_view option) {
    if (!words[at].starts_with(option))
        return std::nullopt;
    if (words[at].size() > option.size())
        return words[at].substr(option.size());
    return at + 1 < words.size() ? std::optional(words[++at]) : std::nullopt;
}

struct Compilation {
    std::string folder;
    std::string file;
    std::vector<std::string> words;
};

Compilation commandOf(const Json& entry) {
    const auto text = [&entry](const char* name) {
        if (!entry.is_object() || !entry.contains(name) || !entry[name].is_string())
            refuseDatabase(std::string("a command has no ") + name);
        return entry[name].get<std::string>();
    };
    Compilation command{text("directory"), text("file"), {}};
    if (!entry.contains("arguments")) {
        command.words = shellWords(text("command"));
    } else if (const Json& arguments = entry["arguments"]; arguments.is_array()) {
        for (const Json& each : arguments)
            if (each.is_string())
                command.words.push_back(each.get<std::string>());
    }
    return command;
}

} // namespace

std::vector<std::string> shellWords(std::string_view command) {
    std::vector<std::string> words;
    bool isOpen = false; // a word, which may be empty
    char quote = '\0';
    for (std::size_t i = 0; i < command.size(); ++i) {
        const char c = command[i];
        if (quote == '\0' && std::string_view(" \t\n").find(c) != std::string_view::npos) {
            isOpen = false;
            continue;
        }
        if (!isOpen)
            words.emplace_back();
        isOpen = true;
        if (c == quote) {
            quote = '\0';
        } else if (quote == '\0' && (c == '"' || c == '\'')) {
            quote = c;
        } else if (c == '\\' && quote != '\'' && i + 1 < command.size() &&
                   (quote == '\0' || std::string_view("$`\"\\").find(command[i + 1]) != std::string_view::npos)) {
            words.back().push_back(command[++i]);
        } else {
            words.back().push_back(c);
        }
    }
    return words;
}

CompileCommands CompileCommands::read(std::string_view json, const std::function<void(VT::BuildMacros&)>& further,
                                      const Problem& problem, ContentHash* read) {
    if (read != nullptr)
        read->add(json).add(fs::current_path().string());
    const Json entries = Json::parse(json, nullptr, false);
    if (!entries.is_array())
        refuseDatabase("it is no JSON list of commands");
    CompileCommands commands;
    std::map<std::string, std::optional<std::string>> texts; // of files that are included before others
    const auto textOf = [&](const std::string& path) -> const std::optional<std::string>& {
        const auto [known, isNew] = texts.try_emplace(path);
        try {
            if (isNew)
                known->second = readFile(path, mostBytes);
        } catch (const FileError& error) {
            problem(shownPath(path) + " " + error.what() + ": macros that are not defined may be defined there");
        }
        if (isNew && read != nullptr)
            read->add(known->second ? "read" : "unread").add(known->second.value_or(""));
        return known->second;
    };
    std::map<std::string, VT::BuildMacros> ofOthers;    // by key
    std::set<std::pair<std::string, std::string>> seen; // files and keys
    for (const Json& entry : entries) {
        const Compilation command = commandOf(entry);
        const std::string file = absolutePath(fs::path(command.folder) / command.file);
        VT::BuildMacros build;
        std::array<std::vector<std::string>, 2> included; // by -imacros, by -include
        for (std::size_t i = 1; i < command.words.size(); ++i) {
            if (const auto defined = argumentOf(command.words, i, "-D"))
                build.define(*defined);
            else if (const auto undefined = argumentOf(command.words, i, "-U"))
                build.undefine(*undefined);
            else if (const auto macros = argumentOf(command.words, i, "-imacros"))
                included[0].push_back(*macros);
            else if (const auto before = argumentOf(command.words, i, "-include"))
                included[1].push_back(*before);
        }
        for (const auto& files : included) {
            for (const std::string& each : files) {
                const std::string path = absolutePath(fs::path(command.folder) / each);
                if (const std::optional<std::string>& text = textOf(path))
                    build.addFile(shownPath(path), *text, isCppPath(file));
                else
                    build.forgetUndefined();
            }
        }
        further(build);
        VT::BuildMacros ofOther = build;
        ofOther.forgetUndefined();
        ofOthers.emplace(ofOther.key(), std::move(ofOther));
        if (seen.emplace(file, build.key()).second)
            commands.byFile_[file].push_back(std::make_shared<const VT::BuildMacros>(std::move(build)));
    }
    for (auto& [key, build] : ofOthers)
        commands.ofOthers_.push_back(std::make_shared<const VT::BuildMacros>(std::move(build)));
    return commands;
}

std::vector<const VT::BuildMacros*> CompileCommands::of(const std::string& path) const {
    const auto own = byFile_.find(absolutePath(path));
    std::vector<const VT::BuildMacros*> builds;
    for (const auto& build : own == byFile_.end() ? ofOthers_ : own->second)
        builds.push_back(build.get());
    return builds;
}

} // namespace vtsym
