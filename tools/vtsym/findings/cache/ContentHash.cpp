// Hashes with XXH3 (Collet, xxHash), whose header alone is used.  A text is hashed by itself, and then with what came
// before it.
#include "tools/vtsym/findings/cache/ContentHash.hpp"

#define XXH_INLINE_ALL
#include <xxhash.h>

#include <array>

namespace vtsym {

ContentHash& ContentHash::add(std::string_view text) {
    const XXH128_hash_t own = XXH3_128bits(text.data(), text.size());
    const std::array<std::uint64_t, 5> joined{key_.high, key_.low, own.high64, own.low64, text.size()};
    const XXH128_hash_t all = XXH3_128bits(joined.data(), sizeof joined);
    key_ = {all.high64, all.low64};
    return *this;
}

ContentHash& ContentHash::add(std::uint64_t number) {
    std::array<char, sizeof number> bytes{};
    for (char& byte : bytes) {
        byte = static_cast<char>(number & 255U);
        number >>= 8U;
    }
    return add(std::string_view(bytes.data(), bytes.size()));
}

std::uint64_t checksum(std::string_view text) {
    return XXH3_64bits(text.data(), text.size());
}

} // namespace vtsym
