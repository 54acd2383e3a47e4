// The program: what it answers, what it says, and its exit status.
#include "base/core/Operators.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/tools/Program.hpp"

#include <nlohmann/json.hpp>
#include <sstream>

namespace VT::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

struct Row {
    std::vector<std::string> arguments;
    std::string input;
    std::string output;
    std::vector<std::string> words = {}; ///< parts of standard error; none for silence
    int status = 0;
};

void expectRows(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        std::string trace = "vtsym";
        for (const std::string& argument : row.arguments)
            trace += " '" + argument + "'";
        SCOPED_TRACE(trace + " < '" + row.input + "'");
        const ProgramResult result = runProgram({row.arguments, row.input, {}, {}});
        EXPECT_EQ(result.output, row.output);
        EXPECT_EQ(result.status, row.status);
        EXPECT_EQ(result.words.empty(), row.words.empty()) << result.words;
        for (const std::string& part : row.words)
            EXPECT_THAT(result.words, HasSubstr(part));
    }
}

TEST(Program, AnswersTexts) {
    expectRows({
        {{"simplify", "--", "-x", "-5 < A"}, "", "-x\n-5<A\n"},
        {{"simplify", "[1,2] == tree", "{}"}, "", "[1,2]==tree\n\n", {"line 2:"}, 1},
        {{"simplify", "--from=quill", "tree", "[A]", "[1,B]"}, "", "tree\n[A]\n[1,B]\n"},
        {{"simplify", "%%", "++", "A", "[", "{}", ""}, "", "\n\nA\n\n\ntrue\n", {"line 1:", "line 5:"}, 1},
        {{"eval", "-D", "A=[1,2]", "A", "--", "-1"}, "", "[1,2]\n-1\n"},
        {{"pp", "--given", "[A]", "--", "-A"}, "", "-A\n"},
        {{"symbols", "--kinds", "functions,members", "--kinds", "identifiers", "--", "f(A.b)", "-C"}, "", "f A.b\nC\n"},
        {{"simplify", "--from", "quill", "~(A < 3) | B"}, "", "A>=3 | B\n"},
        {{"convert", "--from", "quill", "--to", "c", "bitshift(a, -3) ~= 0"}, "", "a>>3!=0\n"},
        {{"convert", "--from", "quill", "A = 1"}, "", "\n", {"line 1:", "A = 1\n    ^"}, 1},
        {{"convert", "--to=quill", "(F & 4) != 0 && a % b == 1"}, "", "bitand(F,4)~=0 && rem(a,b)==1\n"},
        {{"convert", "--feature", "VariantKeywordsSimCodegen=0", "(sim)"}, "", "sim\n"},
        {{"simplify", "A==1 || false", "-", "B"}, "C>1&&C>2\nD", "A==1\nC>2\nD\nB\n"},
    });
}

TEST(Program, ListsAndReplacesSymbols) {
    expectRows({
        {{"symbols", "--kinds", "functions,members", "P.gear > f(A)", "1"}, "", "P.gear f\n\n"},
        {{"symbols", "--json", "--from=quill"},
         "f(x) ~= y\n",
         "{\"line\":1,\"input\":\"f(x) ~= y\",\"symbols\":[\"x\",\"y\"]}\n"},
        {{"symbols", "--kinds", "names", "A"}, "", "", {"'names' is not offered"}, 2},
        {{"replace", "A=B", "B=A", "A && !B", "--", "-A < C"}, "", "B && !A\n-B<C\n"},
        {{"replace", "A=B", "--to", "quill"}, "A != 1\n", "B~=1\n"},
        {{"replace", "A==B"}, "", "", {"a replacement NAME=NAME is missing"}, 2},
        {{"replace", "A=B", "A=C", "A"}, "", "", {"'A' is replaced twice"}, 2},
    });
}

