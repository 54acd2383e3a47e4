// The commands that a page has no use for: they add nothing.
//
// A page has no files, no terminal and no editor.  Neither these commands nor the scan of sources are downloaded.
#include "tools/vtsym/commands/Commands.hpp"

namespace vtsym {

void addScan(CommandLine&) {}

void addLsp(CommandLine&) {}

void addRepl(CommandLine&) {}

void addManual(CommandLine&) {}

void addCompletion(CommandLine&) {}

} // namespace vtsym
