// Exit statuses: 0 or 1 for a command that answers texts, 0, 1 or 2 for one that searches files.
// Status 2 also reports a wrong command line.
#pragma once

#include <cstdint>

namespace vtsym {

/// The outcome of a search through files.
enum class SearchResult : std::uint8_t { NothingFound, Found, Failed };

/// The exit status of a command, made from the outcome that the command returns.
class ExitStatus {
public:
    // NOLINTBEGIN(google-explicit-constructor): commands return their outcome
    ExitStatus(bool success) : value_(success ? 0 : 1) {}

    ExitStatus(SearchResult result) : value_(static_cast<int>(result)) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] int value() const noexcept { return value_; }

private:
    int value_;
};

} // namespace vtsym
