// The program answers the same on any number of processors.
#include "base/core/Limits.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/Pigeons.hpp"
#include "tests/tools/Program.hpp"

#include <filesystem>
#include <gmock/gmock.h>
#include <random>

namespace VT::Testing {
namespace {

/// Real conditions, and lines that are not conditions.
class Lines {
public:
    explicit Lines(unsigned seed) : random_(seed) {}

    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

    const std::string& condition() { return conditions_[below(conditions_.size())]; }

    std::string any() {
        const char* const odd[] = {"",    "A &&",  "x\t",       "A > 1\tA", "\xFF",
                                   "f(1", "N/2*2", "[1,2;3,4]", "2+3",      "a.b == 1"};
        return below(5) == 0 ? odd[below(std::size(odd))] : condition();
    }

private:
    std::mt19937 random_;
    std::vector<std::string> conditions_ = corpusLines("mbedtls-conditions.txt");
};

/// Runs a script with --jobs in place of JOBS, and expects the same for each number.  Returns it.
ProgramResult expectSame(const TemporaryFolder& place, const std::string& script, const std::string& input = {}) {
    ProgramResult one;
    for (const char* const jobs : {"1", "2", "7"}) {
        const std::string with = std::string("JOBS='--jobs ") + jobs + "'; " + script;
        const ProgramResult result = runScript(place, with, input);
        if (*jobs == '1')
            one = result;
        EXPECT_EQ(result.status, one.status) << with;
        EXPECT_EQ(result.out, one.out) << with;
        EXPECT_EQ(result.err, one.err) << with;
    }
    return one;
}

/// A file of chains over real conditions.
std::string sourceOf(Lines& lines) {
    std::string text;
    std::size_t depth = 0;
    for (std::size_t left = lines.below(30); left > 0; --left) {
        const std::size_t choice = lines.below(4);
        if (depth > 0 && choice == 0) {
            text += "#endif\n";
            --depth;
        } else if (depth > 0 && choice == 1) {
            text += "#elif " + lines.condition() + "\n";
        } else {
            text += "#if " + lines.condition() + "\n";
            ++depth;
        }
        text += lines.below(9) == 0 ? "/* vtsym: keep, for now */\n" : "int x; // code\n";
    }
    while (depth-- > 0)
        text += "#endif\n";
    return text;
}

TEST(Jobs, ScanAlike) {
    const TemporaryFolder place;
    place.run("mkdir -p tree/a/b tree/c");
    Lines lines(1);
    const char* const folders[] = {"tree/", "tree/a/", "tree/a/b/", "tree/c/"};
    for (int i = 0; i < 60; ++i)
        place.write(folders[lines.below(4)] + std::to_string(i) + (lines.below(3) == 0 ? ".hpp" : ".c"),
                    sourceOf(lines));
    place.run("printf '\\0' >tree/c/binary.c; ln -s nowhere tree/gone.c; printf '#if %s\\n#endif\\n' '" + pigeons(9) +
              "' >tree/hard.c");
    const ProgramResult plain = expectSame(place, "vtsym scan $JOBS --summary tree tree/gone.c");
    EXPECT_EQ(plain.status, 2);
    EXPECT_GT(linesOf(plain.out).size(), 20U);
    expectSame(place, "vtsym scan $JOBS --why --json -D MBEDTLS_AES_C --kinds all tree");
    expectSame(place, "vtsym scan $JOBS --sarif --assume 'MBEDTLS_SSL_TLS_C > 1' tree");
    expectSame(place, "vtsym scan $JOBS --fix --dry-run tree");
    expectSame(
        place,
        "vtsym scan $JOBS --write-baseline base.json tree; cat base.json; vtsym scan $JOBS --baseline base.json tree");
    expectSame(place,
               "git init -q work && cp -r tree work/ && cd work && git add . && "
               "git -c user.name=a -c user.email=a commit -qm 1 && sed -i s/MBEDTLS/OTHER/ tree/*.c tree/a/*.c && "
               "git -c user.name=a -c user.email=a commit -qam 2; vtsym scan $JOBS --diff HEAD~..HEAD; "
               "cd .. && rm -rf work");
    expectSame(place, "vtsym scan $JOBS --no-such-option; vtsym scan $JOBS nothing; vtsym scan $JOBS tree/1*");
}

TEST(Jobs, CheckAlike) {
    const TemporaryFolder place;
    Lines lines(2);
    for (int i = 0; i < 12; ++i) {
        std::string model = R"({"blocks": [{"name": "Top", "choices": [)";
        for (int choice = 0; choice < 5; ++choice)
            model += std::string(choice == 0 ? "" : ",") + "\n{\"name\": \"C" + std::to_string(choice) +
                     "\", \"condition\": \"" + (lines.below(2) == 0 ? "A" : "B") +
                     " == " + std::to_string(lines.below(4)) + "\"}";
        place.write("m" + std::to_string(i) + ".json", i == 7 ? "{" : model + "]}]}");
    }
    EXPECT_EQ(expectSame(place, "vtsym check $JOBS m*.json nothing.json").status, 2);
    EXPECT_EQ(expectSame(place, "vtsym check $JOBS --json --why --merge m[1-6].json").status, 1);
    expectSame(place, "vtsym check $JOBS --sarif --assume 'A > 1' m*.json");
    expectSame(place, "cp m1.json new.json; vtsym check $JOBS --fix new.json new.json m2.json; cat new.json");
    expectSame(place,
               "vtsym check $JOBS --html page.html m1.json; cat page.html; vtsym check --html p m1.json m2.json");
}

TEST(Jobs, AnswerLinesAlike) {
    const TemporaryFolder place;
    Lines lines(3);
    std::string texts;
    std::string pairs;
    for (int i = 0; i < 1500; ++i) {
        texts += lines.any() + "\n";
        pairs += lines.any() + "\t" + lines.any() + "\n";
    }
    texts += std::string(100'000, ' ') + "A > 1 && A > 2\n" + "a + " + std::string(70'000, '1') + "\nlast";
    for (const char* const command :
         {"convert --to quill", "convert --json", "simplify", "simplify --json", "simplify --explain", "symbols",
          "replace MBEDTLS_AES_C=X", "tree", "pp --given 'MBEDTLS_AES_C > 1'", "eval -D A=2", "dims", "repl"}) {
        const bool isRepl = std::string(command) == "repl";
        const ProgramResult one = expectSame(place, std::string("vtsym ") + command + (isRepl ? "" : " $JOBS"), texts);
        // Line by line, as a dialogue has them: the program waits between any two.
        if (std::string(command) == "simplify") {
            const std::string slowly = "while IFS= read -r l; do printf '%s\\n' \"$l\"; done | vtsym simplify";
            EXPECT_EQ(runScript(place, slowly, texts + "\n").out, one.out);
        }
    }
    for (const char* const command : {"compare", "given --why"})
        expectSame(place, std::string("vtsym ") + command + " $JOBS", pairs);
    expectSame(place,
               "printf 'A > 1 && A\\nB &&' | vtsym simplify $JOBS 'A && A' - 'B || B'; vtsym convert $JOBS A B C");
}

/// Lines of one chunk each, some hard: the steps of the command run out at the same line, and are shared in order.  The
/// preset for ThreadSanitizer leaves this out: all these steps take it minutes.
TEST(Jobs, ShareStepsInOrder) {
    constexpr std::size_t most = limits::commandSteps / limits::decisionSteps + 4;
    const std::string library =
        (std::filesystem::path(VTSYM_PROGRAM).parent_path().parent_path() / "lib/libvtsym.so.0").string();
    std::string input;
    for (std::size_t i = 0; i < most; ++i)
        input += pigeons(12) + " && x" + std::to_string(i) + std::string(66'000, ' ') + "\tA\n" + "A > 3\tA > " +
                 std::to_string(i) + std::string(66'000, ' ') + "\n";
    const TemporaryFolder place;
    place.run("mkdir lib && cp '" + library + "' lib/"); // without a solver
    std::vector<std::string> outs;
    for (const char* const jobs : {"1", "3"})
        outs.push_back(
            runScript(place, std::string("vtsym compare --jobs ") + jobs, input, {"LD_LIBRARY_PATH=lib"}).out);
    EXPECT_EQ(outs[0], outs[1]);
    EXPECT_THAT(outs[0], ::testing::HasSubstr("it takes more steps than one run may"));
    EXPECT_THAT(linesOf(outs[0]).back(), ::testing::HasSubstr("impl"));
}

/// Address space for a few stacks only.  Sanitizers reserve more than any limit.
TEST(Jobs, AreOneWhereTheSystemRefusesThreads) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "a sanitizer takes more address space than the limit";
#endif
    std::string texts;
    for (int i = 0; i < 3000; ++i)
        texts += "A == " + std::to_string(i) + " && B\n";
    const std::string expected = runProgram({"convert", "--jobs", "1"}, texts).out;
    const TemporaryFolder place;
    for (const char* const kilobytes : {"150000", "300000", "600000"}) {
        const ProgramResult limited =
            runScript(place, "ulimit -v " + std::string(kilobytes) + "; vtsym convert --jobs 64", texts);
        EXPECT_EQ(limited.status, 0) << kilobytes << limited.err;
        EXPECT_EQ(limited.out, expected) << kilobytes;
    }
}

TEST(Jobs, AreANumber) {
    for (const char* const wrong : {"0", "-1", "many", "1025", "2x", ""})
        EXPECT_EQ(runProgram({"scan", "--jobs", wrong, "."}).status, 2) << wrong;
}

} // namespace
} // namespace VT::Testing
