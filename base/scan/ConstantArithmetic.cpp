// Arithmetic of directives: exact where the standard defines the result, refused where it does not or where compilers
// differ (overflow, division by zero, shifts by too much).  O(1), reading linear in the token.
#include "base/scan/ConstantArithmetic.hpp"

#include "base/integer/ExactArithmetic.hpp"

#include <limits>
#include <string>

namespace VT {

namespace {

constexpr DirectiveConstant truth(bool holds) {
    return {holds ? 1U : 0U, false};
}

/// Whether the letters after a number are the suffix of an integer.
bool isSuffix(std::string_view suffix, bool& isUnsigned) {
    std::string letters;
    for (const char c : suffix)
        letters.push_back(c == 'U' ? 'u' : c == 'Z' ? 'z' : c);
    isUnsigned = letters.find('u') != std::string::npos;
    if (isUnsigned)
        letters.erase(letters.find('u'), 1);
    const bool divided = isUnsigned && suffix.size() == 3 && (suffix[1] == 'u' || suffix[1] == 'U'); // lul
    return !divided && (letters.empty() || letters == "l" || letters == "L" || letters == "ll" || letters == "LL" ||
                        letters == "z");
}

unsigned digitOf(char c) {
    return c >= '0' && c <= '9'   ? static_cast<unsigned>(c - '0')
           : c >= 'a' && c <= 'f' ? static_cast<unsigned>(c - 'a') + 10
           : c >= 'A' && c <= 'F' ? static_cast<unsigned>(c - 'A') + 10
                                  : 99;
}

std::optional<DirectiveConstant> computeSigned(SymbolicOp op, std::int64_t a, std::int64_t b) {
    static constexpr OperatorSet arithmetic{SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::Multiply,
                                            SymbolicOp::Divide, SymbolicOp::Modulo};
    const bool overflows = b == -1 && a == std::numeric_limits<std::int64_t>::min(); // in the remainder too
    if (!arithmetic.contains(op) || (op == SymbolicOp::Modulo && overflows))
        return std::nullopt;
    const std::optional<std::int64_t> value = integerResult(op, a, b);
    return value ? std::optional(DirectiveConstant{static_cast<std::uint64_t>(*value), false}) : std::nullopt;
}

std::optional<DirectiveConstant> computeUnsigned(SymbolicOp op, std::uint64_t a, std::uint64_t b) {
    switch (op) {
    case SymbolicOp::Plus:
        return DirectiveConstant{a + b, true};
    case SymbolicOp::Minus:
        return DirectiveConstant{a - b, true};
    case SymbolicOp::Multiply:
        return DirectiveConstant{a * b, true};
    case SymbolicOp::Divide:
    case SymbolicOp::Modulo:
        if (b == 0)
            return std::nullopt;
        return DirectiveConstant{op == SymbolicOp::Divide ? a / b : a % b, true};
    default:
        return std::nullopt;
    }
}

} // namespace

std::optional<DirectiveConstant> readConstant(std::string_view number) {
    unsigned base = 10;
    if (number.size() > 1 && number[0] == '0') {
        const char mark = number[1];
        base = mark == 'x' || mark == 'X' ? 16 : mark == 'b' || mark == 'B' ? 2 : 8;
        number.remove_prefix(base == 8 ? 1 : 2);
    }
    DirectiveConstant constant;
    std::size_t digits = 0;
    bool any = base == 8;
    for (; digits < number.size(); ++digits) {
        if (number[digits] == '\'')
            continue;
        const unsigned digit = digitOf(number[digits]);
        if (digit >= base)
            break;
        if (constant.bits > (std::numeric_limits<std::uint64_t>::max() - digit) / base)
            return std::nullopt;
        constant.bits = constant.bits * base + digit;
        any = true;
    }
    if (!any || !isSuffix(number.substr(digits), constant.isUnsigned))
        return std::nullopt;
    // A decimal constant beyond the signed values has a type of its own with each compiler.
    if (!constant.isUnsigned && constant.asSigned() < 0)
        return std::nullopt;
    return constant;
}

std::optional<DirectiveConstant> readCharacter(std::string_view quoted) {
    if (quoted.size() == 3 && quoted[0] == '\'' && quoted[2] == '\'' && quoted[1] > 0 && quoted[1] != '\\')
        return DirectiveConstant{static_cast<std::uint64_t>(quoted[1]), false};
    return std::nullopt;
}

std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
        if (!a.isUnsigned && a.asSigned() == std::numeric_limits<std::int64_t>::min())
            return std::nullopt;
        return DirectiveConstant{~a.bits + 1, a.isUnsigned};
    case SymbolicOp::BitCompl:
        return DirectiveConstant{~a.bits, a.isUnsigned};
    case SymbolicOp::Not:
        return truth(a.bits == 0);
    default:
        return std::nullopt;
    }
}

std::optional<DirectiveConstant> computeConstant(SymbolicOp op, DirectiveConstant a, DirectiveConstant b) {
    const bool isUnsigned = a.isUnsigned || b.isUnsigned;
    if (comparisonOps.contains(op))
        return truth(isUnsigned ? compareNumbers(op, a.bits, b.bits) : compareNumbers(op, a.asSigned(), b.asSigned()));
    switch (op) {
    case SymbolicOp::BitAnd:
        return DirectiveConstant{a.bits & b.bits, isUnsigned};
    case SymbolicOp::BitOr:
        return DirectiveConstant{a.bits | b.bits, isUnsigned};
    case SymbolicOp::BitXOr:
        return DirectiveConstant{a.bits ^ b.bits, isUnsigned};
    case SymbolicOp::ShiftLeft:
    case SymbolicOp::ShiftRight:
        if (b.bits > 63 || (!a.isUnsigned && a.isNegative()))
            return std::nullopt;
        if (op == SymbolicOp::ShiftRight)
            return DirectiveConstant{a.bits >> b.bits, a.isUnsigned};
        if (!a.isUnsigned && (a.bits << b.bits) >> b.bits != a.bits)
            return std::nullopt;
        if (!a.isUnsigned && static_cast<std::int64_t>(a.bits << b.bits) < 0)
            return std::nullopt;
        return DirectiveConstant{a.bits << b.bits, a.isUnsigned};
    default:
        return isUnsigned ? computeUnsigned(op, a.bits, b.bits) : computeSigned(op, a.asSigned(), b.asSigned());
    }
}

} // namespace VT
