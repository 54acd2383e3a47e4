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

/// A condition of so many comparisons joined by && and ||, some groups negated.
std::string randomCondition(std::mt19937_64& random, std::size_t comparisons, const ConditionShape& shape = {});

} // namespace VT::Testing
