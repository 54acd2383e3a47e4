// Completions of the command line in shells, from the program's own commands and options.
#pragma once

#include "tools/vtsym/io/CommandEntries.hpp"

#include <string>
#include <vector>

namespace vtsym {

/// The shells for which there are completions.
const std::vector<std::string>& completionShells();

/// The script for one of the shells.
std::string completionScript(const ProgramEntry& program, const std::string& shell);

} // namespace vtsym
