// Hashes of contents, by which results are found again.
#pragma once

#include <compare>
#include <cstdint>
#include <string_view>

namespace vtsym {

/// 128 bits that differ for different contents, as far as a hash that is not cryptographic can say.
struct ContentKey {
    std::uint64_t high = 0;
    std::uint64_t low = 0;
    auto operator<=>(const ContentKey&) const = default; // NOLINT(modernize-use-nullptr): no pointer here
};

/// Hashes a sequence of texts; where each of them ends counts.  Costs less than reading them from memory twice.
class ContentHash {
public:
    ContentHash& add(std::string_view text);
    ContentHash& add(std::uint64_t number);

    [[nodiscard]] ContentKey key() const noexcept { return key_; }

private:
    ContentKey key_;
};

/// Sum of a text that shows whether it was changed.
std::uint64_t checksum(std::string_view text);

} // namespace vtsym
