// Texts that nobody would write: every one of them is read or refused with a place, and nothing else happens.
#include "tests/quill/TreeText.hpp"

#include <gtest/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

/// Whether the text has a tree.
bool expectSoundAnswer(QuillReading& reading, const std::string& text) {
    if (const QuillNode* const tree = reading.read(text)) {
        EXPECT_EQ(shapeError(*tree, text), "") << text;
        EXPECT_LE(countNodes(*tree), 3 * text.size() + 4) << text;
        EXPECT_EQ(reading.failure().reason, "") << text;
        return true;
    }
    EXPECT_LE(reading.failure().position, text.size()) << text;
    EXPECT_NE(reading.failure().reason, "") << text;
    return false;
}

const std::vector<std::string> pieces = {
    "||",  "&&", "|",  "&",  "==",    "~=",        "!=",     "<=",          ">=",    "<",  ">",  ":", "+",
    "-",   "*",  "/",  "\\", ".*",    "./",        ".\\",    "^",           ".^",    "'",  ".'", "~", "!",
    "@",   ".",  ",",  ";",  "(",     ")",         "[",      "]",           "{",     "}",  " ",  "a", "b9",
    "12",  "1.", ".5", "2i", "end",   "'t'",       "\"u\"",  "% c\n",       "...\n", "\n", "=",  "$", "\xC3",
    "0x1", "1e", "f(", "@(", "(sim)", "(codegen)", "[1 -2]", "a.b(2).c{1}", "@(x) x"};

TEST(QuillSoup, Bytes) {
    std::mt19937_64 random(1);
    QuillReading reading(8, {"(sim)"});
    for (int round = 0; round < 60000; ++round) {
        std::string text(random() % 24, ' ');
        for (char& c : text)
            c = static_cast<char>(random());
        expectSoundAnswer(reading, text);
    }
}

TEST(QuillSoup, Tokens) {
    std::mt19937_64 random(2);
    QuillReading reading(8, {"(sim)", "(codegen)"});
    int trees = 0;
    for (int round = 0; round < 60000; ++round) {
        std::string text;
        for (std::size_t count = random() % 12; count-- > 0;)
            text += pieces[random() % pieces.size()];
        trees += expectSoundAnswer(reading, text) ? 1 : 0;
    }
    EXPECT_GT(trees, 1000);
}

TEST(QuillSoup, WoundedExpressions) {
    std::mt19937_64 random(3);
    QuillReading reading;
    const std::string whole =
        "@(p, q) ~(a.b(2).c{1}' == [1 -2; x(end) 'it''s']) || f(2:3:n, {}) .^ -2^0x1F & q ... rest\n + 1.5e-3i % c";
    ASSERT_NE(reading.read(whole), nullptr);
    int trees = 0;
    for (int round = 0; round < 40000; ++round) {
        std::string text = whole;
        for (std::size_t wounds = 1 + random() % 3; wounds-- > 0;) {
            const std::size_t place = random() % (text.size() + 1);
            if (random() % 2 == 0)
                text.erase(place, random() % 4);
            else
                text.insert(place, pieces[random() % pieces.size()]);
        }
        trees += expectSoundAnswer(reading, text) ? 1 : 0;
    }
    EXPECT_GT(trees, 1000);
    EXPECT_LT(trees, 39000);
}

/// Text that has been read does not depend on what follows: cutting the text behind the place of a failure moves that
/// place at most to the end of the cut.
TEST(QuillSoup, AFailureDependsOnNothingBehindIt) {
    std::mt19937_64 random(4);
    QuillReading reading;
    for (int round = 0; round < 20000; ++round) {
        std::string text;
        for (std::size_t count = 1 + random() % 10; count-- > 0;)
            text += pieces[random() % pieces.size()];
        if (reading.read(text) != nullptr)
            continue;
        const std::size_t place = reading.failure().position;
        // Quotes look as far as their end for their partner.
        if (text.find_first_of("'\"") != std::string::npos)
            continue;
        const std::string cut = text.substr(0, place);
        if (reading.read(cut) == nullptr) {
            EXPECT_EQ(reading.failure().position, cut.size()) << text;
        }
    }
}

} // namespace
} // namespace VT::Testing
