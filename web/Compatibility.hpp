// What the C++20 library of emscripten 3.1.6 lacks and the sources use: range algorithms, bit_cast, numbers from text.
//
// Included before every source.  Each algorithm is the classic one with projections on top; only the forms in use are
// there, and a missing one is an error of compilation.  Goes when Debian's emscripten brings a complete library.
#pragma once

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <iterator>
#include <memory>
#include <string>

namespace std {

template <class To, class From>
constexpr To bit_cast(const From& from) noexcept {
    static_assert(sizeof(To) == sizeof(From));
    return __builtin_bit_cast(To, from);
}

template <class T>
unique_ptr<T> make_unique_for_overwrite(size_t count) {
    return unique_ptr<T>(new remove_extent_t<T>[count]);
}

/// Reads a number by strtod, which needs a terminated text.
inline from_chars_result from_chars(const char* first, const char* last, double& value,
                                    chars_format format = chars_format::general) {
    const bool isNumber = first != last && *first != '+' && !isspace(static_cast<unsigned char>(*first));
    const string prefix = format == chars_format::hex ? "0x" : "";
    const string text = prefix + string(first, last);
    char* end = nullptr;
    const double read = isNumber ? strtod(text.c_str(), &end) : 0;
    const auto length = end == nullptr ? 0 : end - text.c_str() - static_cast<ptrdiff_t>(prefix.size());
    if (length <= 0)
        return {first, errc::invalid_argument};
    if (isinf(read))
        return {first + length, errc::result_out_of_range};
    value = read;
    return {first + length, errc{}};
}

/// Writes a number as d.ddde+dd.
inline to_chars_result to_chars(char* first, char* last, double value, chars_format, int precision) {
    const int length = snprintf(first, static_cast<size_t>(last - first), "%.*e", precision, value);
    return length < last - first ? to_chars_result{first + length, errc{}}
                                 : to_chars_result{last, errc::value_too_large};
}

/// The same with as few digits as read back as the same number.
inline to_chars_result to_chars(char* first, char* last, double value, chars_format format) {
    for (int precision = 0;; ++precision) {
        const to_chars_result written = to_chars(first, last, value, format, precision);
        if (precision == 16 || strtod(first, nullptr) == value)
            return written;
    }
}

namespace ranges {

// Closures of the classic algorithms: of a predicate, of a value to equal, of an order.
template <class F, class P>
constexpr auto on(F& f, P& projection) {
    return [&](auto&& each) -> decltype(auto) { return invoke(f, invoke(projection, each)); };
}

template <class T, class P>
constexpr auto is(const T& value, P& projection) {
    return [&](auto&& each) { return invoke(projection, each) == value; };
}

template <class C, class P>
constexpr auto by(C& order, P& projection) {
    return [&](auto&& a, auto&& b) { return invoke(order, invoke(projection, a), invoke(projection, b)); };
}

template <class R>
concept Sequence = requires(R& r) {
    std::begin(r);
};

// clang-format off
#define VTSYM_PREDICATE(name) \
    template <Sequence R, class F, class P = identity> \
    constexpr auto name(R&& r, F f, P p = {}) { return std::name(std::begin(r), std::end(r), on(f, p)); } \
    template <class I, class F, class P = identity> requires input_or_output_iterator<I> \
    constexpr auto name(I first, I last, F f, P p = {}) { return std::name(first, last, on(f, p)); }
VTSYM_PREDICATE(all_of) VTSYM_PREDICATE(any_of) VTSYM_PREDICATE(none_of) VTSYM_PREDICATE(find_if) VTSYM_PREDICATE(count_if)
VTSYM_PREDICATE(partition_point) VTSYM_PREDICATE(stable_partition) VTSYM_PREDICATE(for_each)
#undef VTSYM_PREDICATE

#define VTSYM_VALUE(name, classic) \
    template <Sequence R, class T, class P = identity> \
    constexpr auto name(R&& r, const T& value, P p = {}) { return std::classic(std::begin(r), std::end(r), is(value, p)); } \
    template <class I, class T, class P = identity> requires input_or_output_iterator<I> \
    constexpr auto name(I first, I last, const T& value, P p = {}) { return std::classic(first, last, is(value, p)); }
VTSYM_VALUE(find, find_if) VTSYM_VALUE(count, count_if)
#undef VTSYM_VALUE

#define VTSYM_ORDERED(name) \
    template <Sequence R, class C = ranges::less, class P = identity> \
    constexpr auto name(R&& r, C c = {}, P p = {}) { return std::name(std::begin(r), std::end(r), by(c, p)); } \
    template <class I, class C = ranges::less, class P = identity> requires input_or_output_iterator<I> \
    constexpr auto name(I first, I last, C c = {}, P p = {}) { return std::name(first, last, by(c, p)); }
VTSYM_ORDERED(sort) VTSYM_ORDERED(stable_sort) VTSYM_ORDERED(is_sorted) VTSYM_ORDERED(min_element) VTSYM_ORDERED(max_element)
#undef VTSYM_ORDERED
    // clang-format on

