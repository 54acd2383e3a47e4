// Texts that are no expressions: where parsing stops and what it tells.
#include "tests/quill/TreeText.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

TEST(QuillFailures, PlaceAndReason) {
    struct Group {
        std::string_view reason;
        std::vector<std::string> texts; ///< with a ` at the place of the failure
    };

    const std::vector<Group> groups = {
        {"the text ends where a value must follow",
         {"`", "  `", "% only a comment`", "...`", "a +`", "-`", "a:`", "[1 -`", "@(a)`"}},
        {"a value is missing",
         {"a + `* b", "a == `~= b", "a && `&& b", "a &&`& b", "`* a", "(`)", "(`;)", "`:", "a(`:)", "f(`,1)", "f(1,`)",
          "[1,`,2]", "[`,1]", "[1,`]", "[1,`;2]", "[1 -`]", "`)", "`$", std::string("`\0", 2)}},
        {"a closing ) is missing", {"f(1`", "f(1`]", "f(`]"}},
        {"a closing ] is missing", {"[1`)"}},
        {"a closing } is missing", {"{1`"}},
        {"this bracket has not been opened", {"a`)", "a`]"}},
        {"a comma stands only between arguments and between elements", {"a`, b", "(a`, b)"}},
        {"a semicolon stands only between the rows of a matrix or of a cell array", {"a`;", "f(a`; b)", "c{a`; b}"}},
        {"an operator is missing",
         {"a `b",    "1 `2",        "12`abc",       "1`e+",   "0`x",    "1.5`.5",  "a`.5",   "2`ij",
          "1.5`.x",  "2`(a)",       "a'`(1)",       "a'`.b",  "@f`(1)", "'a'`(1)", "a `'b'", "a `'",
          "\"a\"`'", "['a'`\"b\"]", "[1 2](1)`[3]", "a `~ b", "a `? b", "a `# b",  "a`.1",   std::string("a`\0b", 4)}},
        {"a single = is no operator; == compares", {"a `= b", "a `="}},
        {"a field name is missing", {"a . `", "a.`(b)"}},
        {"end is no field name", {"a.`end"}},
        {"end stands only among the arguments of an index", {"`end", "[1 `end]", "f(1) + `end"}},
        {"the quotes are not closed", {"`'abc", "a + `\"it''s", "`'''"}},
        {"a function name or parameters in parentheses are missing behind @", {"@`"}},
        {"end is no function name", {"@`end"}},
        {"a parameter name is missing", {"@(`1) x", "@(a,`) x", "@(`"}},
        {"end is no parameter name", {"@(`end) x"}},
        {"a , or ) is missing behind the parameter", {"@(a `b) x", "@(a`"}},
        {"characters outside ASCII stand only in quotes and comments", {"a`\xC3\xA4", "`\xC3\xA4", "a +`\xA0 b"}},
    };
    QuillReading reading;
    for (const auto& [reason, texts] : groups) {
        for (std::string text : texts) {
            const std::size_t position = text.find('`');
            text.erase(position, 1);
            EXPECT_EQ(reading.read(text), nullptr) << text;
            EXPECT_EQ(reading.failure().position, position) << text;
            EXPECT_EQ(reading.failure().reason, reason) << text;
        }
    }
    EXPECT_NE(reading.read("a"), nullptr);
    EXPECT_EQ(reading.failure().reason, "");
}

TEST(QuillFailures, ATextUpToNul) {
    const auto parser = PARSER_T<char>::create(256);
    const char text[] = "a + b\0 )";
    const QuillNode* const tree = parser->generate_parse_tree(text);
    ASSERT_NE(tree, nullptr);
    EXPECT_EQ(treeText(*tree), "(49 a b)");
    parser->delete_parse_tree(tree);
    EXPECT_EQ(parser->generate_parse_tree(text, sizeof text - 1), nullptr);
    EXPECT_EQ(parser->failure().position, 5U);
    parser->delete_parse_tree(nullptr);
}

} // namespace
} // namespace VT::Testing
