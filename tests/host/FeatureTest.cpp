#include "host/Feature.hpp"

#include <gmock/gmock.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

#include <cstdlib>
#include <map>
#include <memory>

namespace {

VtFeature::ChangeCallback nothing = nullptr;
int changes = 0;

void countChange(const VtFeature& feature) {
    changes += feature.value();
}

TEST(Feature, IsFoundByNameWhileItLives) {
    const std::size_t others = VtFeature::all().size();
    EXPECT_EQ(VtFeature::find("TestFlag"), nullptr);
    {
        VtFeature flag("TestFlag", "A description", "tests/host", "A category", 17, -3, &countChange);
        EXPECT_EQ(VtFeature::find("TestFlag"), &flag);
        EXPECT_EQ(VtFeature::all().size(), others + 1);
        EXPECT_EQ(flag.name() + flag.description() + flag.sourceUnit() + flag.category(),
                  "TestFlagA descriptiontests/hostA category");
        EXPECT_EQ(flag.identifier(), 17);
        EXPECT_EQ(flag.value(), -3);
        EXPECT_FALSE(flag.isOn());

        changes = 0;
        flag.setValue(5);
        EXPECT_EQ(flag.value(), 5);
        EXPECT_TRUE(flag.isOn());
        EXPECT_EQ(flag.defaultValue(), -3);
        EXPECT_EQ(changes, 5) << "the callback sees the new value";

        auto second = std::make_unique<VtFeature>("TestFlag", "", "", "", 0, 0, nothing);
        EXPECT_EQ(VtFeature::find("TestFlag"), &flag) << "the oldest of a name is found";
        second.reset();
        EXPECT_EQ(VtFeature::find("TestFlag"), &flag);
    }
    EXPECT_EQ(VtFeature::find("TestFlag"), nullptr);
}

TEST(Feature, AssignmentsAreCarriedOutOrExplained) {
    VtFeature flag("TestFlag", "", "", "", 0, 1, nothing);
    EXPECT_EQ(VtFeature::assign("  TestFlag = -7 "), "");
    EXPECT_EQ(flag.value(), -7);
    EXPECT_EQ(VtFeature::assign("TestFlag=-2147483648"), "");
    for (const auto& [assignment, complaint] :
         std::map<std::string, std::string>{{"TestFlag=2147483648", "32 bits"},
                                            {"TestFlag=", "32 bits"},
                                            {"TestFlag=1x", "\"1x\""},
                                            {"TestFlag", "NAME=VALUE"},
                                            {"=1", "NAME=VALUE"},
                                            {"", "NAME=VALUE"},
                                            {"testflag=1", "no feature flag \"testflag\""},
                                            {"Test\nFlag=1", "Test\\x0aFlag"},
                                            {"Other=1", "TestFlag"}}) // the flags there are, are listed
        EXPECT_THAT(VtFeature::assign(assignment), testing::HasSubstr(complaint)) << assignment;
    EXPECT_EQ(flag.value(), -2147483647 - 1);
}

[[noreturn]] void tellFlags() {
    for (const VtFeature* flag : VtFeature::all())
        std::fprintf(stderr, "[%s=%d]", flag->name().c_str(), flag->value());
    std::exit(0);
}

// The first flag of a process reads the environment, so that each case runs in a process of its own.
TEST(FeatureEnvironment, StartsFlagsAndReportsWhatItCannotUse) {
    const std::map<std::string, std::vector<std::string>> cases{
        {"", {"[CacheSymExprSimplifyResults=1]", "[VariantKeywordsSimCodegen=2]"}},
        {" VariantKeywordsSimCodegen = -5 ,, CacheSymExprSimplifyResults=0,",
         {"[CacheSymExprSimplifyResults=0]", "[VariantKeywordsSimCodegen=-5]"}},
        {"NoSuchFlag=1,VariantKeywordsSimCodegen=0",
         {"warning: VTSYM_FEATURES: there is no feature flag \"NoSuchFlag\"", "[VariantKeywordsSimCodegen=0]"}},
        {"VariantKeywordsSimCodegen=on",
         {"warning: VTSYM_FEATURES: the value of VariantKeywordsSimCodegen is an integer",
          "[VariantKeywordsSimCodegen=2]"}},
        {"\x1b[31m\xff" + std::string(100000, 'x'), {"\\x1b[31m\\xffxxx", "[VariantKeywordsSimCodegen=2]"}},
    };

    GTEST_FLAG_SET(death_test_style, "threadsafe");
    for (const auto& [variable, said] : cases) {
        setenv("VTSYM_FEATURES", variable.c_str(), 1);
        testing::Matcher<const std::string&> output = testing::SizeIs(testing::Lt(2000));
        for (const std::string& words : said)
            output = testing::AllOf(output, testing::HasSubstr(words));
        EXPECT_EXIT(tellFlags(), testing::ExitedWithCode(0), output) << variable.substr(0, 80);
    }
    unsetenv("VTSYM_FEATURES");
}

} // namespace
