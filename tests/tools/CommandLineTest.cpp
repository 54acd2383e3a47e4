// The program: what it answers, what it says, and its exit status.
#include "base/core/Operators.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

namespace VT::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

TEST(Program, KeepsToItsTranscripts) {
    expectTranscript("program-commands.txt");
    expectTranscript("program-usage.txt");
}

TEST(Program, CompletesWhatIsTyped) {
    // "Mo", Tab
    const ProgramResult typed = runOnTerminal({"repl"}, "Mode==1 && Gear>2\na b\nMo\t==7\n:quit\n", {"TERM=dumb"});
    EXPECT_EQ(typed.status, 0);
    EXPECT_THAT(typed.output, AllOf(HasSubstr("> "), HasSubstr("Mode==1 && Gear>2\r\n"), HasSubstr("a b\r\n    ^"),
                                    HasSubstr("Mode==7\r\n")));
}

TEST(Program, KeepsDefinitionsWhenItStartsAnew) {
    std::string input;
    for (int i = 0; i < 60'000; ++i) {
        const std::string number = std::to_string(i);
        input += "N + x" + number + " * 0 * (" + number + " - y" + number + ")\n";
    }
    EXPECT_EQ(runProgram({"eval", "-D", "N=3"}, input + "N\n").output, std::string(60'000, '\n') + "3\n");
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
