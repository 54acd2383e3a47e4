// The program: what it answers, what it says, and its exit status.
#include "base/core/Operators.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

namespace VT::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

TEST(Program, AnswersTexts) {
    expectRows({
        {"vtsym simplify -- -x '-5 < A'", "-x\n-5<A\n"},
        {"vtsym simplify '[1,2] == tree' {}", "[1,2]==tree\n\n", "line 2:", 1},
        {"vtsym simplify --from=quill tree [A] [1,B]", "tree\n[A]\n[1,B]\n"},
        {"vtsym simplify %% ++ A [ {} ''", "\n\nA\n\n\ntrue\n", "line 1:...line 5:", 1},
        {"vtsym convert --from quill 'A = 1'", "\n", "line 1:...A = 1\n    ^", 1},
        {"vtsym convert --feature VariantKeywordsSimCodegen=0 '(sim)'", "sim\n"},
        {"vtsym simplify 'A==1 || false' - B\nC>1&&C>2\nD", "A==1\nC>2\nD\nB\n"},
        {"vtsym simplify\nA==1 && A==2\n\nA\r\nlast", "false\ntrue\nA\nlast\n"},
        {"vtsym convert\na b\nc\n(\n", "\nc\n\n", "line 1: ...\n  a b\n    ^\n...line 3: ...\n  (\n  ^\n", 1},
        {std::string("vtsym convert\na\0b\n\n", 19), "\ntrue\n", "line 1: ...\n  a\\x00b\n   ^\n", 1},
        {"vtsym convert\n\xc3\xa9\xff\n", "\n", "\n  \xc3\xa9\\xff\n  ^\n", 1},
        {"vtsym simplify --json\nA == 1 && A == 2\na \xff\n",
         R"json({"line":1,"input":"A == 1 && A == 2","result":"false","passes":1}
{"line":2,"input":"a �","error":{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"a \\xff\" cannot be read at byte 3, before \"\\xff\".","offset":2}}
)json",
         "", 1},
        {"vtsym convert --json --to quill a!=1", "{\"line\":1,\"input\":\"a!=1\",\"result\":\"a~=1\"}\n"},
    });
}

TEST(Program, ListsAndReplacesSymbols) {
    expectRows({
        {"vtsym symbols --kinds functions,members --kinds identifiers -- 'f(A.b)' -C", "f A.b\nC\n"},
        {"vtsym symbols --kinds functions,members 'P.gear > f(A)' 1", "P.gear f\n\n"},
        {"vtsym symbols --json --from=quill\nf(x) ~= y\n",
         "{\"line\":1,\"input\":\"f(x) ~= y\",\"symbols\":[\"x\",\"y\"]}\n"},
        {"vtsym symbols --kinds names A", "", "'names' is not offered", 2},
        {"vtsym replace A=B B=A 'A && !B' -- '-A < C'", "B && !A\n-B<C\n"},
        {"vtsym replace A=B --to quill\nA != 1\n", "B~=1\n"},
        {"vtsym replace A==B", "", "a replacement NAME=NAME is missing", 2},
        {"vtsym replace A=B A=C A", "", "'A' is replaced twice", 2},
    });
}

