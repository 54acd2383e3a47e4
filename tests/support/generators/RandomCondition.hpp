// Random conditions as text that both spellings of the condition grammar read.
#pragma once

#include <cstddef>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {

/// What random conditions are made of.
struct ConditionShape {
    std::vector<std::string> symbols{"A", "B", "C"};
    int lowest = -2; ///< constants of comparisons
    int highest = 3;
    bool symbolPairs = false; ///< comparisons between symbols too
    bool truthValues = false; ///< symbols, numbers and truth constants as operands of && and ||
};

inline std::size_t belowOf(std::mt19937_64& random, std::size_t bound) {
    return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random);
}

/// One comparison, or truth value.
inline std::string randomComparison(std::mt19937_64& random, const ConditionShape& shape) {
    static const char* const operators[] = {"==", "!=", "<", "<=", ">", ">="};
    static const char* const constants[] = {"true", "false", "0", "2"};
    const auto below = [&](std::size_t bound) { return belowOf(random, bound); };
    const auto symbol = [&] { return shape.symbols[below(shape.symbols.size())]; };
    if (shape.truthValues && below(4) == 0)
        return below(6) == 0 ? constants[below(4)] : (below(2) != 0 ? "!" : "") + symbol();
    const std::string constant =
        std::to_string(std::uniform_int_distribution<int>(shape.lowest, shape.highest)(random));
    const std::string right = shape.symbolPairs && below(4) == 0 ? symbol() : constant;
    const std::string left = symbol();
    return below(5) == 0 ? right + operators[below(6)] + left : left + operators[below(6)] + right;
}

/// A condition of so many comparisons joined by && and ||, some groups negated.
inline std::string randomCondition(std::mt19937_64& random, std::size_t comparisons, // NOLINT(misc-no-recursion)
                                   const ConditionShape& shape = {}) {
    if (comparisons == 1)
        return randomComparison(random, shape);
    const std::size_t left = 1 + belowOf(random, comparisons - 1);
    const std::string text = randomCondition(random, left, shape) + (belowOf(random, 2) != 0 ? " && " : " || ") +
                             randomCondition(random, comparisons - left, shape);
    // Without the parentheses of a group, precedence groups anew, which is as random.
    const std::size_t form = belowOf(random, 4);
    return form == 1 ? text : (form == 0 ? "!(" : "(") + text + ")";
}

} // namespace VT::Testing
