// How the hash of a node begins.
#pragma once

#include "base/core/Operators.hpp"
#include "base/util/Hash.hpp"

namespace VT {

/// The hash in which a node kind's operands are then mixed.
constexpr std::uint64_t hashSeed(SymbolicOp op) noexcept {
    return hashStep(0, static_cast<std::uint64_t>(static_cast<std::int64_t>(op)));
}

} // namespace VT
