// What the program says about the solver, which a copy of its library in another folder does not find.
#include "tests/tools/Program.hpp"

#include <filesystem>
#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

const std::string library =
    (std::filesystem::path(VTSYM_PROGRAM).parent_path().parent_path() / "lib/libvtsym.so.0").string();
const std::string copyLibrary = "mkdir -p lib && cp '" + library + "' lib/ && ";
const Strings elsewhere{"LD_LIBRARY_PATH=lib"};

TEST(SolverAdvice, NamesThePackageWhereAQuestionNeedsIt) {
    const std::string undecided = "undecided: it depends on arithmetic beyond linear terms";
    const std::string question = "vtsym compare 'X*X == 2' 'X == 7'";
    const TemporaryFolder place;
    EXPECT_EQ(runScript(place, question).out, "disjoint; second alone: X=7\n");
    EXPECT_EQ(runScript(place, copyLibrary + question, {}, elsewhere).out,
              undecided +
                  "; a solver may decide it: apt install libvtsym-z3, then run this again; second alone: X=7\n");
    EXPECT_EQ(runScript(place, question, {}, {elsewhere[0], "VTSYM_SOLVER_PACKAGES=libz3-dev"}).out,
              undecided + "; a solver may decide it: apt install libz3-dev, then run this again; second alone: X=7\n");
    const ProgramResult broken =
        runScript(place, "mkdir lib/vtsym && echo no library > lib/vtsym/libvtsym-z3.so && " + question, {}, elsewhere);
    EXPECT_EQ(broken.out.find(undecided + "; the solver plugin lib/vtsym/libvtsym-z3.so cannot be used: "), 0U)
        << broken.out;
    EXPECT_EQ(runScript(place, "vtsym compare 'X > 3' 'X > 2'", {}, elsewhere).out, "implies; second alone: X=3\n")
        << "a question that needs no solver says nothing of it";
}

TEST(SolverAdvice, IsInEveryAnswer) {
    const TemporaryFolder place;
    const std::string reason = "it depends on arithmetic beyond linear terms; a solver may decide it: apt install "
                               "libvtsym-z3, then run this again";
    EXPECT_EQ(runScript(place, copyLibrary + "vtsym compare --json 'X*X == 2' 'X*X == 3'", {}, elsewhere).out,
              R"({"line":1,"a":"X*X == 2","b":"X*X == 3","relation":"undecided","reason":")" + reason + "\"}\n");
    EXPECT_EQ(runScript(place, "vtsym dims --prove 'N*N != 2'", {}, elsewhere).out, "undecided: " + reason + "\n");
    EXPECT_EQ(runScript(place, "vtsym dims --json --prove 'N*N != 2'", {}, elsewhere).out,
              R"({"claim":"N*N != 2","answer":"undecided","reason":")" + reason + "\"}\n");
    place.write("m",
                R"({"blocks": [{"name": "S", "choices": [{"name": "c", "condition": "A*A==2"}, {"name": "d"}]}]})");
    const ProgramResult check = runScript(place, "vtsym check m", {}, elsewhere);
    EXPECT_NE(check.err.find("Whether S/c can be active stays undecided: " + reason), std::string::npos) << check.err;
}

} // namespace
} // namespace VT::Testing
