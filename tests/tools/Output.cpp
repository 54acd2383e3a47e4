// Whatever the program is given, a terminal takes no orders from what it writes.
#include "host/Text.hpp"
#include "tests/tools/Program.hpp"

#include <algorithm>
#include <array>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace VT::Testing {
namespace {

using Json = nlohmann::json;

/// Escape, bell, DEL; CSI in one character, override, line separator; right-to-left mark and what is not UTF-8; marks
/// and isolates; tags.
const std::array<std::string, 5> hostileTexts{"\x1b[1m\x07\x7f", "\xc2\x9b\xe2\x80\xae\xe2\x80\xa8",
                                              "\xe2\x80\x8f\xff\xc3", "\xd8\x9c\xe2\x81\xa6", "\xf3\xa0\x81\x81"};

/// The first line that does not stand as it would be shown to a terminal.
std::string spoiled(const std::string& text) {
    const std::vector<std::string> lines = linesOf(text);
    const auto at = std::ranges::find_if(lines, [](const auto& line) { return shownText(line) != line; });
    return at == lines.end() ? "" : *at;
}

void expectSafe(const Strings& arguments, const std::string& input = {}, const std::string& flags = {}) {
    const ProgramResult result = runProgram(arguments, input, {"VTSYM_LOG=debug", "VTSYM_FEATURES=" + flags});
    SCOPED_TRACE(Json(arguments).dump(-1, ' ', true, Json::error_handler_t::replace));
    EXPECT_LE(result.status, 2); // a signal is above
    EXPECT_EQ(spoiled(result.output), "");
    EXPECT_EQ(spoiled(result.words), "");
    EXPECT_NE(result.output + result.words, "");
}

TEST(Output, IsSafeForTerminalsWhateverTheArguments) {
    for (const std::string& text : hostileTexts) {
        for (const Strings& arguments : std::initializer_list<Strings>{
                 {text},
                 {"-" + text},
                 {"--" + text},
                 {"help", text},
                 {"operators", text},
                 {"simplify", "-" + text},
                 {"simplify", "--" + text + "=1"},
                 {"simplify", "--from", text, "A"},
                 {"simplify", "--bits", text, "A"},
                 {"simplify", "--feature", text, "A"},
                 {"simplify", "--feature", text + "=" + text, "A"},
                 {"--feature", "VariantKeywordsSimCodegen=" + text, "simplify", "A"},
                 {"convert", "--to", text, "A"},
                 {"symbols", "--kinds", text, "A"},
                 {"eval", "-D", text, "A"},
                 {"eval", "-D", text + "=1", "A"},
                 {"eval", "-D", "A=" + text, "A"},
                 {"eval", "--from", "quill", "-D", "A='" + text + "'", "A"},
                 {"dims", "-D", text + "=1", "A"},
                 {"pp", "--given", text, "A"},
                 {"replace", "A=" + text, "A"},
                 {"compare", text},
                 {"compare", text, "A" + text},
                 {"given", "--json", text, "A" + text},
                 {"check", text},
                 {"check", "--html", text},
                 {"check", "--html", text + "/page", VTSYM_TEST_DATA "/../../examples/model.json"},
                 {"scan", text},
                 {"scan", "--max-size", text, "."},
             })
            expectSafe(arguments);
        expectSafe({"simplify", "A"}, {}, text + "=1," + text + ",CacheSymExprSimplifyResults=" + text);
    }
}

TEST(Output, IsSafeForTerminalsWhateverTheTexts) {
    for (const std::string& text : hostileTexts) {
        const std::string lines = text + "\nA" + text + "\nA == '" + text + "'\nf(\"" + text + "\") % {" + text +
                                  "\n/*" + text + "*/A\nA%" + text + "\n";
        for (const char* command : {"simplify", "convert", "pp", "tree", "symbols", "eval", "dims", "compare", "given"})
            for (const char* option : {"--json", "--from=quill", "--from=c"})
                expectSafe({command, option}, lines);
        for (const Strings& arguments :
             std::initializer_list<Strings>{{"simplify", "--explain"}, {"tree", "--dot"}, {"replace", "A=B"}})
            expectSafe(arguments, lines);
        std::string dialogue = lines;
        for (const char* word : {":", ":let ", ":let A=", ":tree ", ":pp ", ":quill ", ":explain "})
            dialogue += word + text + "\n";
        expectSafe({"repl"}, dialogue);
    }
    // Texts in JSON are the texts that were given.
    for (const std::string& text : {hostileTexts[0], hostileTexts[1], hostileTexts[3], hostileTexts[4]})
        EXPECT_EQ(Json::parse(runProgram({"simplify", "--json", text}).output)["input"], text);
}

TEST(Output, IsSafeForTerminalsWhateverTheFiles) {
    for (const std::string& text : hostileTexts) {
        const Workplace place;
        place.run("mkdir sources");
        const std::string name = "X" + text;
        const std::string source = place.write(
            "sources/" + text + ".c", "#ifdef " + name + "\n#ifdef " + name + "\n#elif A && defined " + name +
                                          "\n#endif\n#if A /*" + text + "*/ && A == '" + text + "'\n#elif A\n" +
                                          "#endif\n#endif\n#if B\n#if B && " + text + "\n#elif B\n#endif\n#endif");
        for (const char* option : {"--summary", "--json", "--sarif"})
            expectSafe({"scan", option, place.path("sources"), source + text});
        const auto named = [&](const std::string& suffix) { return name + suffix; };
        const Json choices = {{{"name", named("1")}, {"condition", "A<3"}},
                              {{"name", named("2")}, {"condition", "A>1"}},
                              {{"name", named("3")}, {"condition", name}},
                              {{"name", named("4")}, {"condition", "A<0 && A>2"}}};
        const Json good = {{{"name", name}, {"condition", "B && !B"}}, {{"name", named("s")}, {"choices", choices}}};
        const Json port = {{"name", name}, {"from", named("s")}, {"to", named("s") + "/" + named("4")}};
        std::vector<std::string> models{text, "{\"" + text + "\":1}", "{\"name\": \"" + text};
        Json sound = good;
        sound[1]["choices"].erase(2); // which cannot be read
        for (const Json& model : std::initializer_list<Json>{
                 {{"name", name}, {"blocks", good}},
                 {{"name", name}, {"blocks", sound}, {"ports", {port}}},
                 {{"language", name}},
                 {{name, name}},
                 {{"blocks", {{{"name", name + "/"}}}}},
                 {{"blocks", {{{"name", name}}, {{"name", name}}}}},
                 {{"ports", {port}}},
             })
            models.push_back(model.dump(-1, ' ', true, Json::error_handler_t::replace));
        for (const std::string& model : models) {
            const std::string file = place.write("m", model);
            for (const char* option : {"--json", "--sarif", "--bits=32"})
                expectSafe({"check", option, "--html", place.path("page"), file});
            EXPECT_EQ(spoiled(place.read("page")), "");
        }
        EXPECT_NE(place.read("page"), "");
    }
}

} // namespace
} // namespace VT::Testing
