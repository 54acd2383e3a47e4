// An HTML page with a matrix for the choices of each block: which exclude each other, overlap, or are dead.
// The page is self-contained: it loads nothing and works from a file.
#pragma once

#include "tools/vtsym/findings/ModelCheck.hpp"

#include <string>

namespace vtsym {

/// The page of a model that was checked.
std::string modelPage(const VTRootBD& model, const ModelCheck& check);

} // namespace vtsym