TEST(Program, ComparesConditions) {
    expectRows({
        {{"compare", "A<B && B<C", "A<C"}, "", "implies; second alone: A=0, B=0, C=1\n", {}, 0},
        {{"compare", "A>3", "B<4"},
         "",
         "overlaps; first alone: A=4, B=4; second alone: A=0, B=0; both: A=4, B=0\n",
         {},
         0},
        {{"compare", "A*A < 0", "B"},
         "",
         "undecided, it hangs on arithmetic beyond linear terms; "
         "second alone: A=0, B=1\n",
         {},
         0},
        {{"compare", "A<2147483647", "A!=2147483647"}, "", "implies; second alone: A=2147483648\n", {}, 0},
        {{"compare", "--bits", "32", "A<2147483647", "A!=2147483647"}, "", "equivalent\n", {}, 0},
        {{"compare", "--from", "quill", "A ~= 1", "--", "-A == -2"}, "", "implied by; first alone: A=0\n", {}, 0},
        {{"compare"},
         "A==1||A==2\tA>=1 && A<=2\nA\n\tA\nA\tB +\nA\tB\tC",
         "equivalent\n\nimplied by; first alone: A=0\n\n\n",
         {"line 2: Two conditions are separated by one tab.", "line 4: ", "  B +\n    ^", "line 5: Two"},
         1},
        {{"compare", "--json", "-"},
         "A==1\tA==2\n1\tA<=A\nA<A\tB\nA+\tB\n",
         R"json({"line":1,"a":"A==1","b":"A==2","relation":"disjoint","witness":{"only_a":{"A":1},"only_b":{"A":2}}}
{"line":2,"a":"1","b":"A<=A","relation":"equivalent","witness":{"both":{"A":0}}}
{"line":3,"a":"A<A","b":"B","relation":"disjoint","witness":{"only_b":{"A":0,"B":1}}}
{"line":4,"input":"A+\tB","error":{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"A+\" cannot be read at byte 2, before \"+\".","offset":1}}
)json",
         {},
         1},
        {{"given", "VERSION >= 3", "VERSION >= 4 && VERSION >= 2"}, "", "VERSION>=4\n", {}, 0},
        {{"given", "--to", "pp", "!A", "A || B.x != 1"}, "", "B_x != 1\n", {}, 0},
        {{"given", "--json"},
         "A<B && B<C\tA<C\nA\tA && B\n",
         "{\"line\":1,\"known\":\"A<B && B<C\",\"condition\":\"A<C\",\"result\":\"true\"}\n"
         "{\"line\":2,\"known\":\"A\",\"condition\":\"A && B\",\"result\":\"B\"}\n",
         {},
         0},
        {{"simplify", "A<B && B<C && A<C", "A<B && B<C && C<A", "A<=3 || A>=0 && A!=1"},
         "",
         "A<B && B<C\nfalse\ntrue\n",
         {},
         0},
        {{"simplify", "--explain", "A<B && A<C && B<C"},
         "",
         "A<B && A<C && B<C\n  no rule applies\nshortest form\n"
         "  operands taken away, each with a proof         A<B && B<C  2 comparisons, 10 bytes, proven equal\n"
         "  comparisons joined, common operands taken out  A<B && A<C && B<C  3 comparisons, 17 bytes\n"
         "= A<B && B<C\n",
         {},
         0},
        {{"compare", "A +", "B\t+"},
         "",
         "\n",
         {"line 1: The condition \"A +\"", "\n  A +\n    ^\nline 1: The condition \"B +\"", "\n  B +\n    ^\n"},
         1},
        {{"compare", "--json", "A +", "B +"},
         "",
         R"json({"line":1,"input":"A +\tB +","error":{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"A +\" cannot be read at byte 3, before \"+\".","offset":2,"further":[{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"B +\" cannot be read at byte 3, before \"+\".","offset":6}]}}
)json",
         {},
         1},
        {{"compare", "", "A"}, "B\tB", "implied by; first alone: A=0\n"},
        {{"given", "--", "-A", "-A && B"}, "", "B\n"},
        {{"compare", "A"}, "", "", {"two conditions are needed", "Try 'vtsym compare --help'"}, 2},
        {{"given", "A", "B", "C"}, "", "", {"'C' is one argument too many"}, 2},
        {{"compare", "--bits", "16", "A", "B"}, "", "", {"--bits: '16' is not offered; 32 is"}, 2},
    });
}