TEST(Program, ComparesConditions) {
    expectRows({
        {"vtsym compare 'A*A < 0' B",
         "undecided, it hangs on arithmetic beyond linear terms; second alone: A=0, B=1\n"},
        {"vtsym compare 'A<2147483647' A!=2147483647", "implies; second alone: A=2147483648\n"},
        {"vtsym compare --bits 32 'A<2147483647' A!=2147483647", "equivalent\n"},
        {"vtsym compare --from quill 'A ~= 1' -- '-A == -2'", "implied by; first alone: A=0\n"},
        {"vtsym compare\nA==1||A==2\tA>=1 && A<=2\nA\n\tA\nA\tB +\nA\tB\tC",
         "equivalent\n\nimplied by; first alone: A=0\n\n\n",
         "line 2: Two conditions are separated by one tab....line 4: ...  B +\n    ^...line 5: Two", 1},
        {"vtsym compare --json -\nA==1\tA==2\n1\tA<=A\nA<A\tB\nA+\tB\n",
         R"json({"line":1,"a":"A==1","b":"A==2","relation":"disjoint","witness":{"only_a":{"A":1},"only_b":{"A":2}}}
{"line":2,"a":"1","b":"A<=A","relation":"equivalent","witness":{"both":{"A":0}}}
{"line":3,"a":"A<A","b":"B","relation":"disjoint","witness":{"only_b":{"A":0,"B":1}}}
{"line":4,"input":"A+\tB","error":{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"A+\" cannot be read at byte 2, before \"+\".","offset":1}}
)json",
         "", 1},
        {"vtsym compare --json 'A +' 'B +'",
         R"json({"line":1,"input":"A +\tB +","error":{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"A +\" cannot be read at byte 3, before \"+\".","offset":2,"further":[{"id":"Vantor:Variants:ExpressionParseError","message":"The condition \"B +\" cannot be read at byte 3, before \"+\".","offset":6}]}}
)json",
         "", 1},
        {"vtsym compare 'A +' 'B\t+'", "\n",
         "line 1: The condition \"A +\"...\n  A +\n    ^\nline 1: The condition \"B +\"...\n  B +\n    ^\n", 1},
        {"vtsym compare '' A\nB\tB", "implied by; first alone: A=0\n"},
        {"vtsym compare A", "", "two conditions are needed...Try 'vtsym compare --help'", 2},
        {"vtsym compare --bits 16 A B", "", "--bits: '16' is not offered; 32 is", 2},
        {"vtsym given -- -A '-A && B'", "B\n"},
        {"vtsym given --to pp !A 'A || B.x != 1'", "B_x != 1\n"},
        {"vtsym given --json\nA<B && B<C\tA<C\nA\tA && B\n",
         R"json({"line":1,"known":"A<B && B<C","condition":"A<C","result":"true"}
{"line":2,"known":"A","condition":"A && B","result":"B"}
)json"},
        {"vtsym given A B C", "", "'C' is one argument too many", 2},
    });
}

TEST(Program, KeepsASession) {
    expectRows({
        {"vtsym repl\nA>2 && A<4\nans || A>3\n:let N=A+1\n:let A=2\nN*2==6\n:quill\nB ~= A\n:c\n:tree A+1\n:explain 1 "
         "&& "
         "B\n:symbols\n:pp !A.b || B && 2.5 < C\n",
         "A==3\nA>=3\nN = A+1\nA = 2\nA==2\nA==2\nB~=2\nB!=2\nPlus +\n├─ 2\n└─ 1\n1 && B\npass 1\n"
         "  number in And  1 && B  =>  B\nnormal form\n  B\nshortest form\n"
         "  comparisons joined, common operands taken out  B  1 comparison, 1 byte, proven equal\n= B\nB\n"
         "!A_b || (B && 2.5 < C)\nwarning: a preprocessor has no real constants: 2.5\n"},
        {"vtsym repl --from quill\nA ~= 1\n:quit\nB\n", "A~=1\n\n\n"},
        {"vtsym repl\n:tree\n:frob\n :let x = 1+*2\n:let 1=2\nx\n", "\n\n\n\nx\n",
         "line 1: There is no result yet....no command :frob; :help...  :let x = 1+*2\n             ^\n...NAME=VALUE",
         1},
    });
    // The editor echoes what it completes: "Mo", Tab.
    const ProgramResult typed = runOnTerminal({"repl"}, "Mode==1 && Gear>2\na b\nMo\t==7\n:quit\n", {"TERM=dumb"});
    EXPECT_EQ(typed.status, 0);
    EXPECT_THAT(typed.output, AllOf(HasSubstr("> "), HasSubstr("Mode==1 && Gear>2\r\n"), HasSubstr("a b\r\n    ^"),
                                    HasSubstr("Mode==7\r\n")));
}

