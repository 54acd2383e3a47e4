// What the command line offers, for those who write about it: the manual page and the completions of shells.
#pragma once

#include <string>
#include <vector>

namespace vtsym {

/// An option, or a positional argument where the name has no dash.
struct OptionEntry {
    std::vector<std::string> names; ///< "-h", "--help"
    std::string description;
    std::string value;              ///< what its argument is, as in the help; empty where it takes none
    std::vector<std::string> words; ///< the only values, where there are such
    bool repeats = false;           ///< it may be written several times
    bool isRequired = false;

    [[nodiscard]] bool isPositional() const { return !names.front().starts_with('-'); }

    [[nodiscard]] bool takesFiles() const {
        return value == "FILE" || value == "MODEL" || value == "PATH" || value == "DIR";
    }
};

struct CommandEntry {
    std::string name;
    std::string description;
    std::string notes; ///< paragraphs with empty lines between them; lines that begin with spaces are examples
    std::vector<OptionEntry> options;
};

struct ProgramEntry {
    CommandEntry program;
    std::string version;
    std::vector<CommandEntry> commands;
};

} // namespace vtsym