TEST(Program, KeepsASession) {
    const std::string dialogue = "A>2 && A<4\nans || A>3\n:let N=A+1\n:let A=2\nN*2==6\n:quill\nB ~= A\n:c\n"
                                 ":tree A+1\n:explain 1 && B\n:symbols\n:pp !A.b || B && 2.5 < C\n";
    const std::string answers = "A==3\nA>=3\nN = A+1\nA = 2\nA==2\nA==2\nB~=2\nB!=2\n"
                                "Plus +\n├─ 2\n└─ 1\n1 && B\npass 1\n  number in And  1 && B  =>  B\n"
                                "normal form\n  B\nshortest form\n  comparisons joined, common operands taken out  B  "
                                "1 comparison, 1 byte, proven equal\n= B\nB\n"
                                "!A_b || (B && 2.5 < C)\nwarning: a preprocessor has no real constants: 2.5\n";
    expectRows({
        {{"repl"}, dialogue, answers},
        {{"repl", "--from", "quill"}, "A ~= 1\n:quit\nB\n", "A~=1\n\n\n"},
        {{"repl"},
         ":tree\n:frob\n :let x = 1+*2\n:let 1=2\nx\n",
         "\n\n\n\nx\n",
         {"line 1: There is no result yet.", "no command :frob; :help", "  :let x = 1+*2\n             ^\n",
          "NAME=VALUE"},
         1},
    });
    // The editor echoes what it completes: "Mo", Tab.
    const ProgramResult typed =
        runOnTerminal({{"repl"}, "Mode==1 && Gear>2\na b\nMo\t==7\n:quit\n", {"TERM=dumb"}, {}});
    EXPECT_EQ(typed.status, 0);
    EXPECT_THAT(typed.output, AllOf(HasSubstr("> "), HasSubstr("Mode==1 && Gear>2\r\n"), HasSubstr("a b\r\n    ^"),
                                    HasSubstr("Mode==7\r\n")));
}

TEST(Program, AnswersEachLineByOneLine) {
    expectRows({
        {{"simplify"}, "A==1 && A==2\n\nA\r\nlast", "false\ntrue\nA\nlast\n"},
        {{"convert"}, "a b\nc\n(\n", "\nc\n\n", {"line 1: ", "\n  a b\n    ^\n", "line 3: ", "\n  (\n  ^\n"}, 1},
        {{"convert"}, std::string("a\0b\n\n", 5), "\ntrue\n", {"line 1: ", "\n  a\\x00b\n   ^\n"}, 1},
        {{"convert"}, "\xc3\xa9\xff\n", "\n", {"\n  \xc3\xa9\\xff\n  ^\n"}, 1},
        {{"simplify", "--json"},
         "A == 1 && A == 2\na \xff\n",
         "{\"line\":1,\"input\":\"A == 1 && A == 2\",\"result\":\"false\",\"passes\":1}\n"
         "{\"line\":2,\"input\":\"a "
         "\xef\xbf\xbd\",\"error\":{\"id\":\"Vantor:Variants:ExpressionParseError\",\"message\":"
         "\"The condition \\\"a \\\\xff\\\" cannot be read at byte 3, before \\\"\\\\xff\\\".\",\"offset\":2}}\n",
         {},
         1},
        {{"convert", "--json", "--to", "quill"}, "a!=1", "{\"line\":1,\"input\":\"a!=1\",\"result\":\"a~=1\"}\n"},
    });
}

TEST(Program, Evaluates) {
    expectRows({
        {{"eval", "-D", "N=M + 1", "-D", "M=4", "N*2+1", "[N, N*0.5, N > 4]", "[1]", "N / 0.0", "inf"},
         "",
         "11\n[5,2.5,true]\n[1]\nInfinity\n\n",
         {"line 5: \"inf\" has no value"},
         1},
        {{"eval", "--from", "quill", "-D", "s.gear=rem(7, 4)", "s.gear ~= 3", "bitshift(s.gear, 2)"},
         "",
         "false\n12\n"},
        {{"eval", "-D", "N=1", "-D", "N=2", "-D", "A=B", "-D", "B=A"},
         "N\nA + 1\ns.x\n[1,2] + [1,2,3]\n\n",
         "2\n\n\n\ntrue\n",
         {"line 2: The value of \"A\" depends on itself", "line 3: \"s.x\" cannot be evaluated",
          "line 4: \"[1,2]+[1,2,3]\" combines a list of 2 with a list of 3"},
         1},
        {{"eval", "--json", "-D", "N=3"},
         "N\nN == 3\nN * .5\n0/0.0\n-1/0.0\n1/0.0 - 1/0.0\n[N, 1/0.0, !N]\nx\n",
         R"json({"line":1,"input":"N","type":"int","value":3}
{"line":2,"input":"N == 3","type":"bool","value":true}
{"line":3,"input":"N * .5","type":"double","value":1.5}
{"line":4,"input":"0/0.0","type":"double","value":"Infinity"}
{"line":5,"input":"-1/0.0","type":"double","value":"-Infinity"}
{"line":6,"input":"1/0.0 - 1/0.0","type":"double","value":"NaN"}
{"line":7,"input":"[N, 1/0.0, !N]","type":"vector","value":[3,"Infinity",false]}
{"line":8,"input":"x","error":{"id":"Vantor:SymbolicDims:UnboundSymbol","message":"\"x\" has no value: give it one."}}
)json",
         {},
         1},
    });
    // Definitions outlive what makes the program start anew.
    std::string input;
    std::string output;
    for (int i = 0; i < 60'000; ++i) {
        input += "N + x" + std::to_string(i) + " * 0 * (" + std::to_string(i) + " - y" + std::to_string(i) + ")\n";
        output += "\n";
    }
    const ProgramResult result = runProgram({{"eval", "-D", "N=3"}, input + "N\n", {}, {}});
    EXPECT_EQ(result.output, output + "3\n");
}

