// vtsym check: what it finds in models, against brute force too, and what it says of files that are none.
#include "tests/support/Parsing.hpp"
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

TEST(Check, KeepsToItsTranscript) {
    expectTranscript("program-models.txt");
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
