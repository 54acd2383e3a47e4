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

/// An expression that has lost or got some pieces.
std::string wounded(std::mt19937_64& random) {
    std::string text =
        "@(p, q) ~(a.b(2).c{1}' == [1 -2; x(end) 'it''s']) || f(2:3:n, {}) .^ -2^0x1F & q ... rest\n + 1.5e-3i % c";
    for (std::size_t wounds = random() % 4; wounds-- > 0;) {
        const std::size_t place = random() % (text.size() + 1);
        if (random() % 2 == 0)
            text.erase(place, random() % 4);
        else
            text.insert(place, pieces[random() % pieces.size()]);
    }
    return text;
}

TEST(QuillSoup, IsReadOrRefused) {
    std::mt19937_64 random(2);
    QuillReading reading(8, {"(sim)", "(codegen)"});
    int fromTokens = 0;
    int fromWounded = 0;
    for (int round = 0; round < 40000; ++round) {
        std::string bytes(random() % 24, ' ');
        for (char& c : bytes)
            c = static_cast<char>(random());
        expectSoundAnswer(reading, bytes);
        std::string tokens;
        for (std::size_t count = random() % 12; count-- > 0;)
            tokens += pieces[random() % pieces.size()];
        fromTokens += expectSoundAnswer(reading, tokens) ? 1 : 0;
        fromWounded += expectSoundAnswer(reading, wounded(random)) ? 1 : 0;
    }
    EXPECT_GT(std::min(fromTokens, fromWounded), 1000);
    EXPECT_LT(fromWounded, 39000);
}

} // namespace
} // namespace VT::Testing
