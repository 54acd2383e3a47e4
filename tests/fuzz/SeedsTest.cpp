// The inputs that the fuzz targets keep, replayed without libFuzzer.
#include "fuzz/Seeds.hpp"
#include "fuzz/Targets.hpp"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

namespace VT::Testing {
namespace {

class Seeds : public ::testing::TestWithParam<Fuzz::Target> {};

TEST_P(Seeds, BreakNoPromise) {
    std::ostringstream text;
    text << std::ifstream(std::string(VTSYM_TEST_DATA "/../../fuzz/seeds/") + GetParam().name + ".txt").rdbuf();
    const std::vector<Fuzz::Seed> seeds = Fuzz::seedsOf(text.str());
    ASSERT_FALSE(seeds.empty()) << "no seeds are kept";
    const std::uint64_t before = Fuzz::demandsMade();
    for (const Fuzz::Seed& seed : seeds)
        try {
            GetParam().run(seed);
        } catch (const Fuzz::Broken& broken) {
            ADD_FAILURE() << broken.what() << "\nseed: " << Fuzz::lineOf(seed);
        }
    EXPECT_GT(Fuzz::demandsMade(), before) << "no seed reached a promise";
}

INSTANTIATE_TEST_SUITE_P(Kept, Seeds, ::testing::ValuesIn(Fuzz::targets().begin(), Fuzz::targets().end()),
                         [](const auto& target) { return std::string(target.param.name); });

} // namespace
} // namespace VT::Testing
