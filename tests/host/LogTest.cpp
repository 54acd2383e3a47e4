#include "host/Log.hpp"

#include <gtest/gtest.h>

#include <array>

namespace {

using foundation::core::log::Level;
using Logger = foundation::core::log::basic_diagnostic_logger<char>;

constexpr std::array levels{Level::Debug, Level::Info, Level::Warning, Level::Error};

std::string linesAt(Level threshold) {
    Logger logger("a::name");
    logger.setLevel(threshold);
    testing::internal::CaptureStderr();
    logger.debug("one");
    logger.info("two");
    logger.warning("three");
    logger.error("four");
    return testing::internal::GetCapturedStderr();
}

TEST(Logger, WritesLinesFromItsLevelOn) {
    const std::string one = "a::name: debug: one\n";
    const std::string two = "a::name: info: two\n";
    const std::string three = "a::name: warning: three\n";
    const std::string four = "a::name: error: four\n";
    EXPECT_EQ(linesAt(Level::Debug), one + two + three + four);
    EXPECT_EQ(linesAt(Level::Info), two + three + four);
    EXPECT_EQ(linesAt(Level::Warning), three + four);
    EXPECT_EQ(linesAt(Level::Error), four);
    EXPECT_EQ(linesAt(Level::Off), "");
}

TEST(Logger, TellsWhetherALineIsWorthItsMaking) {
    Logger logger("a::name");
    EXPECT_EQ(logger.level(), Level::Warning);
    for (const Level threshold : levels) {
        logger.setLevel(threshold);
        for (const Level level : levels)
            EXPECT_EQ(logger.enabled(level), level >= threshold);
        EXPECT_FALSE(logger.enabled(Level::Off));
    }
}

TEST(Logger, ALineStaysALineWhateverIsInIt) {
    Logger logger("a::name");
    testing::internal::CaptureStderr();
    logger.error("{} %s \n\x1b[2J" + std::string(1'000'000, 'x'));
    const std::string written = testing::internal::GetCapturedStderr();
    EXPECT_TRUE(written.starts_with("a::name: error: {} %s \\x0a\\x1b[2Jxxx")) << written.substr(0, 100);
    EXPECT_EQ(written.find('\n'), written.size() - 1);
    EXPECT_LT(written.size(), 5000U);
}

} // namespace
