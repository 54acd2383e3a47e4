#include "host/Feature.hpp"
#include "tests/support/Cases.hpp"

#include <gmock/gmock.h>

#include <cstdlib>
#include <memory>

namespace {

using VT::Testing::CaseRow;
using VT::Testing::casesOf;

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
    for (const CaseRow& row : casesOf("features.txt", "assignments", 2))
        EXPECT_THAT(VtFeature::assign(row[0]), testing::HasSubstr(row[1])) << row[0];
    EXPECT_EQ(flag.value(), -2147483647 - 1);
}

[[noreturn]] void tellFlags() {
    for (const VtFeature* flag : VtFeature::all())
        std::fprintf(stderr, "[%s=%d]", flag->name().c_str(), flag->value());
    std::exit(0);
}

// The first flag of a process reads the environment, so that each case runs in a process of its own.
TEST(FeatureEnvironment, StartsFlagsAndReportsWhatItCannotUse) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    std::vector<CaseRow> rows = casesOf("features.txt", "environment", 3);
    rows.push_back({"\x1b[31m\xff" + std::string(100000, 'x'), "\\x1b[31m\\xffxxx", "[VariantKeywordsSimCodegen=2]"});
    for (const CaseRow& row : rows) {
        setenv("VTSYM_FEATURES", row[0].c_str(), 1);
        EXPECT_EXIT(
            tellFlags(), testing::ExitedWithCode(0),
            testing::AllOf(testing::SizeIs(testing::Lt(2000)), testing::HasSubstr(row[1]), testing::HasSubstr(row[2])))
            << row[0].substr(0, 80);
    }
    unsetenv("VTSYM_FEATURES");
}

} // namespace
