// The library's loggers.
#pragma once

#include "host/Log.hpp"

namespace vt::variants {

using Logger = foundation::core::log::basic_diagnostic_logger<char>;

namespace engine {
VTSYM_API Logger& getLogger();
} // namespace engine

namespace condProp {
VTSYM_API Logger& getLogger();
} // namespace condProp

namespace removal {
VTSYM_API Logger& getLogger();
} // namespace removal

namespace vred {
/// Named "vt::variants::reducer"; created on first use.
VTSYM_API Logger& getLogger();
} // namespace vred

} // namespace vt::variants
