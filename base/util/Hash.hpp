// The hash step that every hash of the library is made of.
//
// One round of MurmurHash64A (Appleby, 2008) without its final mix: tables spread the bits themselves.
#pragma once

#include <cstdint>
#include <string_view>

namespace VT {

/// Mixes one 64-bit key into a hash; every hash starts from 0.  All arithmetic is modulo 2^64.
constexpr std::uint64_t hashStep(std::uint64_t hash, std::uint64_t key) noexcept {
    constexpr std::uint64_t multiplier = 0xc6a4a7935bd1e995U;
    key *= multiplier;
    key ^= key >> 47U;
    key *= multiplier;
    hash ^= key;
    hash *= multiplier;
    return hash + 0xe6546b64U;
}

/// Multiplied by it, keys spread over the upper bits of the product: 2^64 divided by the golden ratio.
inline constexpr std::uint64_t spread = 0x9e3779b97f4a7c15U;

/// Mixes the bytes of a text, each as a signed char, into a hash.
constexpr std::uint64_t hashBytes(std::uint64_t hash, std::string_view text) noexcept {
    for (const char c : text)
        hash = hashStep(hash, static_cast<std::uint64_t>(static_cast<std::int64_t>(static_cast<signed char>(c))));
    return hash;
}

} // namespace VT
