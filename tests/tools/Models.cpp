// vtsym check: what it finds in models, against brute force too, and what it says of files that are none.
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Truth.hpp"
#include "tests/tools/Program.hpp"

#include <bitset>
#include <gmock/gmock.h>
#include <nlohmann/json.hpp>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

ProgramResult checked(const std::string& model, const std::string& options = {}) {
    const Workplace place;
    place.write("m", model);
    return runScript(place, "vtsym check " + options + " m");
}

std::string set(const std::string& parent, const std::vector<std::string>& conditions) {
    Json choices = Json::array();
    for (std::size_t i = 0; i < conditions.size(); ++i)
        choices.push_back({{"name", "c" + std::to_string(i)}, {"condition", conditions[i]}});
    return Json({{"blocks", {{{"name", "S"}, {"condition", parent}, {"choices", choices}}}}}).dump();
}

TEST(Check, TellsWhatIsWrongWithChoices) {
    struct Set {
        std::string parent;
        std::vector<std::string> choices;
        std::string output;
        int status;
    };

    for (const Set& row : std::initializer_list<Set>{
             {"", {"A==1", "A==2", "(default)"}, "", 0},
             {"", {"(sim)", "(codegen)"}, "", 0},
             {"A", {""}, "", 0},
             {"A", {"(default)"}, "", 0},
             {"", {"A>0", "A<0"}, "m:1: no choice of S is active for A=0\n", 1},
             {"", {"A>0", "A<2"}, "m:1: S/c0 and S/c1 are both active for A=1\n", 1},
             {"A==3",
              {"A==2", "A==3 && B", "A>1 && A<1", "(default)"},
              "m:1: S/c0 is never active: A==2 cannot hold where S is active\n"
              "m:1: S/c1: A==3 && B can be written B where S is active\n"
              "m:1: S/c2 is never active: A>1 && A<1 never holds\n",
              1},
             {"A>2",
              {"A>1", "(default)"},
              "m:1: S/c0 is always active where S is\n"
              "m:1: S/c1 is never active: the other choices leave nothing to it\n",
              1},
             {"",
              {"A>=3", "A==3", "A==4", "!(A!=4)", "A<3"},
              "m:1: S/c0 and S/c1 are both active for A=3; S/c1 is never active without S/c0\n"
              "m:1: S/c0 and S/c2 are both active for A=4; S/c2 is never active without S/c0\n"
              "m:1: S/c0 and S/c3 are both active for A=4; S/c3 is never active without S/c0\n"
              "m:1: S/c2 and S/c3 are both active for A=4; neither is ever active without the other\n",
              1},
             {"A && !A", {"B"}, "m:1: S is never active: A && !A never holds\n", 1},
         }) {
        const ProgramResult result = checked(set(row.parent, row.choices));
        EXPECT_EQ(result.output, row.output);
        EXPECT_EQ(result.words, "");
        EXPECT_EQ(result.status, row.status);
    }
    EXPECT_EQ(checked(set("", {"A<2147483647", "A==2147483647"}), "--bits 32").status, 0);
    EXPECT_EQ(checked(set("", {"A<2147483647", "A==2147483647"})).status, 1);
    const ProgramResult open = checked(set("", {"A*A==2", "A*A!=2 || B"}));
    EXPECT_EQ(open.status, 2);
    EXPECT_THAT(open.words, HasSubstr("m:1: Whether S/c0 can be active stays undecided: it hangs on arithmetic"));
}

constexpr const char* nested = R"json({
  "language": "quill",
  "blocks": [
    {"name": "Top", "condition": "A > 0", "blocks": [
      {"name": "In", "condition": "A ~= 0"},
      {"name": "Gone", "condition": "A == 0",
       "choices": [{"name": "x", "condition": "A"}, {"name": "y", "condition": "A"}]},
      {"name": "Set", "choices": [
        {"name": "é", "condition": "B & 1 == 1 && A >= 1"},
        {"condition": "(default)", "name": "other"}]}]},
    {"name": "Side", "condition": "A < 0"}],
  "ports": [{"name": "p", "from": "Top/Set/other", "to": ["Side", "Top/Gone"]},
            {"name": "q", "from": "Top/Set", "to": "Top/In"}]
})json";

