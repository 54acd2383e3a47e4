// A hand-written precedence parser for conditions: the independent reading against which the grammar is tested.
#pragma once

#include "base/core/Node.hpp"

#include <cstddef>
#include <string_view>

namespace VT::Testing {

struct OracleResult {
    SymbolicExprId id = invalidId; ///< of the whole text's expression; invalid where there is none
    std::size_t stop = 0;          ///< byte offset at which reading stopped
};

struct OracleOptions {
    bool cOperators = true;
    bool variantKeywords = false;
};

/// Reads a text in one pass, interning operands as they come.  Recurses for brackets, at most 256 deep.
OracleResult oracleParse(SymbolicExprTable& table, std::string_view text, OracleOptions options = {});

} // namespace VT::Testing