TEST(Program, Evaluates) {
    expectRows({
        {"vtsym eval -D A=[1,2] A -- -1", "[1,2]\n-1\n"},
        {"vtsym eval -D 'N=M + 1' -D M=4 'N*2+1' '[N, N*0.5, N > 4]' [1] 'N / 0.0' inf",
         "11\n[5,2.5,true]\n[1]\nInfinity\n\n", "line 5: \"inf\" has no value", 1},
        {"vtsym eval --from quill -D 's.gear=rem(7, 4)' 's.gear ~= 3' 'bitshift(s.gear, 2)'", "false\n12\n"},
        {"vtsym eval -D N=1 -D N=2 -D A=B -D B=A\nN\nA + 1\ns.x\n[1,2] + [1,2,3]\n\n", "2\n\n\n\ntrue\n",
         "line 2: The value of \"A\" depends on itself...line 3: \"s.x\" cannot be evaluated...line 4: "
         "\"[1,2]+[1,2,3]\" "
         "combines a list of 2 with a list of 3",
         1},
        {"vtsym eval --json -D N=3\nN\nN == 3\nN * .5\n0/0.0\n-1/0.0\n1/0.0 - 1/0.0\n[N, 1/0.0, !N]\nx\n",
         R"json({"line":1,"input":"N","type":"int","value":3}
{"line":2,"input":"N == 3","type":"bool","value":true}
{"line":3,"input":"N * .5","type":"double","value":1.5}
{"line":4,"input":"0/0.0","type":"double","value":"Infinity"}
{"line":5,"input":"-1/0.0","type":"double","value":"-Infinity"}
{"line":6,"input":"1/0.0 - 1/0.0","type":"double","value":"NaN"}
{"line":7,"input":"[N, 1/0.0, !N]","type":"vector","value":[3,"Infinity",false]}
{"line":8,"input":"x","error":{"id":"Vantor:SymbolicDims:UnboundSymbol","message":"\"x\" has no value: give it one."}}
)json",
         "", 1},
    });
    // Definitions outlive what makes the program start anew.
    std::string input;
    for (int i = 0; i < 60'000; ++i) {
        const std::string number = std::to_string(i);
        input += "N + x" + number + " * 0 * (" + number + " - y" + number + ")\n";
    }
    EXPECT_EQ(runProgram({"eval", "-D", "N=3"}, input + "N\n").output, std::string(60'000, '\n') + "3\n");
}

TEST(Program, ExplainsSimplification) {
    expectRows({
        {"vtsym simplify --explain A", "A\n  no rule applies\n= A\n"},
        {"vtsym simplify --explain 'A<B && A<C && B<C'",
         "A<B && A<C && B<C\n  no rule applies\nshortest form\n"
         "  operands taken away, each with a proof         A<B && B<C  2 comparisons, 10 bytes, proven equal\n"
         "  comparisons joined, common operands taken out  A<B && A<C && B<C  3 comparisons, 17 bytes\n"
         "= A<B && B<C\n"},
        {"vtsym simplify --normal-form '(A || B) && C' 2+3 'A<A'", "A && C || B && C\n5\nfalse\n"},
        {"vtsym simplify '(A || B) && C' 2+3 'A<A' '!0' A==A", "(A || B) && C\n5\n0\n1\ntrue\n"},
        {"vtsym simplify --to quill 'A/B==1 && A/B>0'", "idivide(A,B)==1\n"},
        {"vtsym simplify --strong A", "", "there is no option '--strong'", 2},
        {"vtsym simplify --explain --json 'A && true'",
         R"json({"line":1,"input":"A && true","result":"A","passes":2,"steps":[{"pass":1,"rule":"true operand of And","before":"A && true","after":"A"},{"form":"A","way":"comparisons joined, common operands taken out","comparisons":1,"bytes":1,"chosen":true}]}
)json"},
    });
}

TEST(Program, WritesConditionsOfDirectives) {
    expectRows({
        {"vtsym pp --given [A] -- -A", "-A\n"},
        {"vtsym pp --given 'A == 1 && B'\nA == 1 && C\nA != 1 || D\nB\n", "C\nD\n1\n"},
        {"vtsym pp --from quill --given 'rem(A,2)' --json 'rem(A,2) & B == 1 && ~B'",
         "{\"line\":1,\"input\":\"rem(A,2) & B == 1 && ~B\",\"result\":\"(A % 2 & B == 1) && !B\"}\n",
         "line 1: warning: C reads the element-wise logical and"},
        {"vtsym pp --given 'A = 1' A", "", "vtsym: --given: ...  A = 1\n    ^", 1},
        {"vtsym convert --to pp 'a b' 'A.B_C == A_B.C && x > .5'", "\nA_B_C == A_B_C && x > 0.5\n",
         "line 1: ...line 2: warning: a preprocessor has no real constants: 0.5...line 2: warning: A.B_C and A_B.C are "
         "both written A_B_C",
         1},
        {"vtsym simplify --to pp 'A>1||A<=1' '!(A.B<3)&&C||0'", "1\nA_B >= 3 && C\n"},
        {"vtsym convert --from quill --to c 'x.^2 > 1'", "x.^2>1\n", "C has no element-wise power"},
    });
}

TEST(Program, WorksOnDimensions) {
    expectRows({
        {"vtsym dims 'N*2.0 + N/3 + 1.4' '2*3' s.x",
         "cast        N*2+N/3+1\nsimplified  N*2+N/3+1\nfactored    (N*2*3+N+1*3)/3\nsymbols     N\n\n"
         "cast        2*3\nsimplified  6\nfactored    6\nvalue       6\n\n"
         "cast        s.x\nsimplified  s.x\nfactored    s.x\nsymbols     s.x\n"},
        {"vtsym dims -D N=6 -D 'M=N - 1' --json\n[N/2 + M/3, 4]\nN + K\nN +\n",
         R"json({"line":1,"input":"[N/2 + M/3, 4]","cast":"[N/2+M/3,4]","simplified":"[N/2+M/3,4]","factored":"[(N*3+M*2)/(2*3),4]","symbols":["N","M"],"type":"vector","value":[4,4]}
{"line":2,"input":"N + K","cast":"N+K","simplified":"N+K","factored":"N+K","symbols":["N","K"]}
{"line":3,"input":"N +","error":{"id":"Vantor:SymbolicDims:InvalidExpression","message":"The expression \"N +\" cannot be read at its end: correct it there. The text ends where a value must follow.","offset":3}}
)json",
         "", 1},
        {"vtsym dims N^2", "\n", "line 1: ...power", 1},
        {"vtsym dims -D 3=N N", "", "'3' is not a name", 2},
    });
}

