// The program: what it answers, what it says, and its exit status.
#include "tests/support/Parsing.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"
#include "tests/tools/Program.hpp"

#include <bitset>
#include <gmock/gmock.h>
#include <nlohmann/json.hpp>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

TEST(Program, KeepsToItsTranscripts) {
    for (const char* const file : {"program-commands.txt", "program-usage.txt", "program-models.txt"})
        expectTranscript(file);
    expectTranscript("program-files.txt", {{"c.c", "#if A\n#if A\n#endif\n#endif\n"}, // 27 bytes
                                           {"m", R"({"blocks": [{"name": "b", "condition": "A && !A"}]})"}});
}

TEST(Program, CompletesWhatIsTyped) {
    // "Mo", Tab
    const ProgramResult typed = runOnTerminal({"repl"}, "Mode==1 && Gear>2\na b\nMo\t==7\n:quit\n", {"TERM=dumb"});
    EXPECT_EQ(typed.status, 0);
    EXPECT_THAT(typed.out, AllOf(HasSubstr("> "), HasSubstr("Mode==1 && Gear>2\r\n"), HasSubstr("a b\r\n    ^"),
                                 HasSubstr("Mode==7\r\n")));
}

TEST(Program, AnswersTheSameHoweverItIsAsked) {
    std::string input;
    for (const CorpusFile& file : corpusFiles) {
        const std::vector<std::string> lines = corpusLines(file.name);
        for (std::size_t i = 0; i < lines.size(); i += 7)
            input += lines[i] + "\n";
    }
    input += input; // the caches know the second half
    const std::vector<std::string> inputs = linesOf(input);
    ASSERT_GT(inputs.size(), 1000U);
    const ProgramResult plain = runProgram({"simplify"}, input);
    const ProgramResult uncached = runProgram({"simplify"}, input, {"VTSYM_FEATURES=CacheSymExprSimplifyResults=0"});
    EXPECT_EQ(uncached.out, plain.out);
    EXPECT_EQ(uncached.err, plain.err);
    const std::vector<std::string> answers = linesOf(plain.out);
    const std::vector<std::string> objects = linesOf(runProgram({"simplify", "--json", "--explain"}, input).out);
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
    const Strings texts{std::string(200'000, '('), std::string(3'000'000, 'x'),         everyByte, "1.e999999999",
                        std::string(500'000, '9'), times(100'000, "a == 1 && ") + "b c"};
    std::string input;
    for (const std::string& text : texts)
        input += text + "\n";
    for (Strings arguments : std::initializer_list<Strings>{
             {"simplify"}, {"simplify", "--explain"}, {"convert"}, {"tree"}, {"symbols"}, {"replace", "a=d"}}) {
        const ProgramResult result = runProgram(arguments, input);
        EXPECT_EQ(result.status, 1);
        EXPECT_THAT(result.out, HasSubstr(texts[1].substr(0, 90)));
        for (const std::string& line : linesOf(result.err)) // messages and carets stay on a screen
            EXPECT_LT(line.size(), 400U);
        EXPECT_THAT(result.err, HasSubstr("== 1 && a == 1 && b c\n"));
        EXPECT_THAT(result.err, Not(HasSubstr(std::string(1, '\x01'))));
        arguments.emplace_back("--json");
        const std::vector<std::string> objects = linesOf(runProgram(arguments, input).out);
        ASSERT_EQ(objects.size(), texts.size());
        for (std::size_t i = 0; i < objects.size(); ++i)
            EXPECT_EQ(Json::parse(objects[i]).contains("error"), i != 1);
    }
}

TEST(Program, ColoursOnlyATerminalThatWantsThem) {
    const Strings arguments{"simplify", "a b", "A==1 && A==2"};
    for (const auto& [environment, hasColours] : std::initializer_list<std::pair<Strings, bool>>{
             {{}, true}, {{"NO_COLOR="}, true}, {{"NO_COLOR=1"}, false}, {{"TERM=dumb"}, false}}) {
        const std::string shown = runOnTerminal(arguments, "", environment).out;
        EXPECT_EQ(shown.find("\033") != std::string::npos, hasColours) << shown;
        EXPECT_THAT(shown, HasSubstr("false"));
    }
    EXPECT_THAT(runProgram(arguments).err, Not(HasSubstr("\033")));
}

TEST(Check, AgreesWithBruteForce) {
    std::mt19937_64 random(7);
    const ConditionShape shape{.lowest = 0};
    using Truths = std::bitset<216>; // at the values from -1 to 4, which stand for all integers
    const auto truthsOf = [](const std::string& condition) {
        SymbolicExprTable table;
        const Truth truth(table, read(table, condition));
        Truths truths;
        std::size_t at = 0;
        forEachAssignment(ConditionShape().symbols, -1, 4,
                          [&](const Assignment& values) { truths[at++] = truth.under(values) != 0; });
        return truths;
    };
    Json blocks = Json::array();
    std::set<std::string> expected;
    std::map<std::string, std::vector<unsigned>> overlaps; // by set: the two bits of each pair
    const auto expectUsed = [&](const std::string& name, const Truths& truths, const Truths& around) {
        if (truths.none() || truths == around)
            expected.insert((truths.none() ? "dead " : "always-active ") + name);
    };
    for (int n = 0; n < 400; ++n) {
        const std::string name = "S" + std::to_string(n);
        const std::string condition = randomCondition(random, 1 + random() % 6, shape);
        const Truths parent = truthsOf(condition);
        expectUsed(name, parent, Truths().set());
        Json choices = Json::array();
        std::vector<Truths> active;
        Truths missing = parent;
        for (std::size_t left = 2 + random() % 4; left > 0; --left) {
            const std::string choice = std::to_string(active.size());
            const std::string text = randomCondition(random, 1 + random() % 4, shape);
            choices.push_back({{"name", choice}, {"condition", text}});
            active.push_back(parent & truthsOf(text));
            missing &= ~active.back();
            if (parent.none())
                continue;
            expectUsed(name + "/" + choice, active.back(), parent);
            for (std::size_t i = 0; i + 1 < active.size(); ++i)
                if ((active[i] & active.back()).any()) {
                    overlaps[name].push_back(1U << i | 1U << (active.size() - 1));
                    expected.insert("overlapping " + name + "/" + std::to_string(i) + " " + name + "/" + choice);
                }
        }
        if (missing.any())
            expected.insert("missing " + name);
        blocks.push_back({{"name", name}, {"condition", condition}, {"choices", choices}});
    }
    std::set<std::string> found;
    std::ptrdiff_t removals = 0;
    std::string shortened;
    std::string equivalent;
    const TemporaryFolder place;
    place.write("m", Json({{"blocks", blocks}}).dump());
    for (const std::string& line : linesOf(runScript(place, "vtsym check --json m").out)) {
        const Json finding = Json::parse(line);
        const std::string kind = finding["kind"];
        if (kind == "choices") {
            const std::string name = finding["name"];
            const auto ends = [&](unsigned removed) {
                return std::ranges::all_of(overlaps[name], [&](unsigned pair) { return (pair & removed) != 0; });
            };
            unsigned removed = 0;
            for (const std::string path : finding["remove"])
                removed |= 1U << std::stoul(path.substr(name.size() + 1));
            ASSERT_TRUE(finding["smallest"] && ends(removed) && overlaps[name].size() > 1) << line;
            for (unsigned other = 0; other < 32; ++other)
                ASSERT_TRUE(!ends(other) || std::popcount(other) >= std::popcount(removed)) << line;
            ++removals;
            continue;
        }
        if (kind == "redundant") {
            const Json& around = finding["follows"];
            const std::string context = around.empty() ? "(" : "(" + around[0]["text"].get<std::string>() + ") && (";
            shortened += context + finding["condition"].get<std::string>() + ")\t" + context +
                         finding["proposed"].get<std::string>() + ")\n";
            equivalent += "equivalent\n";
        } else
            found.insert(kind + (kind == "overlapping" ? " " + finding["follows"][0]["name"].get<std::string>() : "") +
                         " " + finding["name"].get<std::string>());
    }
    EXPECT_EQ(found, expected);
    EXPECT_EQ(removals, std::ranges::count_if(overlaps, [](const auto& each) { return each.second.size() > 1; }));
    EXPECT_GT(found.size(), 1000U);
    EXPECT_GT(equivalent.size(), 1000U);
    EXPECT_EQ(runProgram({"compare"}, shortened).out, equivalent);
}

} // namespace
} // namespace VT::Testing
