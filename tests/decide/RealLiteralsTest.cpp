// Real literals among integers: decisions, and evaluation for their witnesses, against fractions that are computed
// while a random term is written.
#include "tests/decide/DecisionFixture.hpp"

#include <boost/multiprecision/cpp_int.hpp>

#include <array>
#include <charconv>
#include <cmath>
#include <random>

namespace VT::Testing {
namespace {

using Fraction = boost::multiprecision::cpp_rational;

/// A term and its value where A is known.
struct KnownTerm {
    std::string text;
    Fraction value;
    bool isReal = false;
    std::optional<double> literal = {}; ///< of what literals alone make, which is rounded with a real one
};

class TermWriter {
public:
    TermWriter(std::mt19937_64& random, int a) : random_(random), a_(a) {}

    /// The number of 64 bits that is nearest to a value.
    static KnownTerm nearest(const Fraction& value) {
        const auto real = value.convert_to<double>();
        std::array<char, 512> text{};
        const auto end = std::to_chars(text.begin(), text.end(), std::fabs(real), std::chars_format::fixed).ptr;
        std::string digits(text.begin(), end);
        if (digits.find('.') == std::string::npos)
            digits += ".0";
        return {std::signbit(real) ? "(-" + digits + ")" : digits, Fraction(real), true, real};
    }

    KnownTerm write(unsigned depth) {
        if (depth == 0 || random_() % 4 == 0)
            return leaf();
        if (random_() % 4 == 0)
            return negative(write(depth - 1));
        return joined(write(depth - 1), "+-*/"[random_() % 4], write(depth - 1));
    }

private:
    KnownTerm leaf() {
        static constexpr double reals[] = {0.1, 0.5, 2.0, 0.3, 2.5};
        if (random_() % 3 == 0)
            return {"A", a_};
        const int number = 1 + static_cast<int>(random_() % 9);
        if (random_() % 2 == 0)
            return {std::to_string(number), number, false, number};
        if (random_() % 3 == 0)
            return {"(A-A+" + std::to_string(number) + ")", number};
        const double real = reals[random_() % std::size(reals)];
        std::string text = std::to_string(real);
        text.resize(3);
        return {text, Fraction(real), true, real};
    }

    static KnownTerm negative(const KnownTerm& term) {
        KnownTerm result{"(-" + term.text + ")", -term.value, term.isReal, term.literal};
        if (term.literal)
            result.literal = -*term.literal;
        return result;
    }

    KnownTerm joined(const KnownTerm& x, char op, const KnownTerm& y) {
        if (op == '/' && y.value == 0)
            op = '+';
        KnownTerm result{"(" + x.text + op + y.text + ")", 0, x.isReal || y.isReal};
        const bool areLiterals = x.literal && y.literal;
        if (areLiterals && result.isReal) {
            result.literal = compute(*x.literal, op, *y.literal);
            result.value = Fraction(*result.literal);
            return result;
        }
        result.value = compute(x.value, op, y.value);
        if (op == '/' && !result.isReal) // cut toward zero
            result.value = numerator(result.value) / denominator(result.value);
        if (areLiterals)
            result.literal = result.value.convert_to<double>();
        return result;
    }

    template <class Number>
    static Number compute(const Number& x, char op, const Number& y) {
        return op == '+' ? Number(x + y) : op == '-' ? Number(x - y) : op == '*' ? Number(x * y) : Number(x / y);
    }

    std::mt19937_64& random_;
    int a_;
};

TEST(RealLiterals, AreExactFractionsAndRoundedAmongLiterals) {
    std::size_t decided = 0;
    constexpr std::size_t rounds = 4000;
    for (std::size_t round = 0; round < rounds; ++round) {
        std::mt19937_64 random(round);
        const int a = static_cast<int>(random() % 13) - 6;
        TermWriter writer(random, a);
        const KnownTerm x = writer.write(3);
        const KnownTerm y = random() % 4 == 0 ? writer.write(2) : TermWriter::nearest(x.value);
        static const char* const operators[] = {"<", "<=", "==", "!=", ">", ">="};
        const std::size_t op = random() % std::size(operators);
        const int order = x.value.compare(y.value);
        const bool holds[] = {order<0, order <= 0, order == 0, order != 0, order> 0, order >= 0};
        const std::string text = x.text + operators[op] + y.text;
        SCOPED_TRACE(text + " for A=" + std::to_string(a));
        DecisionFixture fixture;
        const SymbolicExprId condition = fixture.parse(text);
        const SymbolicExprId both = fixture.parse("A==" + std::to_string(a) + " && " + text);
        const Witness witness{{fixture.parse("A"), a}};
        const auto value = fixture.decider.holds(condition, witness);
        if (value) {
            ASSERT_EQ(*value, holds[op]) << "by evaluation";
        }
        const Decision decision = fixture.decider.canHold(both);
        decided += decision.isUndecided() ? 0U : 1U;
        if (!decision.isUndecided()) {
            ASSERT_EQ(decision.isYes(), holds[op]) << "decided";
        }
    }
    EXPECT_GE(decided * 10, rounds * 8);
}

} // namespace
} // namespace VT::Testing
