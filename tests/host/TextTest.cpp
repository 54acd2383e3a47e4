#include "host/Text.hpp"

#include <gtest/gtest.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

namespace {

std::string utf8(std::u8string_view text) {
    return {text.begin(), text.end()};
}

TEST(Utf16, BecomesUtf8) {
    const struct {
        std::u16string units;
        std::string text;
    } cases[] = {
        {u"", ""},
        {u"N*2+1", "N*2+1"},
        {u"\u007f\u0080\u07ff\u0800\uffff", utf8(u8"\u007f\u0080\u07ff\u0800\uffff")},
        {u"\U00010000\U0001f600\U0010ffff", utf8(u8"\U00010000\U0001f600\U0010ffff")},
        {std::u16string(u"a\0b", 3), std::string("a\0b", 3)},
        {{0xd800}, utf8(u8"\ufffd")},
        {{0xdc00, u'x'}, utf8(u8"\ufffdx")},
        {{0xd800, u'x'}, utf8(u8"\ufffdx")},
        {{0xdc00, 0xd800}, utf8(u8"\ufffd\ufffd")},
        {{0xd800, 0xd83d, 0xde00}, utf8(u8"\ufffd\U0001f600")},
    };

    for (const auto& [units, text] : cases)
        EXPECT_EQ(cvt_ustring_string(units), text);
}

TEST(ShownText, EscapesWhatWouldSpoilATerminal) {
    const struct {
        std::string text;
        std::string shown;
    } cases[] = {
        {"A == 1", "A == 1"},
        {utf8(u8"gr\u00f6\u00dfe \u4e2d \U0001f600"), utf8(u8"gr\u00f6\u00dfe \u4e2d \U0001f600")},
        {std::string("a\0\n\x1b[31m\x7f", 9), "a\\x00\\x0a\\x1b[31m\\x7f"},
        {utf8(u8"\u0085\u202e\ufeff"), "\\xc2\\x85\\xe2\\x80\\xae\\xef\\xbb\\xbf"},
        {"\xff\xc3", "\\xff\\xc3"},
        {"\xc0\x80\xe0\x80\x80\xed\xa0\x80\xf4\x90\x80\x80", // overlong, a surrogate, beyond the last character
         "\\xc0\\x80\\xe0\\x80\\x80\\xed\\xa0\\x80\\xf4\\x90\\x80\\x80"},
    };

    for (const auto& [text, shown] : cases)
        EXPECT_EQ(VT::shownText(text, 1000), shown);
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
