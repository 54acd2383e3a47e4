// How the hash of a node begins, and the keys under which tables keep nodes.
//
// A key is 64 bits: the operator and both operands where these fit, and otherwise a hash.  Equal nodes have equal keys.
// Equal keys that are exact mean equal nodes, so most look-ups read no node.
#pragma once

#include "base/core/Operators.hpp"
#include "base/util/Hash.hpp"

#include <cstring>
#include <string_view>

namespace VT {

/// The hash in which a node kind's operands are then mixed.
constexpr std::uint64_t hashSeed(SymbolicOp op) noexcept {
    return hashStep(0, static_cast<std::uint64_t>(static_cast<std::int64_t>(op)));
}

/// The operators whose nodes have exact keys where their operands fit.
inline constexpr OperatorSet exactKeyOps = OperatorSet::where(
    [](const OperatorInfo& r) { return r.shape == "Int" || r.shape == "Unary" || r.shape == "Binary"; });

/// A number that differs from process to process: with it, nobody can prepare texts whose nodes collide in hash tables.
/// No result depends on it.
std::uint64_t processSeed() noexcept;

namespace NodeKeys {

inline constexpr unsigned operandBits = 29; ///< of an operand that fits
inline constexpr unsigned opShift = 2 * operandBits;
// In place of an operator, where the rest is a hash: of an identifier, or of another node.
inline constexpr std::uint64_t ofNames = std::uint64_t{62} << opShift;
inline constexpr std::uint64_t ofOthers = std::uint64_t{63} << opShift;
static_assert(operatorCount <= 62);

/// Whether nodes of this key are equal.
constexpr bool isExact(std::uint64_t key) noexcept {
    return key < ofNames;
}

/// Whether a key is that of an identifier.
constexpr bool isName(std::uint64_t key) noexcept {
    return key >> opShift == ofNames >> opShift;
}

// The parts of an exact key.

constexpr SymbolicOp opOf(std::uint64_t key) noexcept {
    return static_cast<SymbolicOp>(key >> opShift);
}

constexpr std::uint64_t leftOf(std::uint64_t key) noexcept {
    return key >> operandBits & ((std::uint64_t{1} << operandBits) - 1);
}

constexpr std::uint64_t rightOf(std::uint64_t key) noexcept {
    return key & ((std::uint64_t{1} << operandBits) - 1);
}

constexpr std::int32_t integerOf(std::uint64_t key) noexcept {
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(key));
}

/// The key of a node of this hash.
constexpr std::uint64_t inexact(std::uint64_t hash, std::uint64_t kind = ofOthers) noexcept {
    return kind | (hash * spread) >> (64 - opShift);
}

/// Whether a key holds these operands.
constexpr bool fits(std::uint64_t left, std::uint64_t right) noexcept {
    return (left | right) >> operandBits == 0;
}

/// The key of operands that fit; 0 is the second operand of an operator with one.
constexpr std::uint64_t exact(SymbolicOp op, std::uint64_t left, std::uint64_t right) noexcept {
    return static_cast<std::uint64_t>(op) << opShift | left << operandBits | right;
}

/// The key of an integer literal.
constexpr std::uint64_t ofInteger(std::int32_t value) noexcept {
    return static_cast<std::uint64_t>(SymbolicOp::IntValue) << opShift | static_cast<std::uint32_t>(value);
}

/// The key of an identifier: a hash of its bytes, eight at a time, and of the process.
inline std::uint64_t ofText(std::string_view text) noexcept {
    constexpr std::uint64_t multiplier = 0xd6e8feb86659fd93U;
    std::uint64_t hash = text.size() ^ processSeed();
    std::uint64_t word = 0;
    for (; text.size() > sizeof word; text.remove_prefix(sizeof word)) {
        std::memcpy(&word, text.data(), sizeof word);
        hash = (hash ^ word) * multiplier;
        hash ^= hash >> 32U;
    }
    word = 0;
    std::memcpy(&word, text.data(), text.size());
    hash = (hash ^ word) * multiplier;
    return inexact(hash ^ hash >> 32U, ofNames);
}

} // namespace NodeKeys
} // namespace VT
