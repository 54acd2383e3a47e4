// The real literals of the condition grammar.
#pragma once

#include <boost/spirit/include/qi_real.hpp>

namespace VT::Parser {

/// Where a real literal ends: an optional sign, digits with a decimal point, digits on one side of it at least, and an
/// exponent where digits follow the e.  Without a point there is none, nor are there names for infinity and NaN.
///
/// Digits are passed over, for sums of digits are not rounded right: the value is that of the characters.
template <class Value>
struct strict_real_policies : boost::spirit::qi::strict_real_policies<Value> {
    template <class Place, class Digits>
    static bool parse_n(Place& first, const Place& last, Digits&) {
        const Place start = first;
        if (skipDigits(first, last) && first != last && *first == '.')
            return true;
        first = start;
        return false;
    }

    template <class Place, class Digits>
    static bool parse_frac_n(Place& first, const Place& last, Digits&, int&) {
        return skipDigits(first, last);
    }

    template <class Place>
    static bool parse_exp_n(Place& first, const Place& last, int&) {
        if (first != last && (*first == '+' || *first == '-'))
            ++first;
        return skipDigits(first, last);
    }

    template <class Place, class Number>
    static bool parse_nan(Place&, const Place&, Number&) {
        return false;
    }

    template <class Place, class Number>
    static bool parse_inf(Place&, const Place&, Number&) {
        return false;
    }

private:
    /// Whether there were any.
    template <class Place>
    static bool skipDigits(Place& first, const Place& last) {
        const Place start = first;
        while (first != last && *first >= '0' && *first <= '9')
            ++first;
        return first != start;
    }
};

} // namespace VT::Parser
