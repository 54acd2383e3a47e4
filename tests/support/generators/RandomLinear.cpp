#include "tests/support/generators/RandomLinear.hpp"

#include <cstdint>
#include <iterator>

namespace VT::Testing {

namespace {

std::string oneOf(std::mt19937_64& random, std::string_view characters) {
    return std::string(1, characters[random() % characters.size()]);
}

std::string small(std::mt19937_64& random) {
    return std::to_string(static_cast<int>(random() % 41) - 20);
}

/// Mostly small, sometimes of 31 bits.
std::string literal(std::mt19937_64& random) {
    return random() % 6 == 0 ? std::to_string(static_cast<std::int32_t>(random())) : small(random);
}

/// A product by a literal or, for a large number, by several and a shift; the shift binds weaker than the product.
std::string multiple(std::mt19937_64& random, const std::string& term) {
    switch (random() % 12) {
    case 0:
        return "(" + term + "*" + literal(random) + "*" + literal(random) + ")";
    case 1:
        return "((" + term + "*" + std::to_string(1 + random() % 1000) + ")<<" + std::to_string(random() % 60) + ")";
    case 2:
    case 3:
        return term;
    default:
        return std::to_string(1 + random() % 9) + "*" + term;
    }
}

std::string term(std::mt19937_64& random, bool isPlain) {
    const std::string name = oneOf(random, "ABCD");
    if (isPlain || random() % 5 < 3)
        return name;
    const std::string inner = random() % 4 != 0 ? name : "(" + name + oneOf(random, "+-") + term(random, true) + ")";
    switch (random() % 6) {
    case 0:
        return "(" + inner + "/" + std::to_string(2 + random() % 9) + ")";
    case 1:
        return "(" + inner + "%" + std::to_string(2 + random() % 9) + ")";
    case 2:
        return "(" + inner + ">>" + std::to_string(1 + random() % 5) + ")";
    case 3:
        return "(" + inner + "<<" + std::to_string(random() % 8) + ")";
    case 4:
        return "(" + inner + oneOf(random, "&|^") + std::to_string(random() % 32) + ")";
    default:
        return "(" + inner + "&" + (random() % 2 == 0 ? std::to_string(1U << random() % 12) : small(random)) + ")";
    }
}

std::string comparison(std::mt19937_64& random) {
    static const char* const operators[] = {"==", "!=", "<", "<=", ">", ">="};
    std::string text = multiple(random, term(random, false));
    for (std::size_t parts = random() % 3; parts > 0; --parts)
        text += oneOf(random, "+-") + multiple(random, term(random, false));
    text += operators[random() % std::size(operators)];
    return text + (random() % 8 == 0 ? multiple(random, literal(random)) : literal(random));
}

} // namespace

std::string randomLinear(std::mt19937_64& random) {
    std::string text = comparison(random);
    for (std::size_t more = random() % 4; more > 0; --more)
        text = (random() % 3 == 0 ? "(" + text + ")||" : "(" + text + ")&&") + comparison(random);
    return text;
}

} // namespace VT::Testing
