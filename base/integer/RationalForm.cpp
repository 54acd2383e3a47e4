// Combines forms in 64 bits where that suffices, and otherwise over a common denominator with big integers.
//
// Linear in the parts of the forms, times the length of their numbers.
#include "base/integer/RationalForm.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <utility>

namespace VT {

namespace {

std::size_t bitsOf(const BigInteger& value) {
    return value == 0 ? 0 : msb(abs(value)) + 1;
}

bool isWithinLimits(const WideForm& form) {
    return bitsOf(form.constant) <= limits::formBits && bitsOf(form.denominator) <= limits::formBits &&
           std::ranges::all_of(form.parts,
                               [](const WidePart& part) { return bitsOf(part.factor) <= limits::formBits; });
}

bool isSmall(const BigInteger& value) {
    return value >= -limits::formNumber && value <= limits::formNumber;
}

/// a * factorA + b * factorB over the denominator `denominator`.
WideForm sumOf(const WideForm& a, const BigInteger& factorA, const WideForm& b, const BigInteger& factorB,
               BigInteger denominator) {
    WideForm sum{{}, a.constant * factorA + b.constant * factorB, std::move(denominator)};
    sum.parts.reserve(a.parts.size() + b.parts.size());
    auto nextA = a.parts.begin();
    auto nextB = b.parts.begin();
    while (nextA != a.parts.end() || nextB != b.parts.end()) {
        const bool takesA = nextB == b.parts.end() || (nextA != a.parts.end() && nextA->unknown <= nextB->unknown);
        const bool takesB = nextA == a.parts.end() || (nextB != b.parts.end() && nextB->unknown <= nextA->unknown);
        WidePart part{takesA ? nextA->unknown : nextB->unknown, 0};
        if (takesA)
            part.factor += (nextA++)->factor * factorA;
        if (takesB)
            part.factor += (nextB++)->factor * factorB;
        if (part.factor != 0)
            sum.parts.push_back(std::move(part));
    }
    return sum;
}

std::optional<RationalForm> withinLimits(WideForm form) {
    if (!isWithinLimits(form))
        return std::nullopt;
    return RationalForm(std::move(form));
}

} // namespace

std::size_t costOf(const WideForm& form) {
    constexpr std::size_t call = 8;
    const auto cost = [](const BigInteger& number) {
        const std::size_t words = number.backend().size();
        return call + words * words;
    };
    std::size_t sum = cost(form.constant) + cost(form.denominator);
    for (const WidePart& part : form.parts)
        sum += cost(part.factor);
    return sum;
}

RationalForm::RationalForm(WideForm form) {
    if (form.denominator != 1) {
        BigInteger divisor = gcd(form.denominator, form.constant);
        for (const WidePart& part : form.parts)
            divisor = gcd(divisor, part.factor);
        form.denominator /= divisor;
        form.constant /= divisor;
        for (WidePart& part : form.parts)
            part.factor /= divisor;
    }
    VTSYM_CHECK(form.denominator > 0);
    const bool narrow = form.denominator == 1 && isSmall(form.constant) &&
                        std::ranges::all_of(form.parts, [](const WidePart& part) { return isSmall(part.factor); });
    if (!narrow) {
        wide_ = std::make_shared<const WideForm>(std::move(form));
        return;
    }
    small_.constant = static_cast<std::int64_t>(form.constant);
    for (const WidePart& part : form.parts)
        small_.parts.push_back({part.unknown, static_cast<std::int64_t>(part.factor)});
}

RationalForm RationalForm::of(double real) {
    constexpr int digits = std::numeric_limits<double>::digits;
    int exponent = 0;
    const double fraction = std::frexp(real, &exponent);
    BigInteger mantissa = static_cast<std::int64_t>(std::ldexp(fraction, digits));
    exponent -= digits;
    if (exponent >= 0)
        return RationalForm(WideForm{{}, BigInteger(mantissa << static_cast<unsigned>(exponent))});
    return RationalForm(WideForm{{}, std::move(mantissa), BigInteger(1) << static_cast<unsigned>(-exponent)});
}

WideForm RationalForm::widened() const {
    if (wide_)
        return *wide_;
    WideForm form{{}, small_.constant};
    form.parts.reserve(small_.parts.size());
    for (const LinearPart& part : small_.parts)
        form.parts.push_back({part.unknown, part.factor});
    return form;
}

std::optional<BigInteger> RationalForm::integer() const {
    if (!isConstant() || !isInteger())
        return std::nullopt;
    return wide_ ? wide_->constant : BigInteger(small_.constant);
}

int RationalForm::sign() const {
    return wide_ ? wide_->constant.sign()
                 : static_cast<int>(small_.constant > 0) - static_cast<int>(small_.constant < 0);
}

bool RationalForm::operator==(const RationalForm& other) const {
    if (wide_ && other.wide_)
        return wide_ == other.wide_ || *wide_ == *other.wide_;
    return !wide_ && !other.wide_ && small_ == other.small_;
}

std::optional<RationalForm> combine(const RationalForm& a, std::int64_t factorA, const RationalForm& b,
                                    std::int64_t factorB) {
    if (a.small() != nullptr && b.small() != nullptr)
        if (auto sum = combine(*a.small(), factorA, *b.small(), factorB))
            return RationalForm(*std::move(sum));
    const WideForm left = a.widened();
    const WideForm right = b.widened();
    const BigInteger common = gcd(left.denominator, right.denominator);
    return withinLimits(sumOf(left, right.denominator / common * factorA, right, left.denominator / common * factorB,
                              left.denominator / common * right.denominator));
}

std::optional<RationalForm> scale(const RationalForm& a, const BigInteger& numerator, const BigInteger& denominator) {
    if (a.small() != nullptr && denominator == 1 && isSmall(numerator))
        if (auto product = combine(*a.small(), static_cast<std::int64_t>(numerator), {}, 0))
            return RationalForm(*std::move(product));
    const WideForm form = a.widened();
    const BigInteger factor = denominator < 0 ? BigInteger(-numerator) : numerator;
    return withinLimits(sumOf(form, factor, {}, 0, form.denominator * abs(denominator)));
}

std::optional<RationalForm> multiply(const RationalForm& a, const RationalForm& constant) {
    const WideForm factor = constant.widened();
    return scale(a, factor.constant, factor.denominator);
}

std::optional<RationalForm> divide(const RationalForm& a, const RationalForm& constant) {
    const WideForm divisor = constant.widened();
    return scale(a, divisor.denominator, divisor.constant);
}

BigInteger floorDivide(const BigInteger& value, const BigInteger& divisor) {
    BigInteger quotient = value / divisor;
    if (value < 0 && BigInteger(quotient * divisor) != value)
        --quotient;
    return quotient;
}

} // namespace VT