TEST(Program, ShowsTrees) {
    expectRows({
        {"vtsym tree 's.gear > 2.5' x", "GreaterThan >\n├─ MemberValue .gear\n│  └─ s\n└─ 2.5 (real literal)\n\nx\n"},
        {"vtsym tree '(a+b)*(a+b)'", "Multiply *\n├─ #4 Plus +\n│  ├─ a\n│  └─ b\n└─ #4 as above\n"},
        {"vtsym tree --json\nN+1\n(a+b)*(a+b)\ns.x<.5\ntrue\n",
         R"json({"line":1,"input":"N+1","tree":{"kind":"SymbolicPlusExpr","op":3,"id":4,"inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"N"},{"kind":"SymbolicIntValue","op":1,"id":2,"value":1}]}}
{"line":2,"input":"(a+b)*(a+b)","tree":{"kind":"SymbolicMultiplyExpr","op":6,"id":5,"inputs":[{"kind":"SymbolicPlusExpr","op":3,"id":4,"inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"a"},{"kind":"SymbolicString","op":0,"id":2,"text":"b"}]},{"id":4}]}}
{"line":3,"input":"s.x<.5","tree":{"kind":"SymbolicLessThanExpr","op":11,"id":6,"inputs":[{"kind":"SymbolicMemberValue","op":31,"id":5,"name":"x","inputs":[{"kind":"SymbolicString","op":0,"id":3,"text":"s"}]},{"kind":"SymbolicDoubleValue","op":2,"id":2,"value":0.5}]}}
{"line":4,"input":"true","tree":{"kind":"SymbolicString","op":0,"id":1,"text":"true"}}
)json"},
        {"vtsym tree --dot 'N*2 + N'",
         "digraph expression {\n  node [shape=box, fontname=monospace];\n  n2 [label=\"N\", style=rounded];\n"
         "  n3 [label=\"2\", style=rounded];\n  n4 [label=\"Multiply *\"];\n  n4 -> n2;\n  n4 -> n3;\n"
         "  n5 [label=\"Plus +\"];\n  n5 -> n4;\n  n5 -> n2;\n}\n"},
    });
}

