// The operations of prepared expressions, and running them.
#pragma once

#include "base/eval/ScalarRules.hpp"

#include <cstdint>

namespace VT::detail {

/// One operation: its code and the cells of its operands.  Its result follows that of the operation before it.
struct Operation {
    std::uint32_t code;
    std::uint32_t left;
    std::uint32_t right;
};

inline constexpr std::uint32_t typePairs = scalarTypes * scalarTypes;

/// The code of a rule for operands of two types.
constexpr std::uint32_t operationCode(ScalarRuleIndex rule, ScalarType left, ScalarType right) {
    return static_cast<std::uint32_t>(rule) * typePairs + static_cast<std::uint32_t>(left) * scalarTypes +
           static_cast<std::uint32_t>(right);
}

constexpr ScalarRuleIndex ruleOfCode(std::uint32_t code) {
    return static_cast<ScalarRuleIndex>(code / typePairs);
}

/// The code that ends the operations.
inline constexpr std::uint32_t endCode =
    operationCode(static_cast<ScalarRuleIndex>(scalarRules.size()), ScalarType::Bool, ScalarType::Bool);

/// Runs operations up to the one with endCode, over cells of the types that the codes are for; results are written from
/// `result` on.
void execute(const Operation* operation, ScalarCell* cells, ScalarCell* result) noexcept;

} // namespace VT::detail
