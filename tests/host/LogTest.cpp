#include "host/Log.hpp"

#include <gtest/gtest.h>

#include <array>

namespace {

using foundation::core::log::Level;
using Logger = foundation::core::log::basic_diagnostic_logger<char>;

TEST(Logger, WritesLinesFromItsLevelOn) {
    Logger logger("a::name");
    EXPECT_EQ(logger.level(), Level::Warning);
    const std::array levels{Level::Debug, Level::Info, Level::Warning, Level::Error};
    const std::array lines{"a::name: debug: one\n", "a::name: info: two\n", "a::name: warning: three\n",
                           "a::name: error: four\n"};
    for (const Level threshold : {Level::Debug, Level::Info, Level::Warning, Level::Error, Level::Off}) {
        logger.setLevel(threshold);
        testing::internal::CaptureStderr();
        logger.debug("one");
        logger.info("two");
        logger.warning("three");
        logger.error("four");
        std::string expected;
        for (std::size_t i = 0; i < levels.size(); ++i) {
            EXPECT_EQ(logger.enabled(levels[i]), levels[i] >= threshold);
            expected += levels[i] >= threshold ? lines[i] : "";
        }
        EXPECT_EQ(testing::internal::GetCapturedStderr(), expected);
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
