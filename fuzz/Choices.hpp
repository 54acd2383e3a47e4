// Fuzz input read as a sequence of choices.
#pragma once

#include "tests/support/generators/AnyCondition.hpp"

#include <cstdint>
#include <span>
#include <string>

namespace VT::Fuzz {

/// Bytes of input, each a choice among up to 256 things.  After the last byte every choice is the first one.
class Choices {
public:
    explicit Choices(std::span<const std::uint8_t> bytes) : left_(bytes) {}

    [[nodiscard]] bool areUsedUp() const noexcept { return left_.empty(); }

    std::uint8_t byte() noexcept {
        if (left_.empty())
            return 0;
        const std::uint8_t first = left_.front();
        left_ = left_.subspan(1);
        return first;
    }

    std::size_t below(std::size_t bound) noexcept { return byte() % bound; }

    std::int32_t integer() noexcept {
        std::uint32_t bits = 0;
        for (int i = 0; i < 4; ++i)
            bits = bits << 8U | byte();
        return static_cast<std::int32_t>(bits);
    }

    template <class Things>
    const auto& of(const Things& things) noexcept {
        return things[below(std::size(things))];
    }

    /// The text up to a zero byte or the end.
    std::string text() {
        std::string read;
        while (!left_.empty())
            if (const std::uint8_t next = byte(); next != 0)
                read += static_cast<char>(next);
            else
                break;
        return read;
    }

private:
    std::span<const std::uint8_t> left_;
};

/// A graph of operators whose value is that of their operands, at most so many, three bytes each; answers the last one.
SymbolicExprId chosenCondition(SymbolicExprTable& table, Choices& choices, std::size_t operators,
                               const Testing::ConditionWorld& world);

/// A name of the world, a keyword, a truth constant, or a literal of any value.
SymbolicExprId chosenLeaf(SymbolicExprTable& table, Choices& choices, const Testing::ConditionWorld& world);

/// So many assignments, always the same ones.
std::vector<Testing::Assignment> someAssignments(const Testing::ConditionWorld& world, std::size_t count);

} // namespace VT::Fuzz