TEST(Program, DrawsDeepTreesInBoundedColumns) {
    std::string sum = "x0";
    for (int i = 1; i < 3000; ++i)
        sum += "+x" + std::to_string(i);
    const std::vector<std::string> lines = linesOf(runProgram({"tree"}, sum).output);
    EXPECT_EQ(std::ranges::count_if(lines, [](const auto& line) { return line.ends_with("Plus +"); }), 2999);
    EXPECT_EQ(std::ranges::count_if(lines, [](const auto& line) { return line.find(" x") != line.npos; }), 3000);
    EXPECT_THAT(lines, ::testing::Each(::testing::SizeIs(::testing::Lt(200))));
}

TEST(Program, ListsOperators) {
    const std::vector<std::string> lines = linesOf(runProgram({"operators"}).output);
    const std::vector<std::string> objects = linesOf(runProgram({"operators", "--json"}).output);
    ASSERT_EQ(lines.size(), operatorTable().size() + 1);
    ASSERT_EQ(objects.size(), operatorTable().size());
    EXPECT_THAT(lines[9], AllOf(HasSubstr("Modulo"), HasSubstr("%"), HasSubstr("rem")));
    EXPECT_THAT(objects[8], AllOf(HasSubstr(R"("op":8,)"), HasSubstr(R"("SymbolicModuloExpr")"), HasSubstr(R"("%")")));
}

TEST(Program, RefusesWrongUsageWithAHint) {
    expectRows({
        {"vtsym", "", "a command is missing...Usage: vtsym", 2},
        {"vtsym simplfy a", "", "there is no command 'simplfy'; did you mean simplify?...Try 'vtsym --help'", 2},
        {"vtsym simplify -x", "", "there is no option '-x'...that begins with - after --...Try 'vtsym simplify --help'",
         2},
        {"vtsym operators x", "", "'x' is one argument too many...Try 'vtsym operators --help'", 2},
        {"vtsym convert --to basic a", "", "--to: 'basic' is not offered; c, quill or pp is", 2},
        {"vtsym tree --json --dot a", "", "--json...--dot", 2},
        {"vtsym ''", "", "vtsym: there is no command ''\nTry", 2},
        {"vtsym xy", "", "vtsym: there is no command 'xy'\nTry", 2},
        {"vtsym -- simplify A", "", "there is no command '--'", 2},
        {"vtsym check", "", "MODEL is required...Try 'vtsym check --help'", 2},
        {"vtsym check -- m.json", "", "vtsym: m.json: cannot be read", 2},
        {"vtsym check [m]", "", "vtsym: [m]: cannot be read", 2},
        {"vtsym check --html [p] m.json", "", "vtsym: m.json: cannot be read", 2},
        {"vtsym check --html -- m.json", "", "--html: 1 required FILE missing", 2},
        {"vtsym scan -- -a.c {}", "", "vtsym: -a.c: cannot be read...vtsym: {}: cannot", 2},
        {"vtsym eval -D [1]", "", "-D: '[1]' is not NAME=VALUE", 2},
        {"vtsym eval -D {}", "", "-D: '{}' is not NAME=VALUE", 2},
        {"vtsym symbols --kinds [members]", "", "'[members]' is not offered", 2},
        {"vtsym eval -D N", "", "'N' is not NAME=VALUE...Try 'vtsym eval --help'", 2},
        {"vtsym eval -D N=", "", "'N=' gives no value", 2},
        {"vtsym eval -D N+1=2", "", "'N+1' is not a name that can be given a value", 2},
        {"vtsym eval -D 'a b=1'", "", "the name 'a b' cannot be read", 2},
        {"vtsym simplify --feature Nope=1 a", "", "there is no feature flag \"Nope\"", 2},
    });
}

