// What each construct of the language reads as, where its tokens stand, and where and why texts are refused.
#include "tests/embedded/QuillTreeText.hpp"
#include "tests/support/Cases.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

const std::vector<std::string> keywords = {"(sim)", "(codegen)"};

/// "POSITION: REASON" instead of a tree where the text is refused.
void expectTree(QuillReading& reading, const std::string& text, const std::string& tree) {
    EXPECT_EQ(reading.answer(text), tree) << text;
    if (const QuillNode* const root = reading.read(text)) {
        EXPECT_EQ(reading.failure().reason, "") << text;
        EXPECT_EQ(shapeError(*root, text), "") << text;
    }
}

/// A row is a text and its tree.
void expectTrees(const std::string& section, QuillReading&& reading) {
    for (const CaseRow& row : casesOf("quill-trees.txt", section, 2))
        expectTree(reading, row[0], row[1]);
}

TEST(QuillConstructs, Trees) {
    expectTrees("trees", QuillReading());
    expectTrees("keywords", QuillReading(256, keywords));
    expectTrees("no keywords", QuillReading());
}

/// Printed trees of operators in operators are read back in tests/print.
TEST(QuillConstructs, EveryPairOfOperators) {
    struct Operator {
        std::string text;
        int code; ///< 0 for the plus sign, which leaves no rule
        int level = 0;
    };

    constexpr int range = 304;
    std::vector<Operator> infixes;
    for (const CaseRow& row : casesOf("quill-trees.txt", "infix operators", 3))
        infixes.push_back({row[0], std::stoi(row[1]), std::stoi(row[2])});
    const auto rule = [](const Operator& op, const std::string& inputs) {
        return op.code == 0 ? inputs : "(" + std::to_string(op.code) + " " + inputs + ")";
    };
    QuillReading reading;
    const auto expect = [&](const std::string& text, const std::string& tree) { expectTree(reading, text, tree); };
    for (const std::string blank : {"", " ", "\t", "\n", "% c\n", "... c\n", "  "})
        for (const Operator& first : infixes) {
            const std::string open = "a" + blank + first.text + blank;
            const bool isPower = first.level == 9;
            for (const Operator& second : infixes)
                expect(open + "b" + blank + second.text + blank + "c",
                       (first.code == range && second.code == range ? "(305 a b c)"
                        : second.level > first.level                ? rule(first, "a " + rule(second, "b c"))
                                                                    : rule(second, rule(first, "a b") + " c")));
            for (const Operator& prefix : {Operator{"-", 44}, {"~", 46}, {"!", 46}, {"+", 0}}) {
                const std::string left = rule(first, rule(prefix, "a") + " b");
                expect(open + prefix.text + blank + "b", rule(first, "a " + rule(prefix, "b")));
                expect(prefix.text + blank + open + "b", isPower ? rule(prefix, rule(first, "a b")) : left);
            }
            for (const Operator& postfix : {Operator{"'", 78}, {".'", 79}}) {
                const std::string right = rule(first, "a " + rule(postfix, "b"));
                expect(open + "b" + postfix.text, isPower ? rule(postfix, rule(first, "a b")) : right);
                expect("a" + postfix.text + blank + first.text + blank + "b", rule(first, rule(postfix, "a") + " b"));
            }
        }
}

TEST(QuillConstructs, WhiteSpaceInBrackets) {
    QuillReading reading;
    for (const CaseRow& row : casesOf("quill-trees.txt", "elements", 2)) {
        expectTree(reading, "[" + row[0] + "]", "(27 (302 " + row[1] + "))");
        expectTree(reading, "{" + row[0] + ";x}", "(301 (302 " + row[1] + ") (302 x))");
        expectTree(reading, "c{" + row[0] + "}", "(300 c (303 " + row[1] + "))");
    }
}

TEST(QuillConstructs, TokensAndTheirPlaces) {
    QuillReading reading(256, keywords);
    for (const CaseRow& row : casesOf("quill-trees.txt", "places", 2)) {
        const QuillNode* const root = reading.read(row[0]);
        ASSERT_NE(root, nullptr) << row[0];
        EXPECT_EQ(shapeError(*root, row[0]), "") << row[0];
        std::string places;
        std::vector<const QuillNode*> pending{root};
        while (!pending.empty()) {
            const QuillNode& node = *pending.back();
            pending.pop_back();
            const bool terminal = node.kind == QuillNode::terminal;
            places += (places.empty() ? "" : "; ") + (terminal ? std::string(node.text, node.length) : "rule") + " " +
                      std::to_string(node.code) + " at " + std::to_string(node.start);
            for (std::int32_t i = terminal ? 0 : node.childCount; i-- > 0;)
                pending.push_back(node.children + i);
        }
        EXPECT_EQ(places, row[1]) << row[0];
    }
}

} // namespace
} // namespace VT::Testing
