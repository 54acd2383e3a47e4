// Numbers as integers and rational numbers of SMT-LIB.
//
// Sums, products, comparisons, quotients and remainders cut toward zero, shifts, masks by a literal and real literals
// are exact. A mask by a literal is a sum of its runs of ones; shifts by an unknown distance are distinguished by
// cases. The bits that two unknowns share are a function of which laws are stated: its size, its sign, its lowest bit
// and its value for operands that are equal, complements, 0 or -1; | and ^ follow from it.
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/decide/external/SmtWriter.hpp"
#include "base/integer/ExactArithmetic.hpp"
#include "base/integer/Int32.hpp"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace VT {

namespace {

constexpr std::string_view bitLaws = R"((declare-fun band (Int Int) Int)
(define-fun laws ((x Int) (y Int) (a Int)) Bool (and
 (= a (band y x))
 (=> (>= x 0) (and (<= 0 a) (<= a x)))
 (=> (>= y 0) (and (<= 0 a) (<= a y)))
 (=> (and (< x 0) (< y 0)) (and (<= a x) (<= a y)))
 (=> (or (< x 0) (< y 0)) (> a (+ x y)))
 (=> (= x y) (= a x))
 (=> (= x (- 1)) (= a y))
 (=> (= y (- 1)) (= a x))
 (=> (= (+ x y) (- 1)) (= a 0))
 (= (= (mod a 2) 1) (and (= (mod x 2) 1) (= (mod y 2) 1)))))
)";

// NOLINTNEXTLINE(cppcoreguidelines-virtual-class-destructor): final
class IntegerText final : SmtWriter {
public:
    explicit IntegerText(const SmtSource& source) : SmtWriter(source) {}

    std::optional<SmtQuestion> write() {
        if (!writeAll())
            return std::nullopt;
        if (out_.hasBits)
            out_.text.insert(0, bitLaws);
        return std::move(out_);
    }

private:
    static constexpr unsigned realBits = 1100; ///< of the smallest real literal

    /// A number, or one that nothing is known of where it is too large.
    Term sized(std::string text, Sort sort, unsigned bits) {
        if (bits > limits::solverNumberBits) {
            text = declare(sort);
            bits = limits::solverUnknownBits;
        }
        Term term{std::move(text), sort};
        term.bits = bits;
        return term;
    }

    Term ofInteger(std::string text, unsigned bits) { return sized(std::move(text), Sort::Number, bits); }

    Term integer(std::int64_t value) override { return ofInteger(decimal(value), 64); }

    Term anyInteger() { return ofInteger(anything(), limits::solverUnknownBits); }

    /// The exact value of a finite double: digits * 2^exponent.
    Term real(double value) override {
        int exponent = 0;
        const double fraction = std::frexp(value, &exponent);
        constexpr int digits = 53;
        const std::string whole = compound("to_real", decimal(static_cast<std::int64_t>(std::ldexp(fraction, digits))));
        exponent -= digits;
        const std::string power = compound("to_real", powerOfTwo(static_cast<unsigned>(std::abs(exponent))));
        Term term = sized(compound(exponent < 0 ? "/" : "*", whole, power), Sort::Rational, realBits);
        term.literal = value;
        return term;
    }

    static std::string powerOfTwo(unsigned exponent) {
        constexpr unsigned most = 62; // of a number
        if (exponent <= most)
            return decimal(std::int64_t{1} << exponent);
        std::string product = "(*";
        for (; exponent > 0; exponent -= std::min(exponent, most))
            product.append(" ").append(decimal(std::int64_t{1} << std::min(exponent, most)));
        return product + ")";
    }

    void restrict(Term& unknown, SymbolicExprId) override {
        unknown.bits = limits::solverUnknownBits;
        if (source_.bits32)
            SmtWriter::write(
                {"(assert (and (<= (- 2147483648) ", unknown.name, ") (<= ", unknown.name, " 2147483647)))\n"});
    }

    const char* sortName(Sort sort) const override {
        return sort == Sort::Truth ? "Bool" : sort == Sort::Rational ? "Real" : "Int";
    }

    std::string nonZero(const Term& number) override {
        return compound("not", compound("=", number.name, zeroOf(number)));
    }

    static const char* zeroOf(const Term& number) { return number.sort == Sort::Rational ? "(to_real 0)" : "0"; }