TEST(Check, FollowsBlocksAndPorts) {
    EXPECT_EQ(
        checked(nested).output,
        "m:5: Top/In is always active where Top is\n"
        "m:6: Top/Gone is never active: A == 0 cannot hold where Top is active\n"
        "m:9: Top/Set/é: B & 1 == 1 && A >= 1 can be written B & 1==1 where Top/Set is active\n"
        "m:12: the port p is never active: Top/Set/other is never active together with a block that it goes to\n");
    EXPECT_EQ(linesOf(checked(nested, "--json").output).at(0),
              R"json({"file":"m","line":5,"kind":"always-active","name":"Top/In","condition":"A ~= 0",)json"
              R"json("witness":"A=1","follows":[{"line":4,"name":"Top","text":"A > 0"}]})json");
    // A fix is the text of the file that is to go, and what comes in its place.
    const Json log = Json::parse(checked(nested, "--sarif").output);
    const Json change = log["runs"][0]["results"][2]["fixes"][0]["artifactChanges"][0]["replacements"][0];
    EXPECT_EQ(change, Json::parse(R"({"deletedRegion":{"startLine":9,"startColumn":36,"endLine":9,"endColumn":58},)"
                                  R"("insertedContent":{"text":"\"B & 1==1\""}})"));
}

TEST(Check, SaysWhatToChangeInAFile) {
    for (const auto& [model, words] : std::initializer_list<std::pair<std::string, std::string>>{
             {"", "m:1: This is no JSON: "},
             {"{\"blocks\": [\n}", "m:2: This is no JSON: syntax error"},
             {"[]", "m:1: the model: a model is an object: write {"},
             {"{\"blocks\":\n {}}", "m:2: /blocks: write a list, [...]."},
             {"{\"blocks\": [\n3]}", "m:2: /blocks/0: write a block, {"},
             {"{\"blocks\": [{\"name\": \"a\"},\n {\"nam\": 1}]}",
              "m:2: /blocks/1: there is no member \"nam\"; a block has name, description, condition, blocks, choices."},
             {"{\"blocks\": [{\"name\": \"a\"},\n {\"condition\": \"\"}]}",
              "m:2: /blocks/1: a block without \"name\": add it."},
             {"{\"blocks\": [{\"name\": \"a\", \"choices\": [{\"name\":\n null}]}]}",
              "m:2: /blocks/0/choices/0/name: write a text in quotes."},
             {"{\"blocks\": [{\"name\": \"a/b\"}]}", "m:1: /blocks/0/name: a name holds \"/\""},
             {"{\"blocks\": [{\"name\": \"\"}]}", "m:1: /blocks/0/name: a name is empty"},
             {"{\"blocks\": [{\"name\": \"a\", \"name\": \"b\"}]}", "/blocks/0/name: this member is here twice"},
             {"{\"blocks\": [{\"name\": \"a\"},\n{\"name\": \"a\"}]}",
              "m:2: /blocks/1/name: there is another a beside"},
             {"{\"language\": \"basic\"}", "m:1: /language: there is no language \"basic\": write \"c\" or \"quill\"."},
             {"{\"ports\": [{\"name\": \"p\",\n \"from\": \"a/b\"}]}", "m:2: /ports/0/from: there is no block \"a/b\""},
             {"{\"ports\": [{\"name\": \"p\", \"from\": \"a\", \"to\": [1]}]}",
              "/ports/0/to/0: write the path of a block"},
             {set("", {"A", "B +", "(default)", "(default)"}), "m:1: S/c1: The condition \"B +\" cannot be read"},
             {set("", {"(default)", "(default)"}), "m:1: S/c1: There is another \"(default)\" choice"},
             {set("(default)", {"A", "!A"}), "m:1: S: \"(default)\" is for choices alone"},
         }) {
        const ProgramResult result = checked(model);
        EXPECT_EQ(result.output, "");
        EXPECT_THAT(result.words, HasSubstr(words));
        EXPECT_EQ(result.status, 2);
    }
}

