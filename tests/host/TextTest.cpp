// What the embedded host says: diagnostics, log lines, and texts that are safe to show.
#include "host/Text.hpp"
#include "host/Diagnostics.hpp"
#include "host/Log.hpp"
#include "host/Messages.hpp"
#include "tests/support/Cases.hpp"

#include <array>
#include <boost/algorithm/string/replace.hpp>
#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>
#include <set>
#include <sstream>
#include <type_traits>

namespace {

using VT::Testing::CaseRow;
using VT::Testing::casesOf;

constexpr const char* parseError = "Vantor:Variants:ExpressionParseError";

VT::HostDiagnostic parseErrorOf(const std::string& text, std::size_t offset) {
    return vtsvCreateDiagnostic(parseError, {text, std::string(offset + 1, ' ') + "^"}, "", offset);
}

TEST(Diagnostics, CarryWhatTheyWereMadeOf) {
    const std::vector<VT::DiagnosticArgument> arguments{std::string("A == "), std::int64_t{-7}, 0.5};
    const VT::HostDiagnostic made = vtsvCreateDiagnostic("Some:Id", arguments, "Additional.", 5);
    try {
        vtsvThrowIExceptionFromDiagnostic(made);
    } catch (const std::runtime_error& error) {
        const auto* caught = dynamic_cast<const VT::HostDiagnostic*>(&error);
        ASSERT_NE(caught, nullptr);
        EXPECT_EQ(caught->messageId(), "Some:Id");
        EXPECT_EQ(caught->arguments(), arguments);
        EXPECT_EQ(caught->additionalText(), "Additional.");
        EXPECT_EQ(caught->offset(), 5U);
        EXPECT_STREQ(caught->what(), "Some:Id: \"A == \", -7, 0.5 Additional.");
    }
    EXPECT_EQ(vtsvCreateDiagnostic(parseError, {}, "").offset(), std::nullopt);
    static_assert(std::is_nothrow_copy_constructible_v<VT::HostDiagnostic>, "what is thrown is copied");
}

TEST(Diagnostics, ParseErrorsSayWhereAndWhat) {
    for (const CaseRow& row : casesOf("host-texts.txt", "parse errors", 3))
        EXPECT_EQ(parseErrorOf(row[0], std::stoul(row[1])).what(), row[2]) << row[0];
    EXPECT_STREQ(vtsvCreateDiagnostic(parseError, {std::int64_t{3}}, "").what(), // a misfit is shown
                 "Vantor:Variants:ExpressionParseError: 3");
    const VT::HostDiagnostic nowhere = vtsvCreateDiagnostic(parseError, {std::string("A"), std::string("^")}, "");
    EXPECT_STREQ(nowhere.what(), R"(The condition "A" cannot be read at an unknown place.)");
}

TEST(Diagnostics, SentencesAreBoundedWhateverTheArguments) {
    const std::string huge(3'000'000, 'x');
    EXPECT_LT(std::string(parseErrorOf(huge, 1'000'000).what()).size(), 200U);
    const std::vector<VT::DiagnosticArgument> many(1000, huge.substr(0, 10000));
    EXPECT_LT(std::string(vtsvCreateDiagnostic(huge, many, "").what()).size(), 1000U);
}

TEST(Messages, RowsAreSound) {
    std::set<std::string_view> ids;
    for (const VT::MessageInfo& row : VT::messageCatalogue()) {
        EXPECT_TRUE(ids.insert(row.id).second) << row.id << " has two rows";
        EXPECT_EQ(VT::findMessage(row.id), &row);
        std::string rest = boost::replace_all_copy(std::string(row.sentence), "{place}", "");
        for (std::size_t i = 0; i < row.arguments.size(); ++i)
            boost::replace_all(rest, "{" + std::to_string(i) + "}", "");
        EXPECT_EQ(rest.find_first_of("{}"), std::string::npos) << row.id << " speaks of " << rest;
    }
    EXPECT_FALSE(ids.empty());
    EXPECT_EQ(VT::findMessage("Vantor:Variants:"), nullptr);
}

TEST(FatalDiagnostic, EndsTheProcessWithOneLine) {
    EXPECT_EXIT(vtsvFatalDiagnostic("index out of bounds", "base/core/Nodes.cpp", 47, "getInput"),
                testing::KilledBySignal(SIGABRT),
                "^vtsym: fatal: index out of bounds \\(base/core/Nodes.cpp:47, getInput\\)\n$");
}

using foundation::core::log::Level;
using Logger = foundation::core::log::basic_diagnostic_logger<char>;

TEST(Logger, WritesLinesFromItsLevelOn) {
    Logger logger("a::name");
    EXPECT_EQ(logger.level(), Level::Warning);
    const std::array levels{Level::Debug, Level::Info, Level::Warning, Level::Error, Level::Off};
    std::string expected = "a::name: debug: one\na::name: info: two\na::name: warning: three\na::name: error: four\n";
    for (const Level threshold : levels) {
        logger.setLevel(threshold);
        testing::internal::CaptureStderr();
        logger.debug("one");
        logger.info("two");
        logger.warning("three");
        logger.error("four");
        EXPECT_EQ(testing::internal::GetCapturedStderr(), expected);
        expected.erase(0, expected.find('\n') + 1);
        for (const Level level : levels)
            EXPECT_EQ(logger.enabled(level), level >= threshold && level != Level::Off);
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

TEST(Utf16, BecomesUtf8) {
    for (const CaseRow& row : casesOf("host-texts.txt", "utf-16", 2)) {
        std::istringstream listed(row[0]);
        std::u16string units;
        for (std::uint32_t unit = 0; listed >> std::hex >> unit;)
            units += static_cast<char16_t>(unit);
        EXPECT_EQ(cvt_ustring_string(units), row[1]) << row[0];
    }
}

TEST(ShownText, SpoilsNoTerminalAndIsCutBetweenCharacters) {
    for (const CaseRow& row : casesOf("host-texts.txt", "shown", 3))
        EXPECT_EQ(VT::shownText(row[0], std::stoul(row[1])), row[2]) << row[0];
}

RC_GTEST_PROP(ShownText, IsBoundedAndPrintableWhateverTheBytes, (const std::string& bytes)) {
    const std::size_t bound = *rc::gen::inRange<std::size_t>(0, 40);
    const std::string shown = VT::shownText(bytes, bound);
    RC_ASSERT(shown.size() <= bound + 6);
    for (const char c : shown)
        RC_ASSERT((static_cast<unsigned char>(c) >= 0x20 && c != 0x7f));
    if (bytes.size() * 4 <= bound)
        RC_ASSERT(!shown.ends_with("...") || bytes.ends_with("..."));
}

} // namespace