TEST(Program, HelpsOnRequest) {
    for (const std::string command : {"", "simplify", "convert", "pp", "tree", "eval", "dims", "symbols", "replace",
                                      "repl", "operators", "compare", "given", "check", "scan"}) {
        SCOPED_TRACE(command);
        const ProgramResult help = runScript(Workplace(), "vtsym " + command + " --help");
        EXPECT_EQ(help.status, 0);
        EXPECT_EQ(help.words, "");
        EXPECT_THAT(help.output, AllOf(HasSubstr("Examples:\n  vtsym "), HasSubstr(command)));
        EXPECT_EQ(runScript(Workplace(), "vtsym help " + command).output, help.output);
    }
    EXPECT_THAT(runProgram({"--version"}).output, ::testing::MatchesRegex("vtsym [0-9]+\\.[0-9]+\\.[0-9]+\n"));
}

TEST(Program, AnswersTheSameHoweverItIsAsked) {
    std::string input;
    for (const CorpusFile& file : corpusFiles) {
        const std::vector<std::string> lines = corpusLines(file.name);
        for (std::size_t i = 0; i < lines.size(); i += 7)
            input += lines[i] + "\n";
    }
    const std::vector<std::string> inputs = linesOf(input);
    ASSERT_GT(inputs.size(), 1000U);
    const ProgramResult plain = runProgram({"simplify"}, input);
    const ProgramResult uncached = runProgram({"simplify"}, input, {"VTSYM_FEATURES=CacheSymExprSimplifyResults=0"});
    EXPECT_EQ(uncached.output, plain.output);
    EXPECT_EQ(uncached.words, plain.words);
    const std::vector<std::string> answers = linesOf(plain.output);
    const std::vector<std::string> objects = linesOf(runProgram({"simplify", "--json", "--explain"}, input).output);
    ASSERT_EQ(answers.size(), inputs.size());
    ASSERT_EQ(objects.size(), inputs.size());
    for (std::size_t i = 0; i < inputs.size(); ++i) {
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
    std::string longText;
    for (int i = 0; i < 100'000; ++i)
        longText += "a == 1 && ";
    const Strings texts{
        std::string(200'000, '('), std::string(3'000'000, 'x'), everyByte, "1.e999999999", std::string(500'000, '9'),
        longText + "b c"};
    std::string input;
    for (const std::string& text : texts)
        input += text + "\n";
    for (Strings arguments : std::initializer_list<Strings>{
             {"simplify"}, {"simplify", "--explain"}, {"convert"}, {"tree"}, {"symbols"}, {"replace", "a=d"}}) {
        const ProgramResult result = runProgram(arguments, input);
        EXPECT_EQ(result.status, 1);
        EXPECT_THAT(result.output, HasSubstr(texts[1].substr(0, 90)));
        for (const std::string& line : linesOf(result.words)) // messages and carets stay on a screen
            EXPECT_LT(line.size(), 400U);
        EXPECT_THAT(result.words, HasSubstr("== 1 && a == 1 && b c\n"));
        EXPECT_THAT(result.words, Not(HasSubstr(std::string(1, '\x01'))));
        arguments.emplace_back("--json");
        const std::vector<std::string> objects = linesOf(runProgram(arguments, input).output);
        ASSERT_EQ(objects.size(), texts.size());
        for (std::size_t i = 0; i < objects.size(); ++i)
            EXPECT_EQ(Json::parse(objects[i]).contains("error"), i != 1);
    }
}

TEST(Program, ColoursOnlyATerminalThatWantsThem) {
    const Strings arguments{"simplify", "a b", "A==1 && A==2"};
    for (const auto& [environment, hasColours] : std::initializer_list<std::pair<Strings, bool>>{
             {{}, true}, {{"NO_COLOR="}, true}, {{"NO_COLOR=1"}, false}, {{"TERM=dumb"}, false}}) {
        const std::string shown = runOnTerminal(arguments, "", environment).output;
        EXPECT_EQ(shown.find("\033") != std::string::npos, hasColours) << shown;
        EXPECT_THAT(shown, HasSubstr("false"));
    }
    EXPECT_THAT(runProgram(arguments).words, Not(HasSubstr("\033")));
}

} // namespace
} // namespace VT::Testing
