// Findings of a file as bytes, for a cache.
#pragma once

#include "tools/vtsym/findings/source/SourceChecker.hpp"

#include <optional>
#include <string>
#include <string_view>

namespace vtsym {

/// Returns what bytesOf() has written; nothing for other bytes.
std::optional<CheckedFile> checkedFileOf(std::string_view bytes);

std::string bytesOf(const CheckedFile& file);

} // namespace vtsym
