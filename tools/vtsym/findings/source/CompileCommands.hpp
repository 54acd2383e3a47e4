// The configurations in which a project builds its files, from a compilation database.
#pragma once

#include "base/scan/build/BuildMacros.hpp"
#include "tools/vtsym/findings/cache/ContentHash.hpp"

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// A list of words that a POSIX shell makes of a command without expansions: quotes and backslashes are removed.
std::vector<std::string> shellWords(std::string_view command);

/// The options of a compiler that define macros: -D, -U, -include and -imacros.
class CompileCommands {
public:
    /// Receives what could not be read, as a sentence.
    using Problem = std::function<void(const std::string& sentence)>;

    /// Reads a database, compile_commands.json.  Definitions of the command line, in `further`, come after those of
    /// each command.  Throws FileError for a text that is none.  A file that a command includes and that cannot be read
    /// is a problem; macros that are not defined may be then.
    /// `read`, if given, takes everything that was read, and the folder that paths are shown from.
    static CompileCommands read(std::string_view json, const std::function<void(VT::BuildMacros&)>& further,
                                const Problem& problem, ContentHash* read = nullptr);

    /// The different configurations of a file: of all commands that compile it; for other files, such as headers, of
    /// all commands, where what is not defined may be defined before.
    [[nodiscard]] std::vector<const VT::BuildMacros*> of(const std::string& path) const;

private:
    using Builds = std::vector<std::shared_ptr<const VT::BuildMacros>>;

    std::map<std::string, Builds> byFile_; ///< by absolute path
    Builds ofOthers_;
};

} // namespace vtsym