    template <class I, class T, class C = ranges::less, class P = identity>
requires input_or_output_iterator<I>

constexpr I lower_bound(I first, I last, const T& value, C c = {}, P p = {}) {
    return std::lower_bound(first, last, value, [&](auto&& each, const T& v) { return invoke(c, invoke(p, each), v); });
}

template <Sequence R, class T, class C = ranges::less, class P = identity>
constexpr auto lower_bound(R&& r, const T& value, C c = {}, P p = {}) {
    return ranges::lower_bound(std::begin(r), std::end(r), value, c, p);
}

template <class I, class T, class C = ranges::less, class P = identity>
requires input_or_output_iterator<I>

constexpr I upper_bound(I first, I last, const T& value, C c = {}, P p = {}) {
    return std::upper_bound(first, last, value, [&](const T& v, auto&& each) { return invoke(c, v, invoke(p, each)); });
}

template <Sequence R, class T, class C = ranges::less, class P = identity>
constexpr auto upper_bound(R&& r, const T& value, C c = {}, P p = {}) {
    return ranges::upper_bound(std::begin(r), std::end(r), value, c, p);
}

template <Sequence R, class T, class C = ranges::less, class P = identity>
constexpr bool binary_search(R&& r, const T& value, C c = {}, P p = {}) {
    const auto found = ranges::lower_bound(r, value, c, p);
    return found != std::end(r) && !invoke(c, value, invoke(p, *found));
}

template <Sequence R, class E = ranges::equal_to>
constexpr auto adjacent_find(R&& r, E equal = {}) {
    return std::adjacent_find(std::begin(r), std::end(r), equal);
}

template <class I>
struct Found {
    I first, last;

    I begin() const { return first; }

    I end() const { return last; }
};

template <Sequence R>
constexpr auto unique(R&& r) {
    return Found<decltype(std::begin(r))>{std::unique(std::begin(r), std::end(r)), std::end(r)};
}

template <Sequence A, Sequence B, class E = ranges::equal_to, class P = identity, class Q = identity>
constexpr bool equal(A&& a, B&& b, E e = {}, P p = {}, Q q = {}) {
    return std::equal(std::begin(a), std::end(a), std::begin(b), std::end(b),
                      [&](auto&& x, auto&& y) { return invoke(e, invoke(p, x), invoke(q, y)); });
}

template <Sequence A, Sequence B, class O>
constexpr void set_intersection(A&& a, B&& b, O out) {
    std::set_intersection(std::begin(a), std::end(a), std::begin(b), std::end(b), out);
}

template <Sequence A, Sequence B, class O>
constexpr void set_difference(A&& a, B&& b, O out) {
    std::set_difference(std::begin(a), std::end(a), std::begin(b), std::end(b), out);
}

template <Sequence R, class T>
constexpr void fill(R&& r, const T& value) {
    std::fill(std::begin(r), std::end(r), value);
}

template <Sequence R>
constexpr void reverse(R&& r) {
    std::reverse(std::begin(r), std::end(r));
}

template <Sequence R, class T>
constexpr void replace(R&& r, const T& from, const T& to) {
    std::replace(std::begin(r), std::end(r), from, to);
}

template <Sequence R, class O>
constexpr void copy(R&& r, O out) {
    std::copy(std::begin(r), std::end(r), out);
}

template <Sequence R, class O, class F>
constexpr void copy_if(R&& r, O out, F f) {
    std::copy_if(std::begin(r), std::end(r), out, f);
}

template <Sequence R, class O, class F>
constexpr void transform(R&& r, O out, F f) {
    std::transform(std::begin(r), std::end(r), out, [&](auto&& each) { return invoke(f, each); });
}

template <Sequence A, Sequence B, class O, class C>
constexpr void merge(A&& a, B&& b, O out, C c) {
    std::merge(std::begin(a), std::end(a), std::begin(b), std::end(b), out, c);
}

} // namespace ranges

} // namespace std

_LIBCPP_BEGIN_NAMESPACE_STD

/// `range | views::reverse`
namespace views {
struct Reverse {};

inline constexpr Reverse reverse;

template <class R>
struct Reversed {
    R& range;

    auto begin() const { return std::rbegin(range); }

    auto end() const { return std::rend(range); }
};

template <class R>
Reversed<R> operator|(R& range, Reverse) {
    return {range};
}
} // namespace views

_LIBCPP_END_NAMESPACE_STD
