// What the search for a shorter condition found on its way.
#pragma once

#include "base/core/Node.hpp"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace VT {

/// A form of a condition that was written.
struct ShortForm {
    std::string_view way;    ///< how it was reached
    SymbolicExprId form;     ///< the condition as that way writes it
    std::size_t comparisons; ///< and other truth values, each occurrence counted
    std::uint64_t bytes;     ///< of its text
    bool chosen;             ///< whether it is the one that was proven equal and returned
};

} // namespace VT
