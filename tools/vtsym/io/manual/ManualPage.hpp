// The manual page of the program, from its own command line.
#pragma once

#include "tools/vtsym/io/CommandEntries.hpp"

#include <string>

namespace vtsym {

/// The page vtsym(1) in roff, with the macros of man(7).
std::string manualPage(const ProgramEntry& program);

} // namespace vtsym
