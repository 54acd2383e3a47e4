// Paths of files as URIs.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace vtsym {

/// The path of a file as a URI reference: a relative path stays relative.
std::string uriOf(std::string_view path);

/// The path of a URI with the scheme `file`, without a host or with this one; nothing for another URI, and for one that
/// is not escaped correctly.
std::optional<std::string> pathOf(std::string_view uri);

} // namespace vtsym
