// Adds multiples of linear forms by merging their sorted parts.
//
// Every product and sum is checked: a number beyond `limits::formNumber` refuses the whole combination instead of
// rounding it. Linear in the parts of both forms.
#include "base/integer/LinearForm.hpp"

#include "base/core/Check.hpp"

#include <algorithm>

namespace VT {

namespace {

/// a * b + c, or nothing where it leaves the bound.
std::optional<std::int64_t> multiplyAdd(std::int64_t a, std::int64_t b, std::int64_t c) {
    std::int64_t result = 0;
    if (__builtin_mul_overflow(a, b, &result) || __builtin_add_overflow(result, c, &result) || !isWithinBound(result))
        return std::nullopt;
    return result;
}

} // namespace

std::optional<LinearForm> combine(const LinearForm& a, std::int64_t factorA, const LinearForm& b,
                                  std::int64_t factorB) {
    LinearForm sum;
    const auto product = multiplyAdd(a.constant, factorA, 0);
    const auto constant = product ? multiplyAdd(b.constant, factorB, *product) : std::nullopt;
    if (!constant)
        return std::nullopt;
    sum.constant = *constant;
    auto nextA = a.parts.begin();
    auto nextB = b.parts.begin();
    while (nextA != a.parts.end() || nextB != b.parts.end()) {
        const bool takesA = nextB == b.parts.end() || (nextA != a.parts.end() && nextA->unknown <= nextB->unknown);
        const bool takesB = nextA == a.parts.end() || (nextB != b.parts.end() && nextB->unknown <= nextA->unknown);
        const Unknown unknown = takesA ? nextA->unknown : nextB->unknown;
        std::optional<std::int64_t> factor = 0;
        if (takesA)
            factor = multiplyAdd((nextA++)->factor, factorA, 0);
        if (takesB && factor)
            factor = multiplyAdd((nextB++)->factor, factorB, *factor);
        if (!factor)
            return std::nullopt;
        if (*factor != 0)
            sum.parts.push_back({unknown, *factor});
    }
    VTSYM_CHECK(std::ranges::is_sorted(sum.parts, {}, &LinearPart::unknown));
    return sum;
}

} // namespace VT
