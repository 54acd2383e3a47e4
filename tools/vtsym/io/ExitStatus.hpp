// How a command ends.
#pragma once

#include <cstdint>

namespace vtsym {

/// What a search through files comes to.
enum class SearchResult : std::uint8_t { NothingFound, Found, Failed };

/// The exit status of a command: 0 or 1 for one that answers texts, 0, 1 or 2 for a search.
class ExitStatus {
public:
    // NOLINTBEGIN(google-explicit-constructor): what a command returns is its status
    ExitStatus(bool success) : value_(success ? 0 : 1) {}

    ExitStatus(SearchResult result) : value_(static_cast<int>(result)) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] int value() const noexcept { return value_; }

private:
    int value_;
};

} // namespace vtsym
