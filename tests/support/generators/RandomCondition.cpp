#include "tests/support/generators/RandomCondition.hpp"

namespace VT::Testing {

namespace {

class Writer {
public:
    Writer(std::mt19937_64& random, const ConditionShape& shape) : random_(random), shape_(shape) {}

    std::string write(std::size_t comparisons) {
        if (comparisons == 1)
            return leaf();
        const std::size_t left = 1 + below(comparisons - 1);
        const std::string text = write(left) + (below(2) != 0 ? " && " : " || ") + write(comparisons - left);
        // Without the parentheses of a group, precedence groups anew, which is as random.
        switch (below(4)) {
        case 0:
            return "!(" + text + ")";
        case 1:
            return text;
        default:
            return "(" + text + ")";
        }
    }

private:
    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

    const std::string& symbol() { return shape_.symbols[below(shape_.symbols.size())]; }

    std::string leaf() {
        static const char* const operators[] = {"==", "!=", "<", "<=", ">", ">="};
        if (shape_.truthValues && below(4) == 0) {
            static const char* const constants[] = {"true", "false", "0", "2"};
            return below(6) == 0 ? constants[below(4)] : (below(2) != 0 ? "!" : "") + symbol();
        }
        const std::string constant =
            std::to_string(std::uniform_int_distribution<int>(shape_.lowest, shape_.highest)(random_));
        const std::string right = shape_.symbolPairs && below(4) == 0 ? symbol() : constant;
        const std::string left = symbol();
        return below(5) == 0 ? right + operators[below(6)] + left : left + operators[below(6)] + right;
    }

    std::mt19937_64& random_;
    const ConditionShape& shape_;
};

} // namespace

std::string randomCondition(std::mt19937_64& random, std::size_t comparisons, const ConditionShape& shape) {
    return Writer(random, shape).write(comparisons);
}

} // namespace VT::Testing
