#include "host/Numbers.hpp"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <bit>
#include <cmath>
#include <cstdlib>

namespace {

using VT::NumberError;

TEST(Dtoa, Notation) {
    for (const char* text : {"0", "-0", "-2.5", "100000000000000000000", "1e+21", "990000000000000000000", "0.00001",
                             "0.0000125", "9.99e-06", "-1e+100", "5e-324", "Inf", "-Inf", "NaN"})
        EXPECT_EQ(vtsv_dtoa(std::strtod(text, nullptr), true), text);
    EXPECT_EQ(vtsv_dtoa(0.1, false), "0.10000000000000001");
    EXPECT_EQ(vtsv_dtoa(2.0, false), "2");
    EXPECT_EQ(vtsv_dtoa(-1e22, false), "-1e+22");
}

/// Any double: random bits find the corners of the format better than random values do.
double anyDouble() {
    return std::bit_cast<double>(*rc::gen::arbitrary<std::uint64_t>());
}

RC_GTEST_PROP(Numbers, WhatIsWrittenReadsBack, ()) {
    const double value = anyDouble();
    RC_PRE(std::isfinite(value));
    for (const bool shortest : {true, false}) {
        const auto read = vtsv_strtod(vtsv_dtoa(value, shortest));
        RC_ASSERT(read.error == NumberError::None);
        RC_ASSERT(std::bit_cast<std::uint64_t>(read.value) == std::bit_cast<std::uint64_t>(value));
    }
}

RC_GTEST_PROP(Numbers, NoFewerDigitsWouldDo, ()) {
    const double value = anyDouble();
    RC_PRE(std::isfinite(value));
    std::string digits;
    for (const char c : vtsv_dtoa(value, true).substr(0, vtsv_dtoa(value, true).find('e')))
        if (c >= '0' && c <= '9' && (c != '0' || !digits.empty()))
            digits += c;
    digits.resize(digits.find_last_not_of('0') + 1);
    if (digits.size() > 1) {
        char shorter[64];
        std::snprintf(shorter, sizeof shorter, "%.*e", static_cast<int>(digits.size()) - 2, value);
        RC_ASSERT(std::strtod(shorter, nullptr) != value);
    }
}

RC_GTEST_PROP(Numbers, ReadsAsTheCLibraryDoes, ()) {
    std::string text =
        *rc::gen::nonEmpty(rc::gen::container<std::string>(rc::gen::inRange('0', static_cast<char>('9' + 1))));
    if (*rc::gen::arbitrary<bool>())
        text.insert(*rc::gen::inRange<std::size_t>(0, text.size() + 1), 1, '.');
    if (*rc::gen::arbitrary<bool>())
        text += "e" + std::to_string(*rc::gen::inRange(-400, 400));
    const double expected = std::strtod(text.c_str(), nullptr);
    const auto read = vtsv_strtod(text);
    RC_ASSERT(read.error == (std::isinf(expected) ? NumberError::Overflow : NumberError::None));
    if (std::isfinite(expected))
        RC_ASSERT(read.value == expected);
}

TEST(Strtod, CornersOfTheRange) {
    const std::string zeros(400, '0');
    const std::string digits(3'000'000, '9');
    for (const auto& [text, value] : std::vector<std::pair<std::string, double>>{
             {"1.7976931348623158e308", 1.7976931348623157e308},
             {"1e-99999999999999999999999999", 0},
             {"0e99999999999999999999999999", 0},
             {"2e-324", 0},
             {"3e-324", 5e-324},
             {"0." + zeros + "1e401", 1},
             {"1" + zeros + "e-400", 1},
             {"0." + zeros + "1", 0},
             {"0." + digits, 1},
             {digits + "e-3000000", 1},
             {"9007199254740993", 9007199254740992.0}, // a tie goes to even
             {"9007199254740993.0000000000000000000000000000000001", 9007199254740994.0}}) {
        const auto read = vtsv_strtod(text);
        EXPECT_EQ(read.error, NumberError::None) << text.substr(0, 40);
        EXPECT_EQ(read.value, value) << text.substr(0, 40);
    }
    for (const std::string& text : {std::string("1.7976931348623159e308"), std::string("-1e309"),
                                    std::string("1e99999999999999999999999999"), "1" + zeros, digits})
        EXPECT_EQ(vtsv_strtod(text).error, NumberError::Overflow) << text.substr(0, 40);
    EXPECT_TRUE(std::signbit(vtsv_strtod("-1e-400").value));
}

TEST(Strtod, RefusesWhatIsNoDecimalNumber) {
    for (const char* text : {"", "-", ".", "+1", " 1", "1 ", "1x", "0x10", "inf", "-inf", "nan", "infinity", "1e",
                             "1e+", "e5", "--1", "1,5", "1..2"})
        EXPECT_EQ(vtsv_strtod(text).error, NumberError::Syntax) << text;
}

} // namespace