TEST(Check, WritesAPageThatStandsAlone) {
    const Workplace folder;
    const Json choices{{{"name", "<i>"}, {"condition", "A<3&&B"}}, {{"name", "j"}, {"condition", "A>1"}}};
    const Json block{{"name", "<b>&\"'"}, {"choices", choices}};
    folder.write("m", Json({{"name", "</title><script>x"}, {"blocks", {block}}}).dump());
    EXPECT_EQ(runScript(folder, "vtsym check --html page m").status, 1);
    const std::string html = folder.read("page");
    EXPECT_THAT(html, HasSubstr("title=\"&lt;i&gt; and j are both active for A=2, B=1\""));
    EXPECT_THAT(html, HasSubstr("<h2>&lt;b&gt;&amp;&quot;&#39;</h2>"));
    for (const char* outside : {"<b>&\"", "<i>", "</title><script>x", "http:", "https:", "src=", "url("})
        EXPECT_THAT(html, Not(HasSubstr(outside)));
    EXPECT_EQ(runScript(folder, "vtsym check --html /nowhere/page m").status, 2);
    folder.write("m", set("", {"A>=3", "A==3", "A<3"}));
    runScript(folder, "vtsym check --html page m");
    EXPECT_THAT(folder.read("page"), HasSubstr("active for A=3&#10;c1 is never active without c0.\""));
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
                if ((active[i] & active.back()).any())
                    expected.insert("overlapping " + name + "/" + std::to_string(i) + " " + name + "/" + choice);
        }
        if (missing.any())
            expected.insert("missing " + name);
        blocks.push_back({{"name", name}, {"condition", condition}, {"choices", choices}});
    }
    std::set<std::string> found;
    std::string shortened;
    std::string equivalent;
    for (const std::string& line : linesOf(checked(Json({{"blocks", blocks}}).dump(), "--json").output)) {
        const Json finding = Json::parse(line);
        const std::string kind = finding["kind"];
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
    EXPECT_GT(found.size(), 1000U);
    EXPECT_GT(equivalent.size(), 1000U);
    EXPECT_EQ(runProgram({"compare"}, shortened).output, equivalent);
}

TEST(Check, BoundsItsWork) {
    std::vector<std::string> apart;
    std::vector<std::string> together;
    for (int i = 0; i < 10'000; ++i) {
        apart.push_back("MODE == " + std::to_string(i) + (i % 3 == 0 ? " && GEAR > 2" : ""));
        together.push_back("X" + std::to_string(i));
    }
    apart.emplace_back("(default)");
    EXPECT_EQ(checked(set("MODE >= 0", apart)).status, 0);
    const ProgramResult many = checked(set("", {together.begin(), together.begin() + 100}));
    EXPECT_THAT(many.output, HasSubstr("more choices of S overlap than the pairs told"));

    // Blocks in blocks as deep as files may be.
    std::string deep;
    std::string end;
    constexpr int depth = 100'000;
    for (int i = 0; i < depth; ++i) {
        deep += std::string(i == 0 ? "{" : ",") + "\"blocks\":[{\"name\":\"b\",\"condition\":\"P" +
                std::to_string(i % 50) + " > 0\"";
        end += "}]";
    }
    const ProgramResult result = checked(deep + ",\"choices\":[{\"name\":\"c\",\"condition\":\"P1<1\"}]" + end + "}");
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output,
                HasSubstr(".../b/b/b/b/b/b/b/c is never active: P1<1 cannot hold where .../b/b/b/b/b/b/b/b is"));
}

} // namespace
} // namespace VT::Testing
