#include "host/Numbers.hpp"
#include "tests/support/Cases.hpp"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <bit>
#include <cmath>
#include <cstdlib>

namespace {

using VT::NumberError;

TEST(Dtoa, Notation) {
    for (const VT::Testing::CaseRow& row : VT::Testing::casesOf("numbers.txt", "shortest", 1))
        EXPECT_EQ(vtsv_dtoa(std::strtod(row[0].c_str(), nullptr), true), row[0]);
    EXPECT_EQ(vtsv_dtoa(0.1, false), "0.10000000000000001");
    EXPECT_EQ(vtsv_dtoa(2.0, false), "2");
    EXPECT_EQ(vtsv_dtoa(-1e22, false), "-1e+22");
}

/// Random bits find the corners of the format better than random values do.
RC_GTEST_PROP(Numbers, WhatIsWrittenReadsBackAndHasNoDigitTooMany, ()) {
    const auto value = std::bit_cast<double>(*rc::gen::arbitrary<std::uint64_t>());
    RC_PRE(std::isfinite(value));
    for (const bool shortest : {true, false}) {
        const auto read = vtsv_strtod(vtsv_dtoa(value, shortest));
        RC_ASSERT(read.error == NumberError::None);
        RC_ASSERT(std::bit_cast<std::uint64_t>(read.value) == std::bit_cast<std::uint64_t>(value));
    }
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

TEST(Strtod, ReadsDecimalNumbersOnly) {
    for (const VT::Testing::CaseRow& row : VT::Testing::casesOf("numbers.txt", "reading", 2)) {
        const auto read = vtsv_strtod(row[0]);
        const NumberError error = row[1] == "overflow" ? NumberError::Overflow
                                  : row[1] == "syntax" ? NumberError::Syntax
                                                       : NumberError::None;
        EXPECT_EQ(read.error, error) << row[0];
        if (error == NumberError::None) {
            const double expected = std::strtod(row[1].c_str(), nullptr);
            EXPECT_EQ(std::bit_cast<std::uint64_t>(read.value), std::bit_cast<std::uint64_t>(expected)) << row[0];
        }
    }
}

TEST(Strtod, LongTexts) {
    const std::string zeros(400, '0');
    const std::string digits(3'000'000, '9');
    for (const std::string& one : {"0." + zeros + "1e401", "1" + zeros + "e-400", "0." + digits, digits + "e-3000000"})
        EXPECT_TRUE(vtsv_strtod(one).error == NumberError::None && vtsv_strtod(one).value == 1) << one.substr(0, 40);
    EXPECT_EQ(vtsv_strtod("0." + zeros + "1").error, NumberError::None);
    EXPECT_EQ(vtsv_strtod("0." + zeros + "1").value, 0);
    for (const std::string& text : {"1" + zeros, digits})
        EXPECT_EQ(vtsv_strtod(text).error, NumberError::Overflow) << text.substr(0, 40);
}

} // namespace
