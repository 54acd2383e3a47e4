// A page that shows how the choices of a model stand to each other.
#pragma once

#include "tools/vtsym/findings/ModelCheck.hpp"

#include <string>

namespace vtsym {

/// One HTML page without anything outside of it.
std::string modelPage(const VTRootBD& model, const ModelCheck& check);

} // namespace vtsym