TEST(Program, ExplainsSimplification) {
    expectRows({
        {{"simplify", "--explain", "A"}, "", "A\n  no rule applies\n= A\n"},
        {{"simplify", "--normal-form", "(A || B) && C", "2+3", "A<A"}, "", "A && C || B && C\n5\nfalse\n"},
        {{"simplify", "(A || B) && C", "2+3", "A<A", "!0", "A==A"}, "", "(A || B) && C\n5\n0\n1\ntrue\n"},
        {{"simplify", "--to", "quill", "A/B==1 && A/B>0"}, "", "idivide(A,B)==1\n"},
        {{"simplify", "--strong", "A"}, "", "", {"there is no option '--strong'"}, 2},
        {{"simplify", "--explain", "--json", "A && true"},
         "",
         "{\"line\":1,\"input\":\"A && true\",\"result\":\"A\",\"passes\":2,\"steps\":[{\"pass\":1,\"rule\":"
         "\"true operand of And\",\"before\":\"A && true\",\"after\":\"A\"},{\"form\":\"A\",\"way\":\"comparisons "
         "joined, common operands "
         "taken out\",\"comparisons\":1,\"bytes\":1,\"chosen\":true}]}\n"},
    });
}

TEST(Program, WritesConditionsOfDirectives) {
    expectRows({
        {{"pp", "--given", "A == 1 && B"}, "A == 1 && C\nA != 1 || D\nB\n", "C\nD\n1\n"},
        {{"pp", "--from", "quill", "--given", "rem(A,2)", "--json", "rem(A,2) & B == 1 && ~B"},
         "",
         "{\"line\":1,\"input\":\"rem(A,2) & B == 1 && ~B\",\"result\":\"(A % 2 & B == 1) && !B\"}\n",
         {"line 1: warning: C reads the element-wise logical and"},
         0},
        {{"pp", "--given", "A = 1", "A"}, "", "", {"vtsym: --given: ", "  A = 1\n    ^"}, 1},
        {{"convert", "--to", "pp", "a b", "A.B_C == A_B.C && x > .5"},
         "",
         "\nA_B_C == A_B_C && x > 0.5\n",
         {"line 1: ", "line 2: warning: A.B_C and A_B.C are both written A_B_C",
          "line 2: warning: a preprocessor has no real constants: 0.5"},
         1},
        {{"simplify", "--to", "pp", "A>1||A<=1", "!(A.B<3)&&C||0"}, "", "1\nA_B >= 3 && C\n"},
        {{"convert", "--from", "quill", "--to", "c", "x.^2 > 1"}, "", "x.^2>1\n", {"C has no element-wise power"}, 0},
    });
}

TEST(Program, WorksOnDimensions) {
    expectRows({
        {{"dims", "N*2.0 + N/3 + 1.4", "2*3", "s.x"},
         "",
         "cast        N*2+N/3+1\nsimplified  N*2+N/3+1\nfactored    (N*2*3+N+1*3)/3\nsymbols     N\n\n"
         "cast        2*3\nsimplified  6\nfactored    6\nvalue       6\n\n"
         "cast        s.x\nsimplified  s.x\nfactored    s.x\nsymbols     s.x\n"},
        {{"dims", "-D", "N=6", "-D", "M=N - 1", "--json"},
         "[N/2 + M/3, 4]\nN + K\nN +\n",
         R"json({"line":1,"input":"[N/2 + M/3, 4]","cast":"[N/2+M/3,4]","simplified":"[N/2+M/3,4]","factored":"[(N*3+M*2)/(2*3),4]","symbols":["N","M"],"type":"vector","value":[4,4]}
{"line":2,"input":"N + K","cast":"N+K","simplified":"N+K","factored":"N+K","symbols":["N","K"]}
{"line":3,"input":"N +","error":{"id":"Vantor:SymbolicDims:InvalidExpression","message":"The expression \"N +\" cannot be read at its end: correct it there. The text ends where a value must follow.","offset":3}}
)json",
         {},
         1},
        {{"dims", "N^2"}, "", "\n", {"line 1: ", "power"}, 1},
        {{"dims", "-D", "3=N", "N"}, "", "", {"'3' is not a name"}, 2},
    });
}

