// The real literals of the condition grammar.
#pragma once

#include <boost/spirit/include/qi_real.hpp>

namespace VT::Parser {

/// The extent of a real literal: an optional sign, digits with a decimal point and digits on at least one side of it,
/// and an exponent where digits follow the e.  A number without a point is not a real literal; infinity and NaN have no
/// names.
///
/// Digits are only passed over: adding them up would round wrongly, so the value is converted from the characters.
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
    /// Returns whether there were any.
    template <class Place>
    static bool skipDigits(Place& first, const Place& last) {
        const Place start = first;
        while (first != last && *first >= '0' && *first <= '9')
            ++first;
        return first != start;
    }
};

} // namespace VT::Parser