    static std::string asRational(const Term& term) {
        return term.sort == Sort::Rational ? term.name : compound("to_real", term.name);
    }

    static bool isReal(const Term& a, const Term& b) { return a.sort == Sort::Rational || b.sort == Sort::Rational; }

    /// An integer that nothing is known of.
    std::string anything() { return declare(Sort::Number); }

    Term literal(std::int64_t value) {
        Term term = integer(value);
        term.integer = value;
        term.literal = static_cast<double>(value);
        return term;
    }

    Term negative(const Term& a) override {
        if (a.integer && *a.integer != minusInfinite)
            return literal(-*a.integer);
        if (a.literal && a.sort == Sort::Rational)
            return real(-*a.literal);
        return sized(compound("-", a.name), a.sort, a.bits);
    }

    Term complement(const Term& a) override {
        return a.sort == Sort::Number ? ofInteger(compound("-", "(- 1)", a.name), a.bits + 1) : Term();
    }

    Term comparison(SymbolicOp op, const Term& a, const Term& b) override {
        std::string text = isReal(a, b) ? compound(comparisonName(op), asRational(a), asRational(b))
                                        : compound(comparisonName(op), a.name, b.name);
        return truth(op == SymbolicOp::NotEqual ? compound("not", text) : std::move(text));
    }

    Term arithmetic(SymbolicOp op, const Term& a, const Term& b) override {
        if (isReal(a, b))
            return realArithmetic(op, a, b);
        if (a.integer && b.integer) {
            const auto value = integerResult(op, *a.integer, *b.integer);
            if (value && isWithinBound(*value))
                return literal(*value);
        }
        const unsigned larger = std::max(a.bits, b.bits) + 1;
        switch (op) {
        case SymbolicOp::Plus:
            return ofInteger(compound("+", a.name, b.name), larger);
        case SymbolicOp::Minus:
            return ofInteger(compound("-", a.name, b.name), larger);
        case SymbolicOp::Multiply:
        case SymbolicOp::DotMul:
            return ofInteger(compound("*", a.name, b.name), a.bits + b.bits);
        case SymbolicOp::Power:
        case SymbolicOp::DotPower:
            return power(a, b);
        case SymbolicOp::Divide:
        case SymbolicOp::Modulo:
            return ofInteger(division(op == SymbolicOp::Divide, a, b), a.bits);
        case SymbolicOp::ShiftLeft:
        case SymbolicOp::ShiftRight:
            return shift(op == SymbolicOp::ShiftLeft, a, b);
        case SymbolicOp::BitAnd:
            return ofInteger(shared(a, b), larger);
        case SymbolicOp::BitOr:
            return ofInteger(joined({"(- (+ ", a.name, " ", b.name, ") ", shared(a, b), ")"}), larger);
        case SymbolicOp::BitXOr:
            return ofInteger(joined({"(- (+ ", a.name, " ", b.name, ") (* 2 ", shared(a, b), "))"}), larger);
        default:
            return anyInteger();
        }
    }

    /// Two literals are rounded; a quotient is exact.
    Term realArithmetic(SymbolicOp op, const Term& a, const Term& b) {
        if (a.literal && b.literal)
            if (const auto folded = foldedReals(op, *a.literal, *b.literal))
                return real(*folded);
        const auto exactly = [&](const char* function) {
            return sized(compound(function, asRational(a), asRational(b)), Sort::Rational, a.bits + b.bits);
        };
        switch (op) {
        case SymbolicOp::Plus:
            return exactly("+");
        case SymbolicOp::Minus:
            return exactly("-");
        case SymbolicOp::Multiply:
        case SymbolicOp::DotMul:
            return exactly("*");
        case SymbolicOp::Divide: {
            Term quotient = exactly("/");
            quotient.name = choose(compound("=", asRational(b), "(to_real 0)"), declare(Sort::Rational), quotient.name);
            return quotient;
        }
        default:
            return {};
        }
    }

    /// A power of a small exponent is a product.
    Term power(const Term& a, const Term& b) {
        constexpr std::int64_t most = 8;
        if (!b.integer || *b.integer < 0 || *b.integer > most)
            return anyInteger();
        std::string product = "(* 1";
        for (std::int64_t i = 0; i < *b.integer; ++i)
            product.append(" ").append(a.name);
        return ofInteger(product + ")", static_cast<unsigned>(*b.integer + 1) * a.bits);
    }