TEST(Program, ShowsTrees) {
    expectRows({
        {{"tree", "Mode == 1 && s.gear > 2.5", "x"},
         "",
         "And &&\n├─ Equal ==\n│  ├─ Mode\n│  └─ 1\n└─ GreaterThan >\n   ├─ MemberValue .gear\n   │  └─ s\n"
         "   └─ 2.5 (real literal)\n\nx\n"},
        {{"tree", "(a+b)*(a+b)"}, "", "Multiply *\n├─ #4 Plus +\n│  ├─ a\n│  └─ b\n└─ #4 as above\n"},
        {{"tree", "--json"},
         "N+1\n(a+b)*(a+b)\ns.x<.5\ntrue\n",
         R"json({"line":1,"input":"N+1","tree":{"kind":"SymbolicPlusExpr","op":3,"id":4,"inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"N"},{"kind":"SymbolicIntValue","op":1,"id":2,"value":1}]}}
{"line":2,"input":"(a+b)*(a+b)","tree":{"kind":"SymbolicMultiplyExpr","op":6,"id":5,"inputs":[{"kind":"SymbolicPlusExpr","op":3,"id":4,"inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"a"},{"kind":"SymbolicString","op":0,"id":2,"text":"b"}]},{"id":4}]}}
{"line":3,"input":"s.x<.5","tree":{"kind":"SymbolicLessThanExpr","op":11,"id":6,"inputs":[{"kind":"SymbolicMemberValue","op":31,"id":5,"name":"x","inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"s"}]},{"kind":"SymbolicDoubleValue","op":2,"id":2,"value":0.5}]}}
{"line":4,"input":"true","tree":{"kind":"SymbolicString","op":0,"id":1,"text":"true"}}
)json"},
        {{"tree", "--dot", "N*2 + N"},
         "",
         "digraph expression {\n  node [shape=box, fontname=monospace];\n  n2 [label=\"N\", style=rounded];\n"
         "  n3 [label=\"2\", style=rounded];\n  n4 [label=\"Multiply *\"];\n  n4 -> n2;\n  n4 -> n3;\n"
         "  n5 [label=\"Plus +\"];\n  n5 -> n4;\n  n5 -> n2;\n}\n"},
    });
}

TEST(Program, DrawsDeepTreesInBoundedColumns) {
    std::string sum = "x0";
    for (int i = 1; i < 3000; ++i)
        sum += "+x" + std::to_string(i);
    const std::vector<std::string> lines = linesOf(runProgram({{"tree"}, sum, {}, {}}).output);
    std::size_t operators = 0;
    std::size_t leaves = 0;
    std::size_t widest = 0;
    for (const std::string& line : lines) {
        widest = std::max(widest, line.size());
        operators += line.ends_with("Plus +") ? 1U : 0U;
        leaves += line.find(" x") != std::string::npos ? 1U : 0U;
    }
    EXPECT_EQ(operators, 2999U);
    EXPECT_EQ(leaves, 3000U);
    EXPECT_LT(widest, 200U);
}

TEST(Program, ListsOperators) {
    const std::vector<std::string> lines = linesOf(runProgram({{"operators"}, "", {}, {}}).output);
    const std::vector<std::string> objects = linesOf(runProgram({{"operators", "--json"}, "", {}, {}}).output);
    ASSERT_EQ(lines.size(), operatorTable().size() + 1);
    ASSERT_EQ(objects.size(), operatorTable().size());
    const Json object = Json::parse(objects[8]);
    EXPECT_EQ(object["op"], 8);
    EXPECT_EQ(object["kind"], "SymbolicModuloExpr");
    EXPECT_EQ(object["c"], "%");
    EXPECT_THAT(lines[9], AllOf(HasSubstr("Modulo"), HasSubstr("%"), HasSubstr("rem")));
}

TEST(Program, RefusesWrongUsageWithAHint) {
    expectRows({
        {{}, "", "", {"a command is missing", "Usage: vtsym"}, 2},
        {{"simplfy", "a"}, "", "", {"there is no command 'simplfy'; did you mean simplify?", "Try 'vtsym --help'"}, 2},
        {{"simplify", "-x"},
         "",
         "",
         {"there is no option '-x'", "that begins with - after --", "Try 'vtsym simplify --help'"},
         2},
        {{"operators", "x"}, "", "", {"'x' is one argument too many", "Try 'vtsym operators --help'"}, 2},
        {{"convert", "--to", "basic", "a"}, "", "", {"--to: 'basic' is not offered; c, quill or pp is"}, 2},
        {{"tree", "--json", "--dot", "a"}, "", "", {"--json", "--dot"}, 2},
        {{""}, "", "", {"vtsym: there is no command ''\nTry"}, 2},
        {{"xy"}, "", "", {"vtsym: there is no command 'xy'\nTry"}, 2},
        {{"--", "simplify", "A"}, "", "", {"there is no command '--'"}, 2},
        {{"check"}, "", "", {"MODEL is required", "Try 'vtsym check --help'"}, 2},
        {{"check", "--", "m.json"}, "", "", {"vtsym: m.json: cannot be read"}, 2},
        {{"check", "[m]"}, "", "", {"vtsym: [m]: cannot be read"}, 2},
        {{"check", "--html", "[p]", "m.json"}, "", "", {"vtsym: m.json: cannot be read"}, 2},
        {{"check", "--html", "--", "m.json"}, "", "", {"--html: 1 required FILE missing"}, 2},
        {{"scan", "--", "-a.c", "{}"}, "", "", {"vtsym: -a.c: cannot be read", "vtsym: {}: cannot"}, 2},
        {{"eval", "-D", "[1]"}, "", "", {"-D: '[1]' is not NAME=VALUE"}, 2},
        {{"eval", "-D", "{}"}, "", "", {"-D: '{}' is not NAME=VALUE"}, 2},
        {{"symbols", "--kinds", "[members]"}, "", "", {"'[members]' is not offered"}, 2},
        {{"eval", "-D", "N"}, "", "", {"'N' is not NAME=VALUE", "Try 'vtsym eval --help'"}, 2},
        {{"eval", "-D", "N="}, "", "", {"'N=' gives no value"}, 2},
        {{"eval", "-D", "N+1=2"}, "", "", {"'N+1' is not a name that can be given a value"}, 2},
        {{"eval", "-D", "a b=1"}, "", "", {"the name 'a b' cannot be read"}, 2},
        {{"simplify", "--feature", "Nope=1", "a"}, "", "", {"there is no feature flag \"Nope\""}, 2},
    });
}

TEST(Program, HelpsOnRequest) {
    for (const char* command : {"", "simplify", "convert", "pp", "tree", "eval", "dims", "symbols", "replace", "repl",
                                "operators", "compare", "given"}) {
        SCOPED_TRACE(command);
        std::vector<std::string> asked{command, "--help"};
        std::vector<std::string> helped{"help", command};
        if (*command == '\0') {
            asked.erase(asked.begin());
            helped.pop_back();
        }
        const ProgramResult help = runProgram({asked, "", {}, {}});
        EXPECT_EQ(help.status, 0);
        EXPECT_EQ(help.words, "");
        EXPECT_THAT(help.output, AllOf(HasSubstr("Examples:\n  vtsym "), HasSubstr(command)));
        EXPECT_EQ(runProgram({helped, "", {}, {}}).output, help.output);
    }
    EXPECT_THAT(runProgram({{"--version"}, "", {}, {}}).output,
                ::testing::MatchesRegex("vtsym [0-9]+\\.[0-9]+\\.[0-9]+\n"));
}

TEST(Program, AnswersTheSameHoweverItIsAsked) {
    std::string input;
    for (const CorpusFile& file : corpusFiles) {
        const std::vector<std::string> lines = corpusLines(file.name);
        for (std::size_t i = 0; i < lines.size(); i += 7)
            input += lines[i] + "\n";
    }
    const std::size_t count = linesOf(input).size();
    ASSERT_GT(count, 1000U);
    const ProgramResult plain = runProgram({{"simplify"}, input, {}, {}});
    const ProgramResult uncached =
        runProgram({{"simplify"}, input, {"VTSYM_FEATURES=CacheSymExprSimplifyResults=0"}, {}});
    const ProgramResult detailed = runProgram({{"simplify", "--json", "--explain"}, input, {}, {}});
    EXPECT_EQ(uncached.output, plain.output);
    EXPECT_EQ(uncached.words, plain.words);
    const std::vector<std::string> answers = linesOf(plain.output);
    const std::vector<std::string> objects = linesOf(detailed.output);
    const std::vector<std::string> inputs = linesOf(input);
    ASSERT_EQ(answers.size(), count);
    ASSERT_EQ(objects.size(), count);
    for (std::size_t i = 0; i < count; ++i) {
        const Json object = Json::parse(objects[i]);
        EXPECT_EQ(object["line"], i + 1);
        EXPECT_EQ(object.value("result", std::string()), answers[i]);
        EXPECT_EQ(object.contains("error"), answers[i].empty());
        EXPECT_EQ(object["input"], inputs[i]);
    }
}

TEST(Program, OutlivesHostileTexts) {
    std::string everyByte;
    for (int byte = 0; byte < 256; ++byte)
        everyByte += byte == '\n' ? ' ' : static_cast<char>(byte);
    const std::string longText = [] {
        std::string text;
        for (int i = 0; i < 100'000; ++i)
            text += "a == 1 && ";
        return text + "b c";
    }();
    const std::vector<std::string> texts{std::string(200'000, '('),
                                         std::string(3'000'000, 'x'),
                                         everyByte,
                                         "1.e999999999",
                                         std::string(500'000, '9'),
                                         longText};
    std::string input;
    for (const std::string& text : texts)
        input += text + "\n";
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"simplify"}, {"simplify", "--explain"}, {"convert"}, {"tree"}, {"symbols"}, {"replace", "a=d"}}) {
        const ProgramResult result = runProgram({arguments, input, {}, {}});
        EXPECT_EQ(result.status, 1);
        EXPECT_THAT(result.output, HasSubstr(texts[1].substr(0, 90)));
        for (const std::string& line : linesOf(result.words)) // messages and carets stay on a screen
            EXPECT_LT(line.size(), 400U);
        EXPECT_THAT(result.words, HasSubstr("== 1 && a == 1 && b c\n"));
        EXPECT_THAT(result.words, Not(HasSubstr(std::string(1, '\x01'))));
        std::vector<std::string> withJson = arguments;
        withJson.emplace_back("--json");
        const std::vector<std::string> objects = linesOf(runProgram({withJson, input, {}, {}}).output);
        ASSERT_EQ(objects.size(), texts.size());
        for (std::size_t i = 0; i < objects.size(); ++i)
            EXPECT_EQ(Json::parse(objects[i]).contains("error"), i != 1);
    }
}

TEST(Program, EndsWhenOutputFails) {
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"simplify", "a"}, {"operators"}, {"--help"}}) {
        const ProgramResult full = runProgram({arguments, "", {}, OutputTo::FullDevice});
        EXPECT_EQ(full.status, 1);
        EXPECT_THAT(full.words, HasSubstr("vtsym: standard output cannot be written: "));
        const ProgramResult unread = runProgram({arguments, "", {}, OutputTo::ClosedPipe});
        EXPECT_EQ(unread.status, 1);
        EXPECT_EQ(unread.words, "");
    }
}

TEST(Program, ColoursOnlyATerminalThatWantsThem) {
    const std::vector<std::string> arguments{"simplify", "a b", "A==1 && A==2"};
    const auto onTerminal = [&](std::vector<std::string> environment) {
        return runOnTerminal({arguments, "", std::move(environment), {}}).output;
    };
    EXPECT_THAT(onTerminal({}), AllOf(HasSubstr("\033["), HasSubstr("false")));
    EXPECT_THAT(onTerminal({"NO_COLOR="}), HasSubstr("\033["));
    EXPECT_THAT(onTerminal({"NO_COLOR=1"}), AllOf(Not(HasSubstr("\033")), HasSubstr("false")));
    EXPECT_THAT(onTerminal({"TERM=dumb"}), Not(HasSubstr("\033")));
    EXPECT_THAT(runProgram({arguments, "", {}, {}}).words, Not(HasSubstr("\033")));
}

} // namespace
} // namespace VT::Testing
