#pragma once

#include <string_view>

namespace vtsym {

/// What to write instead, where a condition cannot be read from `offset` on and the slip is a common one: an operator of
/// another language, a bracket without its partner.  Empty otherwise.
std::string_view errorHint(std::string_view text, std::size_t offset);

} // namespace vtsym
