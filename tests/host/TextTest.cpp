// What the embedded host says: diagnostics, log lines, and texts that are safe to show.
#include "host/Text.hpp"
#include "host/Diagnostics.hpp"
#include "host/Log.hpp"
#include "host/Messages.hpp"

#include <array>
#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>
#include <set>
#include <type_traits>

namespace {

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
    EXPECT_STREQ(parseErrorOf("A === 3", 4).what(),
                 R"(The condition "A === 3" cannot be read at byte 5, before "= 3".)");
    EXPECT_STREQ(parseErrorOf("A\n\x1b[2J", 1).what(),
                 R"(The condition "A\x0a\x1b[2J" cannot be read at byte 2, before "\x0a\x1b[2J".)");
    EXPECT_STREQ(parseErrorOf("A", 7).what(), R"(The condition "A" cannot be read at byte 8.)");
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
        std::string_view rest = row.sentence;
        for (std::size_t open = rest.find('{'); open != std::string_view::npos; open = rest.find('{')) {
            const std::size_t close = rest.find('}', open);
            ASSERT_NE(close, std::string_view::npos) << row.id;
            const std::string_view name = rest.substr(open + 1, close - open - 1);
            const bool known = name == "place" || (name.size() == 1 && name[0] >= '0' &&
                                                   static_cast<std::size_t>(name[0] - '0') < row.arguments.size());
            EXPECT_TRUE(known) << row.id << " speaks of {" << name << '}';
            rest.remove_prefix(close + 1);
        }
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

std::string utf8(std::u8string_view text) {
    return {text.begin(), text.end()};
}

TEST(Utf16, BecomesUtf8) {
    for (const auto& [units, text] : std::initializer_list<std::pair<std::u16string, std::u8string>>{
             {u"", u8""},
             {u"\u007f\u0080\u07ff\u0800\uffff", u8"\u007f\u0080\u07ff\u0800\uffff"},
             {u"\U00010000\U0001f600\U0010ffff", u8"\U00010000\U0001f600\U0010ffff"},
             {std::u16string(u"a\0b", 3), std::u8string(u8"a\0b", 3)},
             {{0xd800}, u8"\ufffd"},
             {{0xdc00, u'x'}, u8"\ufffdx"},
             {{0xd800, u'x'}, u8"\ufffdx"},
             {{0xdc00, 0xd800}, u8"\ufffd\ufffd"},
             {{0xd800, 0xd83d, 0xde00}, u8"\ufffd\U0001f600"},
         })
        EXPECT_EQ(cvt_ustring_string(units), utf8(text));
}

/// The UTF-8 of one character, as the escapes of its bytes.
std::string escaped(const std::string& text) {
    std::string shown;
    for (const char c : text) {
        char escape[5];
        std::snprintf(escape, sizeof escape, "\\x%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
        shown += escape;
    }
    return shown;
}

TEST(ShownText, EscapesWhatWouldSpoilATerminal) {
    for (const std::string& plain : {std::string(" ~A == 1"), utf8(u8"gr\u00f6\u00dfe \u4e2d \U0001f600"),
                                     utf8(u8"\u00a0\u00ac\u00ae\u061b\u200a\u2010\u2027\u202f\u205f\u2070\ufffc\ufffd"),
                                     utf8(u8"\ud7ff\ue000\U000dffff\U000e0080\U0010ffff")})
        EXPECT_EQ(VT::shownText(plain, 1000), plain);
    for (const std::string& spoiling :
         {std::string("\0\t\n\x1b\x1f\x7f", 6), utf8(u8"\u0080\u009f\u00ad\u061c\u180e\u200b\u200e\u200f\u2028\u202e"),
          utf8(u8"\u2060\u2066\u206f\ufeff\ufff9\ufffb\U000e0000\U000e0041\U000e007f"), std::string("\xff\xc3"),
          std::string("\xc0\x80\xe0\x80\x80\xed\xa0\x80\xf4\x90\x80\x80")}) // overlong, a surrogate, beyond the last
        EXPECT_EQ(VT::shownText(spoiling, 1000), escaped(spoiling));
    EXPECT_EQ(VT::shownText("a\n\x1b[31m"), "a\\x0a\\x1b[31m");
}

TEST(ShownText, IsCutBetweenCharacters) {
    EXPECT_EQ(VT::shownText("abcdef", 6), "abcdef");
    EXPECT_EQ(VT::shownText("abcdefg", 6), "abcdef...");
    EXPECT_EQ(VT::shownText(utf8(u8"abcd\u4e2d"), 6), "abcd...");
    EXPECT_EQ(VT::shownText("abc", 0), "...");
    EXPECT_EQ(VT::shownText("", 0), "");
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
