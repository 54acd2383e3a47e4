// Whatever the program is given, a terminal takes no orders from what it writes.
#include "host/Text.hpp"
#include "tests/support/Cases.hpp"
#include "tests/tools/Program.hpp"

#include <algorithm>
#include <array>
#include <boost/algorithm/string/replace.hpp>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace VT::Testing {
namespace {

using Json = nlohmann::json;

/// Escape, bell, DEL; CSI in one character, override, line separator; right-to-left mark and what is not UTF-8; marks
/// and isolates; tags.
const std::array<std::string, 5> hostileTexts{"\x1b[1m\x07\x7f", "\xc2\x9b\xe2\x80\xae\xe2\x80\xa8",
                                              "\xe2\x80\x8f\xff\xc3", "\xd8\x9c\xe2\x81\xa6", "\xf3\xa0\x81\x81"};

const std::string file = "program-hostile.txt";

/// The first line that does not stand as it would be shown to a terminal.
std::string spoiled(const std::string& text) {
    const std::vector<std::string> lines = linesOf(text);
    const auto at = std::ranges::find_if(lines, [](const auto& line) { return shownText(line) != line; });
    return at == lines.end() ? "" : *at;
}

/// Runs `vtsym` with the words of a command, in which @ stands for a text.
void expectSafe(const TemporaryFolder& place, const std::string& command, const std::string& text,
                const std::string& input = {}, const std::string& flags = {}) {
    const std::string script = "vtsym " + boost::replace_all_copy(command, "@", "'" + text + "'");
    const ProgramResult result = runScript(place, script, input, {"VTSYM_LOG=debug", "VTSYM_FEATURES=" + flags});
    SCOPED_TRACE(Json(script).dump(-1, ' ', true, Json::error_handler_t::replace));
    EXPECT_LE(result.status, 2); // a signal is above
    EXPECT_EQ(spoiled(result.out), "");
    EXPECT_EQ(spoiled(result.err), "");
    EXPECT_NE(result.out + result.err, "");
}

TEST(Output, IsSafeForTerminalsWhateverTheArguments) {
    const TemporaryFolder place;
    place.write("m", "{}");
    for (const std::string& text : hostileTexts) {
        for (const CaseRow& row : casesOf(file, "arguments", 1))
            expectSafe(place, row[0], text);
        expectSafe(place, "simplify A", {}, {}, text + "=1," + text + ",CacheSymExprSimplifyResults=" + text);
    }
}

TEST(Output, IsSafeForTerminalsWhateverTheTexts) {
    const TemporaryFolder place;
    for (const std::string& text : hostileTexts) {
        const std::string lines = text + "\nA" + text + "\nA == '" + text + "'\nf(\"" + text + "\") % {" + text +
                                  "\n/*" + text + "*/A\nA%" + text + "\n";
        for (const std::string command :
             {"simplify", "convert", "pp", "tree", "symbols", "eval", "dims", "compare", "given"})
            for (const char* option : {" --json", " --from=quill", " --from=c"})
                expectSafe(place, command + option, {}, lines);
        for (const char* command : {"simplify --explain", "tree --dot", "replace A=B"})
            expectSafe(place, command, {}, lines);
        std::string dialogue = lines;
        for (const char* word : {":", ":let ", ":let A=", ":tree ", ":pp ", ":quill ", ":explain "})
            dialogue += word + text + "\n";
        expectSafe(place, "repl", {}, dialogue);
    }
    // Texts in JSON are the texts that were given.
    for (const std::string& text : {hostileTexts[0], hostileTexts[1], hostileTexts[3], hostileTexts[4]})
        EXPECT_EQ(Json::parse(runProgram({"simplify", "--json", text}).out)["input"], text);
}

TEST(Output, IsSafeForTerminalsWhateverTheFiles) {
    for (const std::string& text : hostileTexts) {
        const TemporaryFolder place;
        place.run("mkdir sources");
        place.write("sources/" + text + ".c", boost::replace_all_copy(casesOf(file, "source", 1)[0][0], "@", text));
        for (const std::string option : {"--summary", "--json", "--sarif"})
            expectSafe(place, "scan " + option + " sources sources/@.c@", text);
        const std::string quoted = Json(text).dump(-1, ' ', true, Json::error_handler_t::replace);
        for (const CaseRow& row : casesOf(file, "models", 1))
            for (const std::string& part : {text, quoted.substr(1, quoted.size() - 2)}) {
                place.write("m", boost::replace_all_copy(row[0], "@", part));
                for (const std::string option : {"--json", "--sarif", "--bits=32"})
                    expectSafe(place, "check --html page m " + option, text);
                EXPECT_EQ(spoiled(place.read("page")), "");
            }
        EXPECT_NE(place.read("page"), "");
    }
}

} // namespace
} // namespace VT::Testing
