// Long texts, nesting at the bound and one beyond, and texts that nobody would write.
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/embedded/QuillTreeText.hpp"
#include "tests/support/Times.hpp"

#include <gtest/gtest.h>
#include <random>
#include <tuple>

namespace VT::Testing {
namespace {

constexpr std::size_t bound = 256;
constexpr std::size_t mebibyte = std::size_t{1} << 20U;

/// Whether the text has a tree.
bool expectSoundAnswer(QuillReading& reading, const std::string& text) {
    const QuillNode* const tree = reading.read(text);
    const auto& [position, reason] = reading.failure();
    EXPECT_EQ(tree == nullptr ? "" : shapeError(*tree, text), "") << text.substr(0, 200);
    EXPECT_EQ(reason.empty(), tree != nullptr) << text.substr(0, 200);
    EXPECT_TRUE(tree != nullptr || position <= text.size()) << text.substr(0, 200);
    return tree != nullptr;
}

TEST(QuillBounds, NestingAtTheBoundAndOneBeyond) {
    // What opens, what closes, and the place of the bracket that is one too many.
    const std::vector<std::tuple<std::string, std::string, std::size_t>> nests = {
        {"(", ")", 0},      {"[", "]", 0},     {"{", "}", 0},    {"f(", ")", 1},           {"c{", "}", 1},
        {"a || (", ")", 5}, {"a^(b+", ")", 2}, {"@(x) ", "", 0}, {"2^-@(x, y) x*", "", 3}, {"1:(", ")", 2}};
    for (const std::size_t nesting : {std::size_t{1}, std::size_t{7}, bound}) {
        QuillReading reading(nesting);
        for (const auto& [open, close, place] : nests) {
            const std::string good = times(nesting, open) + "x" + times(nesting, close);
            EXPECT_NE(reading.read(good), nullptr) << good;
            const std::string deep = times(nesting + 1, open) + "x" + times(nesting + 1, close);
            EXPECT_EQ(reading.read(deep), nullptr) << open;
            EXPECT_EQ(reading.failure().position, nesting * open.size() + place) << open;
            EXPECT_EQ(reading.failure().reason, "brackets and functions are nested too deeply");
        }
        for (const std::string prefix : {"-", "~", "+", "! "}) {
            const std::string run = times(nesting, prefix);
            EXPECT_NE(reading.read(run + "x"), nullptr) << prefix;
            EXPECT_NE(reading.read("a ^ " + run + "x"), nullptr) << prefix;
            EXPECT_EQ(reading.read(run + "-x"), nullptr) << prefix;
            EXPECT_EQ(reading.failure().position, run.size()) << prefix;
            EXPECT_EQ(reading.failure().reason, "too many prefix operators follow each other");
        }
    }
    // Siblings do not add up, nor do the prefix operators of different operands.
    QuillReading reading(1);
    for (const std::string piece : {"(x) + ", "-x + ", "f(-1) * ", "[-x] - ", "-(x) : ", "[@f] == ", "f(@f) < "}) {
        const std::string text = times(500, piece) + "x";
        EXPECT_NE(reading.read(text), nullptr) << piece;
    }
}

TEST(QuillBounds, LongTexts) {
    // The beginning, what is repeated, the end, and whether it is read.
    const std::vector<std::tuple<std::string, std::string, std::string, bool>> shapes = {
        {"a", "+a", "", true},     {"a", "^-a", "", true},    {"a", "'", "", true},        {"a", ".b", "", true},
        {"f", "()", "", true},     {"c", "{1}", "", true},    {"1", ":1", "", true},       {"[", "1 ", "]", true},
        {"[", ";", "]", true},     {"f(", "1,", "1)", true},  {"", "n", "", true},         {"1.", "7", "", true},
        {"'", "''", "'", true},    {"", " ", "a", true},      {"%", "%", "\na", true},     {"", "...\n", "a", true},
        {"[", "1 -2 ", "]", true}, {"[", "(1)' ", "]", true}, {"a", "||b&&c|d", "", true}, {"@(", "p,", "p) p", true},
        {"", "(a)+", "a", true},   {"", "(", "", false},      {"", "-", "", false},        {"", "@(x)", "", false},
        {"", "a ", "", false},     {"'", "a", "", false},     {"", "f(", "", false},       {"", "''", "' '", true},
        {"", "...", "", false},    {"[", "a '", "", false},   {"", "[1 -", "", false},     {"a", "= ", "", false},
        {"", "1e", "", false},     {"a", "+%\n", "", false},  {"", "\xFF", "", false},     {"a...", "a", "+", true}};
    QuillReading reading;
    for (const auto& [front, piece, back, isRead] : shapes) {
        const std::size_t count = (mebibyte - front.size() - back.size()) / piece.size();
        EXPECT_EQ(expectSoundAnswer(reading, front + times(count, piece) + back), isRead) << piece;
    }
}

/// A parser that has read one long text does not hold on to its memory, and trees live apart from each other.
TEST(QuillBounds, TreesOfOneParser) {
    const auto parser = PARSER_T<char>::create(bound);
    const std::string longText = times(100000, "a+") + "a";
    const char upToNul[] = "a == 1\0 )";
    const QuillNode* const first = parser->generate_parse_tree(upToNul);
    const QuillNode* const second = parser->generate_parse_tree(longText.data(), longText.size());
    EXPECT_EQ(parser->generate_parse_tree(upToNul, sizeof upToNul - 1), nullptr);
    EXPECT_EQ(parser->failure().position, 6U);
    const QuillNode* const third = parser->generate_parse_tree("b'");
    parser->delete_parse_tree(second);
    EXPECT_EQ(treeText(*first), "(103 a 1)");
    parser->delete_parse_tree(first);
    const QuillNode* const fourth = parser->generate_parse_tree("[c d]");
    EXPECT_EQ(treeText(*third), "(78 b)");
    EXPECT_EQ(treeText(*fourth), "(27 (302 c d))");
    for (const QuillNode* const tree : {third, fourth, static_cast<const QuillNode*>(nullptr)})
        parser->delete_parse_tree(tree);
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

/// Whatever the tree, converters make an expression of it or one report.
void expectExpressionOrReport(const std::string& text) {
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker;
    const bool read = table.has(SymbolicExprFromQParseTree(table, checker)(text));
    EXPECT_EQ(checker.diagnostics().size(), read ? 0U : 1U) << text;
    for (const HostDiagnostic& report : checker.diagnostics())
        EXPECT_LE(report.offset().value(), text.size()) << text;
    checker.clear();
    try {
        EXPECT_TRUE(table.has(SymbolicExprFromQParseTreeBlockVariants(table, checker)(text))) << text;
        EXPECT_TRUE(checker.diagnostics().empty()) << text;
    } catch (const HostDiagnostic& thrown) {
        ASSERT_EQ(checker.diagnostics().size(), 1U) << text;
        EXPECT_EQ(thrown.offset(), checker.diagnostics().front().offset()) << text;
    }
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
        const std::string ill = wounded(random);
        fromWounded += expectSoundAnswer(reading, ill) ? 1 : 0;
        for (const std::string& text : {bytes, tokens, ill})
            if (round % 8 == 0)
                expectExpressionOrReport(text);
    }
    EXPECT_GT(std::min(fromTokens, fromWounded), 1000);
    EXPECT_LT(fromWounded, 39000);
}

} // namespace
} // namespace VT::Testing
