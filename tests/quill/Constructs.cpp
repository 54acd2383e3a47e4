// What each construct of the language reads as, where its tokens stand, and where and why texts are refused.
#include "tests/quill/TreeText.hpp"
#include "tests/support/Sides.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

void expectTrees(const std::vector<std::string>& cases, const std::vector<std::string>& keywords = {}) {
    QuillReading reading(256, keywords);
    for (const std::string& each : cases) {
        const auto& [text, tree] = sides(each);
        EXPECT_EQ(reading.answer(text), tree) << text;
        if (const QuillNode* const root = reading.read(text)) {
            EXPECT_EQ(shapeError(*root, text), "") << text;
        }
    }
}

TEST(QuillConstructs, Operands) {
    std::vector<std::string> cases = {"(x) => (43 x)", "((x)) => (43 (43 x))",
                                      // What a dot belongs to
                                      "5.^2 => (77 5 2)", "5.*2 => (91 5 2)", "5./2 => (93 5 2)", R"(5.\2 => (95 5 2))",
                                      "5.' => (79 5)", "5..^2 => (77 5. 2)", "5..' => (79 5.)", "1.5.*2 => (91 1.5 2)",
                                      "5...\n+1 => (49 5 1)", "5....\n+1 => (49 5 1)"};
    for (const std::string leaf :
         {"x", "_x9_Y", "endx", "12", "1.5", ".5", "5.", "1e3", "1.5E-3", "5.e+3", "0x1F", "0", "2i", "1.5e3j",
          // Quoted
          "'it''s'", R"("it's ""so""")", "''", "''''", "'% no comment ...'", "'\xC3\xA4'"})
        cases.push_back(leaf + " => " + leaf);
    expectTrees(cases);
}

/// Printed trees of operators in operators are read back in tests/print.
TEST(QuillConstructs, EveryPairOfOperators) {
    struct Operator {
        std::string text;
        int code; ///< 0 for the plus sign, which leaves no rule
        int level = 0;
    };

    constexpr int power = 9;
    constexpr int range = 304;
    const std::vector<Operator> infixes = {
        {"||", 130, 0}, {"&&", 136, 1}, {"|", 132, 2},    {"&", 134, 3},    {"==", 103, 4}, {"~=", 104, 4},
        {"!=", 104, 4}, {"<", 99, 5},   {"<=", 100, 5},   {">", 101, 5},    {">=", 102, 5}, {":", range, 6},
        {"+", 49, 7},   {"-", 50, 7},   {"*", 90, 8},     {"/", 92, 8},     {"\\", 94, 8},  {".*", 91, 8},
        {"./", 93, 8},  {".\\", 95, 8}, {"^", 76, power}, {".^", 77, power}};
    const auto rule = [](const Operator& op, const std::string& inputs) {
        return op.code == 0 ? inputs : "(" + std::to_string(op.code) + " " + inputs + ")";
    };
    std::vector<std::string> cases;
    for (const std::string blank : {"", " ", "\t", "\n", "% c\n", "... c\n", "  "})
        for (const Operator& first : infixes) {
            const std::string open = "a" + blank + first.text + blank;
            for (const Operator& second : infixes)
                cases.push_back(open + "b" + blank + second.text + blank + "c => " +
                                (first.code == range && second.code == range ? "(305 a b c)"
                                 : second.level > first.level                ? rule(first, "a " + rule(second, "b c"))
                                                              : rule(second, rule(first, "a b") + " c")));
            for (const Operator& prefix : {Operator{"-", 44}, {"~", 46}, {"!", 46}, {"+", 0}}) {
                cases.push_back(open + prefix.text + blank + "b => " + rule(first, "a " + rule(prefix, "b")));
                cases.push_back(
                    prefix.text + blank + open + "b => " +
                    (first.level == power ? rule(prefix, rule(first, "a b")) : rule(first, rule(prefix, "a") + " b")));
            }
            for (const Operator& postfix : {Operator{"'", 78}, {".'", 79}}) {
                cases.push_back(open + "b" + postfix.text + " => " +
                                (first.level == power ? rule(postfix, rule(first, "a b"))
                                                      : rule(first, "a " + rule(postfix, "b"))));
                cases.push_back("a" + postfix.text + blank + first.text + blank + "b => " +
                                rule(first, rule(postfix, "a") + " b"));
            }
        }
    expectTrees(cases);
    expectTrees({"2^-~+a' => (78 (76 2 (44 (46 a))))", "-2^-a*b => (90 (44 (76 2 (44 a))) b)",
                 "a.b'^c.d(1) => (76 (78 (83 a b)) (85 (83 c d) (303 1)))", "a:b:c:d:e => (305 (305 a b c) d e)",
                 "a:b:c:d => (304 (305 a b c) d)", "1 -a'.' => (50 1 (79 (78 a)))",
                 "(@(p)p)+[1] => (49 (43 (306 (307 p) p)) (27 (302 1)))"});
}

TEST(QuillConstructs, CallsListsAndFunctions) {
    expectTrees({// Calls and fields
                 "f() => (85 f (303))", "f (a) => (85 f (303 a))", "(a)(1) => (85 (43 a) (303 1))",
                 "[1 2](1) => (85 (27 (302 1 2)) (303 1))", "f(x).y => (83 (85 f (303 x)) y)", "c{} => (300 c (303))",
                 "a . b(2).c{1} => (300 (83 (85 (83 a b) (303 2)) c) (303 1))", "c{end} => (300 c (303 end))",
                 "a(end - 1, [end end']) => (85 a (303 (50 end 1) (27 (302 end (78 end)))))",
                 // Lists
                 "[ ] => (27 (302))", "{} => (301 (302))", "[1;] => (27 (302 1) (302))", "{;} => (301 (302) (302))",
                 "{1}{1} => (300 (301 (302 1)) (303 1))",
                 // Functions
                 "@ ( p, q ) p => (306 (307 p q) p)", "@() 1 => (306 (307) 1)", "@f == @g => (103 (308 f) (308 g))",
                 "a + @(x) @(y) x + b => (49 a (306 (307 x) (306 (307 y) (49 x b))))",
                 // White space, comments and continuations
                 " \t\n\v\f\ra\n => a", "a % rest ) ( ' => a", "a...\r\n+ b => (49 a b)",
                 "a + % one\r b % two => (49 a b)", "%\xFF\n a => a", "a ... => a", "...\n...\n%\n%\na => a"});
}

TEST(QuillConstructs, WhiteSpaceInBrackets) {
    const std::vector<std::string> cases = {
        // Signs
        "1 2 => 1 2", "1 -2 => 1 (44 2)", "1 - 2 => (50 1 2)", "1-2 => (50 1 2)", "1 -%c\n2 => (50 1 2)",
        "1...\n-2 => 1 (44 2)", "1 - -2 => (50 1 (44 2))", "1 --2 => 1 (44 (44 2))", "1,...\n2 => 1 2",
        // Quotes and other operators
        "a' b' => (78 a) (78 b)", "a 'b' => a 'b'", "a .' b => (79 a) b", "a ~b => a (46 b)", "a ~ b => a (46 b)",
        "a ~= b => (104 a b)", "a *b => (90 a b)", "a .*b => (91 a b)", "a .b => (83 a b)", "a .5 => a .5",
        // Brackets and functions
        "a (1) => a (43 1)", "a(1) => (85 a (303 1))", "a {1} => a (301 (302 1))", "(1 -2) 3 => (43 (50 1 2)) 3",
        "f(a {1}) => (85 f (303 (300 a (303 1))))", "@f 1 => (308 f) 1", "1 @f => 1 (308 f)",
        "@(x) x 1 => (306 (307 x) x) 1", "@(x) - x => (306 (307 x) (44 x))", "[1 -2] 3 => (27 (302 1 (44 2))) 3"};
    std::vector<std::string> all;
    for (const std::string& each : cases) {
        const auto& [text, elements] = sides(each);
        all.push_back("[" + text + "] => (27 (302 " + elements + "))");
        all.push_back("{" + text + ";x} => (301 (302 " + elements + ") (302 x))");
        all.push_back("c{" + text + "} => (300 c (303 " + elements + "))");
    }
    expectTrees(all);
}

TEST(QuillConstructs, Keywords) {
    const std::vector<std::string> keywords = {"(sim)", "(codegen)"};
    expectTrees({"(sim) => (sim)", "~(sim) && (codegen) => (136 (46 (sim)) (codegen))", "f(sim) => (85 f (303 sim))",
                 "(f)(sim) => (85 (43 f) (303 sim))", "f((sim)) => (85 f (303 (sim)))", "( sim) => (43 sim)",
                 "(simx) => (43 simx)", "(Sim) => (43 Sim)", "(sim)' => (78 (sim))", "[f (sim)] => (27 (302 f (sim)))",
                 "[f(sim)] => (27 (302 (85 f (303 sim))))", "@(sim) sim => (306 (307 sim) sim)",
                 "f (sim) => 2: an operator is missing", "(sim)(codegen) => (85 (sim) (303 codegen))"},
                keywords);
    expectTrees(std::vector<std::string>{"(sim) => (43 sim)", "f (sim) => (85 f (303 sim))"});
}

TEST(QuillConstructs, TokensAndTheirPlaces) {
    const std::string text = " a1 ~=  -f( 'x', 2i)%\n && (sim)";
    QuillReading reading(256, {"(sim)"});
    const QuillNode* const root = reading.read(text);
    ASSERT_NE(root, nullptr);
    std::string tokens;
    std::vector<const QuillNode*> pending{root};
    while (!pending.empty()) {
        const QuillNode& node = *pending.back();
        pending.pop_back();
        const bool terminal = node.kind == QuillNode::terminal;
        tokens += (terminal ? std::string(node.text, node.length) : "rule") + " " + std::to_string(node.code) + " at " +
                  std::to_string(node.start) + "\n";
        for (std::int32_t i = terminal ? 0 : node.childCount; i-- > 0;)
            pending.push_back(node.children + i);
    }
    EXPECT_EQ(tokens, "rule 21 at 1\nrule 136 at 1\nrule 104 at 1\na1 40 at 1\n~= 215 at 4\nrule 44 at 8\n- 221 at 8\n"
                      "rule 85 at 9\nf 40 at 9\n( 240 at 10\nrule 303 at 12\n'x' 200 at 12\n2i 201 at 17\n) 241 at 19\n"
                      "&& 211 at 23\n(sim) 40 at 26\n");
    const char* const places = "[] + {1;} + @() f()";
    EXPECT_EQ(reading.read(places)->children->children[2].start, 12U);
    EXPECT_EQ(shapeError(*reading.read(places), places), "");
}

TEST(QuillFailures, PlaceAndReason) {
    struct Group {
        std::string_view reason;
        std::vector<std::string> texts; ///< with a ` at the place of the failure
    };

    const std::vector<Group> groups = {
        {"the text ends where a value must follow",
         {"`", "  `", "% only a comment`", "...`", "a +`", "-`", "a:`", "[1 -`", "@(a)`"}},
        {"a value is missing",
         {"a + `* b", "a == `~= b", "a && `&& b", "a &&`& b", "`* a", "(`)", "`:", "a(`:)", "f(`,1)", "f(1,`)",
          "[1,`,2]", "[`,1]", "[1,`]", "[1,`;2]", "[1 -`]", "`)", "`$", std::string("`\0", 2)}},
        {"a closing ) is missing", {"f(1`", "f(1`]", "f(`]"}},
        {"a closing ] is missing", {"[1`)"}},
        {"a closing } is missing", {"{1`"}},
        {"this bracket has not been opened", {"a`)", "a`]"}},
        {"a comma stands only between arguments and between elements", {"a`, b", "(a`, b)"}},
        {"this ; is extra: it stands only between the rows of a matrix or of a cell array",
         {"a`;", "f(a`; b)", "c{a`; b}", "(`;)", "`;", "a + `;", "f(`;)", "[(`;)]"}},
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

} // namespace
} // namespace VT::Testing
