// Integers as the preprocessor computes them: of 64 bits, signed or unsigned.
#pragma once

#include "base/core/Operators.hpp"

#include <cstdint>
#include <optional>
#include <string_view>

namespace VT {

struct DirectiveConstant {
    std::uint64_t bits = 0;
    bool isUnsigned = false;

    [[nodiscard]] std::int64_t asSigned() const noexcept { return static_cast<std::int64_t>(bits); }

    [[nodiscard]] bool isNegative() const noexcept { return !isUnsigned && asSigned() < 0; }
};

/// The value of an integer or character constant as it is written; nothing where it is none, or where compilers differ.
std::optional<DirectiveConstant> readConstant(std::string_view number);
std::optional<DirectiveConstant> readCharacter(std::string_view quoted);

/// The value of an operation; nothing where it has none: an overflow, a division by zero, a shift beyond the bits.
std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a);
std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a, DirectiveConstant b);

} // namespace VT
