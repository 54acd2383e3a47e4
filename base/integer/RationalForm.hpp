// Sums of rational multiples of unknowns, exact at any size.
//
// Most forms are small: integers within the bound of linear forms.  They are kept and combined as such; a form with
// larger numbers or with fractions is a shared, immutable wide form.  One value has one representation, so equal forms
// compare equal.
#pragma once

#include "base/integer/BigInteger.hpp"
#include "base/integer/LinearForm.hpp"

#include <memory>
#include <optional>
#include <vector>

namespace VT {

struct WidePart {
    Unknown unknown;
    BigInteger factor; ///< never 0
    bool operator==(const WidePart&) const = default;
};

/// (parts + constant) / denominator, parts in the order of their unknowns' numbers.
struct WideForm {
    std::vector<WidePart> parts;
    BigInteger constant;
    BigInteger denominator = 1; ///< positive, without a divisor common to all numbers

    bool operator==(const WideForm&) const = default;
};

/// What an operation on a form costs, in those on numbers of 64 bits: common divisors take the square of the words.
[[nodiscard]] std::size_t costOf(const WideForm& form);

class RationalForm {
public:
    RationalForm() = default; ///< 0

    RationalForm(LinearForm form) : small_(std::move(form)) {} // NOLINT(google-explicit-constructor): the same value

    explicit RationalForm(BigInteger constant) : RationalForm(WideForm{{}, std::move(constant)}) {}

    /// Parts are in order; common divisors are taken out.
    explicit RationalForm(WideForm form);

    /// A finite real number, exactly.
    [[nodiscard]] static RationalForm of(double real);

    /// The form, where it is small.
    [[nodiscard]] const LinearForm* small() const noexcept { return wide_ ? nullptr : &small_; }

    [[nodiscard]] WideForm widened() const;

    [[nodiscard]] bool isConstant() const noexcept { return wide_ ? wide_->parts.empty() : small_.isConstant(); }

    [[nodiscard]] bool isInteger() const noexcept { return !wide_ || wide_->denominator == 1; }

    /// The constant, where there is nothing else and it is an integer.
    [[nodiscard]] std::optional<BigInteger> integer() const;

    /// -1, 0 or 1 for a constant.
    [[nodiscard]] int sign() const;

    /// What an operation on the form costs.
    [[nodiscard]] std::size_t size() const { return wide_ ? costOf(*wide_) : 1 + small_.parts.size(); }

    bool operator==(const RationalForm& other) const;

private:
    LinearForm small_;
    std::shared_ptr<const WideForm> wide_; ///< none of a small form
};

/// a * factorA + b * factorB; nothing where a number would have more than limits::formBits bits.
[[nodiscard]] std::optional<RationalForm> combine(const RationalForm& a, std::int64_t factorA, const RationalForm& b,
                                                  std::int64_t factorB);
/// a * numerator / denominator, which is not 0; nothing as above.
[[nodiscard]] std::optional<RationalForm> scale(const RationalForm& a, const BigInteger& numerator,
                                                const BigInteger& denominator);

/// The product, or the quotient, by a constant that is not 0 in a quotient.
[[nodiscard]] std::optional<RationalForm> multiply(const RationalForm& a, const RationalForm& constant);
[[nodiscard]] std::optional<RationalForm> divide(const RationalForm& a, const RationalForm& constant);

/// Rounds toward minus infinity; the divisor is positive.
[[nodiscard]] BigInteger floorDivide(const BigInteger& value, const BigInteger& divisor);

} // namespace VT
