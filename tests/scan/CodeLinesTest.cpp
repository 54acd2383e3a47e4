// Lines of code are passed over without a directive being missed.
#include "base/scan/text/CodeLines.hpp"
#include "base/scan/DirectiveReader.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

namespace VT::Testing {
namespace {

/// Pieces whose order decides what is a comment, a literal or a directive.
constexpr std::string_view pieces[] = {
    "#if A\n",
    "#endif\n",
    "#",
    "%:",
    "%\\\n:",
    "import <a>\n",
    "im\\\nport a;",
    "export ",
    "@import x;",
    "_Pragma(\"x\")",
    "__pragma",
    "pop_macro",
    "GCC",
    "clang",
    "segment",
    "temporary",
    "CC",
    "p_mode",
    "lane",
    "/*",
    "*/",
    "*\\\n/",
    "* /",
    "//",
    "/\\\n/",
    "/ ",
    "\"",
    "\\\"",
    "'",
    "1'000",
    "0x'1'",
    "L'a'",
    "u8\"s\"",
    "R\"(",
    ")\"",
    "R\"d(",
    ")d\"",
    "R\\\n\"(",
    "\\\n",
    "\\ \t\n",
    "\\",
    "\n",
    "\r\n",
    " ",
    "\t",
    "a b c;\n",
    "x",
    "%d",
    "{}",
    "\xEF\xBB\xBF",
};

/// Numbers below bounds.
class Numbers {
public:
    explicit Numbers(unsigned seed) : random_(seed) {}

    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

private:
    std::mt19937 random_;
};

std::string directivesOf(std::string_view text, bool isWhole) {
    std::vector<CommentPlace> comments;
    DirectiveReader reader(text);
    if (isWhole) // a reader that notes comments passes no line unread
        reader.noteComments(&comments);
    std::string list;
    for (Directive directive; reader.next(directive);) {
        list += std::to_string(static_cast<int>(directive.kind)) + "@" + std::to_string(directive.line) + ":" +
                std::to_string(directive.begin) + "-" + std::to_string(directive.end);
        for (const DirectiveToken& token : directive.tokens)
            list += " " + std::string(token.text);
        list += "\n";
    }
    return list;
}

TEST(CodeLines, HideNoDirective) {
    Numbers random(11);
    std::size_t found = 0;
    for (int i = 0; i < 40000; ++i) {
        std::string text;
        for (std::size_t left = 1 + random.below(60); left > 0; --left) {
            text += pieces[random.below(std::size(pieces))];
            if (random.below(8) == 0)
                text += std::string(random.below(70), 'y') + "\n";
        }
        const std::string expected = directivesOf(text, true);
        found += expected.size();
        ASSERT_EQ(directivesOf(text, false), expected) << text;
    }
    EXPECT_GT(found, 1'000'000U);
}

TEST(CodeLines, ComparesBlocksAsItComparesBytes) {
    Numbers random(12);
    for (int i = 0; i < 3000; ++i) {
        std::string text;
        for (std::size_t left = random.below(12); left > 0; --left)
            text += std::string(random.below(40), 'z') + std::string(pieces[random.below(std::size(pieces))]);
        const std::size_t from = random.below(text.size() + 1);
        std::size_t expected = from;
        while (expected < text.size() && !mayMatter(std::string_view(text).substr(expected)))
            ++expected;
        ASSERT_EQ(nextThatMayMatter(text, from), expected) << text;
        ASSERT_EQ(countLineEnds(text), static_cast<std::uint64_t>(std::ranges::count(text, '\n')));
    }
}

TEST(CodeLines, PassesDullLinesAtOnce) {
    std::string text;
    for (int i = 0; i < 1000; ++i)
        text += "    segment = \"#if\" + lane(p_mode, 'x') / 2; /* #else\n#endif */ // #if \\\n#if\n";
    const SourceText source(text);
    EXPECT_EQ(CodeLines(source).pass(0), text.size());
    text += "  a;\n  b; # if\n";
    const SourceText further(text);
    EXPECT_EQ(CodeLines(further).pass(0), text.size() - 10);
}

} // namespace
} // namespace VT::Testing
