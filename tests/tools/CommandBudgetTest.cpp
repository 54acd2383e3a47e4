// Commands whose questions use up the steps of a whole run.
#include "base/core/Limits.hpp"
#include "tests/support/generators/Pigeons.hpp"
#include "tests/tools/Program.hpp"

#include <filesystem>
#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

/// Hard lines until every step is used up, without a solver.  An easy one that follows has the steps of its own line.
TEST(CommandBudget, EndsAndSaysSo) {
    constexpr std::size_t most = limits::commandSteps / limits::decisionSteps + 8;
    const std::string library =
        (std::filesystem::path(VTSYM_PROGRAM).parent_path().parent_path() / "lib/libvtsym.so.0").string();
    std::string input;
    for (std::size_t i = 0; i < most; ++i)
        input += pigeons(12) + " && x" + std::to_string(i) + "\tA\n";
    input += "A > 3\tA > 2\n";
    const TemporaryFolder place;
    const ProgramResult result =
        runScript(place, "mkdir lib && cp '" + library + "' lib/ && vtsym compare", input, {"LD_LIBRARY_PATH=lib"});
    const Strings lines = linesOf(result.out);
    ASSERT_EQ(lines.size(), most + 1);
    const auto begins = [](const std::string& line, const char* text) { return line.rfind(text, 0) == 0; };
    EXPECT_TRUE(begins(lines.front(), "undecided: it takes too many steps; a solver may decide it")) << lines.front();
    EXPECT_TRUE(begins(lines[most - 1], "undecided: it takes more steps than one run may; ask it in a run of its own"))
        << lines[most - 1];
    EXPECT_EQ(lines.back(), "implies; second alone: A=3");
    EXPECT_EQ(result.err, "");
}

} // namespace
} // namespace VT::Testing
