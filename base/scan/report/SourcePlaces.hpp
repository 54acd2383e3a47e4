// Lines and columns of a file.
#pragma once

#include "base/scan/SourceScan.hpp"

#include <cstddef>
#include <string_view>

namespace VT {

/// The region between two byte offsets; `line` is the line of `anchor`, which precedes them.  Linear in what lies
/// between the beginning of the anchor's line and the end.
SourceRegion regionOf(std::string_view text, std::size_t anchor, std::uint64_t line, std::size_t begin,
                      std::size_t end);

} // namespace VT
