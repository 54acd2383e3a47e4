// Integers of directives: 64 bits, signed or unsigned, as the preprocessor computes.
#pragma once

#include "base/core/Operators.hpp"

#include <cstdint>
#include <optional>
#include <string_view>

namespace VT {

/// An integer constant of a directive.
struct DirectiveConstant {
    std::uint64_t bits = 0;
    bool isUnsigned = false;

    [[nodiscard]] std::int64_t asSigned() const noexcept { return static_cast<std::int64_t>(bits); }

    [[nodiscard]] bool isNegative() const noexcept { return !isUnsigned && asSigned() < 0; }
};

/// Returns the value of an integer or character constant; nothing for other texts, and where compilers differ.
std::optional<DirectiveConstant> readConstant(std::string_view number);
std::optional<DirectiveConstant> readCharacter(std::string_view quoted);

/// Computes an operation; nothing for an overflow, a division by zero, a shift by too many bits.
std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a);
std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a, DirectiveConstant b);

} // namespace VT
