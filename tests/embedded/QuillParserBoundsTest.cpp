// Long texts, nesting at the bound and one beyond, and texts that nobody would write.
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/embedded/QuillTreeText.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Times.hpp"

#include <gtest/gtest.h>
#include <random>

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
    for (const std::size_t nesting : {std::size_t{1}, std::size_t{7}, bound}) {
        QuillReading reading(nesting);
        for (const CaseRow& row : casesOf("quill-bounds.txt", "nests", 3)) {
            const std::string &open = row[0], &close = row[1];
            const std::size_t place = std::stoul(row[2]);
            const auto nest = [&](std::size_t depth) { return times(depth, open) + "x" + times(depth, close); };
            EXPECT_NE(reading.read(nest(nesting)), nullptr) << open;
            EXPECT_EQ(reading.read(nest(nesting + 1)), nullptr) << open;
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
    for (const char* const piece : {"(x) + ", "-x + ", "f(-1) * ", "[-x] - ", "-(x) : ", "[@f] == ", "f(@f) < "})
        EXPECT_NE(reading.read(times(500, piece) + "x"), nullptr) << piece;
}

TEST(QuillBounds, LongTexts) {
    QuillReading reading;
    for (const bool isRead : {true, false})
        for (const CaseRow& row : casesOf("quill-bounds.txt", isRead ? "long texts" : "long errors", 3)) {
            const std::size_t count = (mebibyte - row[1].size() - row[2].size()) / row[0].size();
            EXPECT_EQ(expectSoundAnswer(reading, row[1] + times(count, row[0]) + row[2]), isRead) << row[0];
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

/// An expression that has lost or got some pieces.
std::string wounded(std::mt19937_64& random, const std::vector<CaseRow>& pieces) {
    std::string text =
        "@(p, q) ~(a.b(2).c{1}' == [1 -2; x(end) 'it''s']) || f(2:3:n, {}) .^ -2^0x1F & q ... rest\n + 1.5e-3i % c";
    for (std::size_t wounds = random() % 4; wounds-- > 0;) {
        const std::size_t place = random() % (text.size() + 1);
        if (random() % 2 == 0)
            text.erase(place, random() % 4);
        else
            text.insert(place, pieces[random() % pieces.size()][0]);
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
    const std::vector<CaseRow> pieces = casesOf("quill-bounds.txt", "pieces", 1);
    int fromTokens = 0, fromWounded = 0;
    for (int round = 0; round < 40000; ++round) {
        std::string bytes(random() % 24, ' ');
        for (char& c : bytes)
            c = static_cast<char>(random());
        expectSoundAnswer(reading, bytes);
        std::string tokens;
        for (std::size_t count = random() % 12; count-- > 0;)
            tokens += pieces[random() % pieces.size()][0];
        fromTokens += expectSoundAnswer(reading, tokens) ? 1 : 0;
        const std::string ill = wounded(random, pieces);
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
