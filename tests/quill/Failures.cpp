// Texts that are no expressions: where parsing stops and what it tells.
#include "tests/quill/TreeText.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

constexpr std::string_view valueMissing = "a value is missing";
constexpr std::string_view textEnds = "the text ends where a value must follow";
constexpr std::string_view operatorMissing = "an operator is missing";
constexpr std::string_view comma = "a comma stands only between arguments and between elements";
constexpr std::string_view semicolon = "a semicolon stands only between the rows of a matrix or of a cell array";
constexpr std::string_view notAscii = "characters outside ASCII stand only in quotes and comments";
constexpr std::string_view noEnd = "end stands only among the arguments of an index";
constexpr std::string_view notOpened = "this bracket has not been opened";
constexpr std::string_view field = "a field name is missing";

TEST(QuillFailures, PlaceAndReason) {
    struct Case {
        std::string_view text;
        std::size_t position;
        std::string_view reason;
    };

    const std::vector<Case> cases = {
        {"", 0, textEnds},
        {"  ", 2, textEnds},
        {"% only a comment", 16, textEnds},
        {"...", 3, textEnds},
        {"a +", 3, textEnds},
        {"-", 1, textEnds},
        {"a + * b", 4, valueMissing},
        {"a == ~= b", 5, valueMissing},
        {"a && && b", 5, valueMissing},
        {"a &&& b", 4, valueMissing},
        {"* a", 0, valueMissing},
        {"()", 1, valueMissing},
        {"(;)", 1, valueMissing},
        {":", 0, valueMissing},
        {"a(:)", 2, valueMissing},
        {"a:", 2, textEnds},
        {"f(,1)", 2, valueMissing},
        {"f(1,)", 4, valueMissing},
        {"f(1", 3, "a closing ) is missing"},
        {"f(1]", 3, "a closing ) is missing"},
        {"[1)", 2, "a closing ] is missing"},
        {"{1", 2, "a closing } is missing"},
        {"f(]", 2, "a closing ) is missing"},
        {"[1,,2]", 3, valueMissing},
        {"[,1]", 1, valueMissing},
        {"[1,]", 3, valueMissing},
        {"[1,;2]", 3, valueMissing},
        {"[1 -]", 4, valueMissing},
        {"[1 -", 4, textEnds},
        {"a)", 1, notOpened},
        {"a]", 1, notOpened},
        {")", 0, valueMissing},
        {"a, b", 1, comma},
        {"(a, b)", 2, comma},
        {"a;", 1, semicolon},
        {"f(a; b)", 3, semicolon},
        {"c{a; b}", 3, semicolon},
        {"a b", 2, operatorMissing},
        {"1 2", 2, operatorMissing},
        {"12abc", 2, operatorMissing},
        {"1e+", 1, operatorMissing},
        {"0x", 1, operatorMissing},
        {"1.5.5", 3, operatorMissing},
        {"a.5", 1, operatorMissing},
        {"2ij", 1, operatorMissing},
        {"1.5.x", 3, operatorMissing},
        {"2(a)", 1, operatorMissing},
        {"a'(1)", 2, operatorMissing},
        {"a'.b", 2, operatorMissing},
        {"@f(1)", 2, operatorMissing},
        {"'a'(1)", 3, operatorMissing},
        {"a 'b'", 2, operatorMissing},
        {"a '", 2, operatorMissing},
        {"\"a\"'", 3, operatorMissing},
        {"['a'\"b\"]", 4, operatorMissing},
        {"[1 2](1)[3]", 8, operatorMissing},
        {"a = b", 2, "a single = is no operator; == compares"},
        {"a =", 2, "a single = is no operator; == compares"},
        {"a ~ b", 2, operatorMissing},
        {"a ? b", 2, operatorMissing},
        {"a # b", 2, operatorMissing},
        {"$", 0, valueMissing},
        {"a . ", 4, field},
        {"a.(b)", 2, field},
        {"a.1", 1, operatorMissing},
        {"a.end", 2, "end is no field name"},
        {"end", 0, noEnd},
        {"[1 end]", 3, noEnd},
        {"f(1) + end", 7, noEnd},
        {"'abc", 0, "the quotes are not closed"},
        {"a + \"it''s", 4, "the quotes are not closed"},
        {"'''", 0, "the quotes are not closed"},
        {"@", 1, "a function name or parameters in parentheses are missing behind @"},
        {"@end", 1, "end is no function name"},
        {"@(1) x", 2, "a parameter name is missing"},
        {"@(end) x", 2, "end is no parameter name"},
        {"@(a,) x", 4, "a parameter name is missing"},
        {"@(a b) x", 4, "a , or ) is missing behind the parameter"},
        {"@(a", 3, "a , or ) is missing behind the parameter"},
        {"@(", 2, "a parameter name is missing"},
        {"@(a)", 4, textEnds},
        {"a\xC3\xA4", 1, notAscii},
        {"\xC3\xA4", 0, notAscii},
        {"a +\xA0"
         "b",
         3, notAscii},
        {std::string_view("a\0b", 3), 1, operatorMissing},
        {std::string_view("\0", 1), 0, valueMissing},
    };
    QuillReading reading;
    for (const auto& [text, position, reason] : cases) {
        EXPECT_EQ(reading.read(text), nullptr) << text;
        EXPECT_EQ(reading.failure().position, position) << text;
        EXPECT_EQ(reading.failure().reason, reason) << text;
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
