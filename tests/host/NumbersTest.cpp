#include "host/Numbers.hpp"

#include <gtest/gtest.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

#include <bit>
#include <clocale>
#include <cmath>
#include <cstdlib>
#include <limits>

namespace {

using VT::NumberError;

struct Written {
    double value;
    const char* text;
};

class Dtoa : public testing::TestWithParam<Written> {};

TEST_P(Dtoa, WritesAsExpected) {
    EXPECT_EQ(vtsv_dtoa(GetParam().value, true), GetParam().text);
}

constexpr double infinity = std::numeric_limits<double>::infinity();

INSTANTIATE_TEST_SUITE_P(
    Notation, Dtoa,
    testing::Values(Written{0.0, "0"}, Written{-0.0, "-0"}, Written{2.0, "2"}, Written{-2.5, "-2.5"},
                    Written{0.1, "0.1"}, Written{1e20, "100000000000000000000"}, Written{1e21, "1e+21"},
                    Written{123456789012345678.0, "123456789012345680"}, Written{9.9e20, "990000000000000000000"},
                    Written{1e22, "1e+22"}, Written{1e-5, "0.00001"}, Written{1.25e-5, "0.0000125"},
                    Written{9.99e-6, "9.99e-06"}, Written{1.5e-7, "1.5e-07"}, Written{-1e100, "-1e+100"},
                    Written{1.7976931348623157e308, "1.7976931348623157e+308"}, Written{5e-324, "5e-324"},
                    Written{infinity, "Inf"}, Written{-infinity, "-Inf"},
                    Written{std::numeric_limits<double>::quiet_NaN(), "NaN"}));

TEST(Dtoa, SeventeenDigitsWhereNotShortest) {
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
    const std::string manyZeros(400, '0');

    const struct {
        std::string text;
        NumberError error;
        double value;
    } cases[] = {
        {"1.7976931348623158e308", NumberError::None, 1.7976931348623157e308},
        {"1.7976931348623159e308", NumberError::Overflow, 0},
        {"-1e309", NumberError::Overflow, 0},
        {"1.e999999999", NumberError::Overflow, 0},
        {"1e99999999999999999999999999", NumberError::Overflow, 0},
        {"1e-99999999999999999999999999", NumberError::None, 0},
        {"1e-400", NumberError::None, 0},
        {"0e99999999999999999999999999", NumberError::None, 0},
        {"2e-324", NumberError::None, 0},
        {"3e-324", NumberError::None, 5e-324},
        {"0." + manyZeros + "1e401", NumberError::None, 1},
        {"1" + manyZeros + "e-400", NumberError::None, 1},
        {"1" + manyZeros, NumberError::Overflow, 0},
        {"0." + manyZeros + "1", NumberError::None, 0},
        {"2.", NumberError::None, 2},
        {".5", NumberError::None, 0.5},
        {"9007199254740993", NumberError::None, 9007199254740992.0}, // a tie goes to even
        {"9007199254740993.0000000000000000000000000000000001", NumberError::None, 9007199254740994.0},
    };

    for (const auto& [text, error, value] : cases) {
        const auto read = vtsv_strtod(text);
        EXPECT_EQ(read.error, error) << text.substr(0, 40);
        EXPECT_EQ(read.value, value) << text.substr(0, 40);
    }
    EXPECT_TRUE(std::signbit(vtsv_strtod("-1e-400").value));
}

TEST(Strtod, RefusesWhatIsNoDecimalNumber) {
    for (const char* text : {"", "-", ".", "+1", " 1", "1 ", "1x", "0x10", "inf", "-inf", "nan", "infinity", "1e",
                             "1e+", "e5", "--1", "1,5", "1..2"})
        EXPECT_EQ(vtsv_strtod(text).error, NumberError::Syntax) << text;
}

TEST(Strtod, LongTextsAreReadInWhole) {
    const std::string digits(3'000'000, '9');
    EXPECT_EQ(vtsv_strtod(digits).error, NumberError::Overflow);
    EXPECT_EQ(vtsv_strtod("0." + digits).value, 1.0);
    EXPECT_EQ(vtsv_strtod(digits + "e-3000000").value, 1.0);
}

TEST(Numbers, DoNotDependOnTheLocale) {
    const std::string before = std::setlocale(LC_ALL, nullptr);
    for (const char* name : {"de_DE.UTF-8", "fr_FR.UTF-8", "C.UTF-8"}) {
        if (std::setlocale(LC_ALL, name) == nullptr)
            continue; // not installed
        EXPECT_EQ(vtsv_dtoa(1234.5, true), "1234.5");
        EXPECT_EQ(vtsv_strtod("1234.5").value, 1234.5);
    }
    std::setlocale(LC_ALL, before.c_str());
}

} // namespace
