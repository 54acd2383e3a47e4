// The texts of the truth constants, which are the same in every language and need no parser.
#pragma once

#include "base/core/Table.hpp"

#include <optional>
#include <string_view>

namespace VT {

/// TRUE for the empty text and "true", FALSE for "false", nothing for any other text; exact and case-sensitive.  The
/// table has its truth constants.
VTSYM_API std::optional<SymbolicExprId> truthOfText(const SymbolicExprTable& table, std::string_view text);

} // namespace VT