    /// C cuts toward zero, `div` rounds so that the remainder is not negative: both agree for a dividend that is not.
    std::string division(bool isQuotient, const Term& a, const Term& b) {
        const std::string function = isQuotient ? "div" : "mod";
        const std::string notNegative = compound(">=", a.name, "0");
        const std::string opposite = compound("-", a.name);
        if (b.integer && *b.integer != 0) {
            const std::string divisor = decimal(std::abs(*b.integer));
            const std::string up = compound(function, a.name, divisor);
            const std::string down = compound("-", compound(function, opposite, divisor));
            const std::string cut = choose(notNegative, up, down);
            return isQuotient && *b.integer < 0 ? compound("-", cut) : cut;
        }
        const std::string result = compound(function, compound("abs", a.name), compound("abs", b.name));
        const std::string isPositive =
            isQuotient ? compound("=", notNegative, compound(">", b.name, "0")) : notNegative;
        return choose(compound("=", b.name, "0"), anything(), choose(isPositive, result, compound("-", result)));
    }

    /// A shift multiplies by a power of two, or divides by it and rounds down; a negative distance turns it round.  Of
    /// large unknown distances only the size of the result is stated.
    Term shift(bool isLeft, const Term& a, const Term& b) {
        constexpr std::int64_t far = 32;
        const auto by = [&](std::int64_t places) {
            const std::string power = powerOfTwo(static_cast<unsigned>(std::abs(places)));
            return compound(isLeft == (places >= 0) ? "*" : "div", a.name, power);
        };
        if (b.integer && std::abs(*b.integer) > limits::solverNumberBits)
            return anyInteger();
        if (b.integer)
            return ofInteger(by(*b.integer), a.bits + static_cast<unsigned>(std::abs(*b.integer)));
        const std::string beyond = anything();
        const std::string notNegative = compound(">=", a.name, "0");
        const std::string product = compound("*", a.name, powerOfTwo(far));
        const std::string quotient = compound("div", a.name, powerOfTwo(far));
        const std::string large = choose(notNegative, compound(">=", beyond, product), compound("<=", beyond, product));
        const std::string small = choose(notNegative, joined({"(<= 0 ", beyond, " ", quotient, ")"}),
                                         joined({"(<= ", quotient, " ", beyond, " (- 1))"}));
        const std::string zero = compound("=>", compound("=", a.name, "0"), compound("=", beyond, "0"));
        SmtWriter::write({"(assert (and ", zero, " (=> (>= ", b.name, " ", std::to_string(far), ") ",
                          isLeft ? large : small, ") (=> (<= ", b.name, " ", decimal(-far), ") ",
                          isLeft ? small : large, ")))\n"});
        std::string result = beyond;
        for (std::int64_t places = far; places-- > 1 - far;)
            result = choose(compound("=", b.name, decimal(places)), by(places), result);
        return ofInteger(std::move(result), a.bits + static_cast<unsigned>(far));
    }

    /// a & b.
    std::string shared(const Term& a, const Term& b) {
        if (b.integer)
            return masked(a.name, *b.integer);
        if (a.integer)
            return masked(b.name, *a.integer);
        out_.hasBits = true;
        std::string value = compound("band", a.name, b.name);
        SmtWriter::write({"(assert (laws ", a.name, " ", b.name, " ", value, "))\n"});
        return value;
    }

    // NOLINTNEXTLINE(misc-no-recursion): once
    static std::string masked(const std::string& a, std::int64_t mask) {
        if (mask < 0)
            return compound("-", a, masked(a, ~mask));
        std::string sum = "(+ 0";
        unsigned first = 0; // of a run of ones
        bool inside = false;
        for (unsigned bit = 0; bit < 64; ++bit) { // bit 63 is 0 and ends the last run
            const bool next = (static_cast<std::uint64_t>(mask) >> bit & 1U) != 0;
            if (next && !inside)
                first = bit;
            if (!next && inside) {
                const std::string power = powerOfTwo(first);
                const std::string run = powerOfTwo(bit - first);
                sum += joined({" (* ", power, " (mod (div ", a, " ", power, ") ", run, "))"});
            }
            inside = next;
        }
        return sum + ")";
    }
};

} // namespace

std::optional<SmtQuestion> writeIntegers(const SmtSource& source) {
    return IntegerText(source).write();
}

} // namespace VT
