#include "base/variants/VariantKeywords.hpp"

#include "base/variants/Features.hpp"
#include "base/variants/Loggers.hpp"
#include "tests/support/FlagSetting.hpp"

#include <gtest/gtest.h>

#include <array>
#include <locale>

namespace {

using VT::VariantKeywords;

struct Kind {
    std::string keyword;
    bool (*recognise)(const std::string& text, bool enabled);
    std::string getter;
};

std::array<Kind, 4> kinds() {
    using Words = VariantKeywords;
    return {{{"(inherit)", &Words::isInheritVariantKeyword, Words::getInheritVariantKeyword()},
             {"(default)", &Words::isDefaultVariantKeyword, Words::getDefaultVariantKeyword()},
             {"(sim)", &Words::isSimVariantKeyword, Words::getSimVariantKeyword()},
             {"(codegen)", &Words::isCodegenVariantKeyword, Words::getCodegenVariantKeyword()}}};
}

TEST(VariantKeywords, EachKindIsRecognisedByItsOwnKeywordAndNoNearMiss) {
    for (const Kind& kind : kinds()) {
        EXPECT_EQ(kind.getter, kind.keyword);
        for (const Kind& other : kinds()) {
            for (const char* blank : {"", " ", "\t\n\v\f\r "}) {
                const std::string text = blank + other.keyword + blank;
                EXPECT_EQ(kind.recognise(text, true), kind.keyword == other.keyword) << kind.keyword << " in " << text;
                EXPECT_FALSE(kind.recognise(text, false)) << "not in force: " << text;
            }
        }
        const std::string bare = kind.keyword.substr(1, kind.keyword.size() - 2);
        std::string shouted = kind.keyword;
        shouted[1] = static_cast<char>(shouted[1] - 'a' + 'A');
        for (const std::string& text : {std::string(), std::string("  "), bare, shouted, "( " + bare + ")",
                                        kind.keyword + std::string(1, '\0'), std::string("@default")})
            EXPECT_FALSE(kind.recognise(text, true)) << kind.keyword << " in \"" << text << '"';
        for (const bool withName : {false, true}) {
            EXPECT_TRUE(VariantKeywords::isVariantKeyword(kind.keyword, withName));
            EXPECT_FALSE(VariantKeywords::isVariantKeyword(kind.keyword + " ", withName)) << "exactly";
            EXPECT_EQ(VariantKeywords::isVariantKeyword("@default", withName), withName);
        }
    }
}

TEST(VariantKeywords, WhiteSpaceIsWhatTheLocaleSays) {
    using Letters = std::ctype<char>;
    std::array<Letters::mask, Letters::table_size> rows{};
    std::copy_n(Letters::classic_table(), rows.size(), rows.begin());
    rows['#'] = Letters::space;
    EXPECT_FALSE(VariantKeywords::isSimVariantKeyword("#(sim)#", true));
    const std::locale before = std::locale::global(std::locale(std::locale(), new Letters(rows.data())));
    const bool recognised = VariantKeywords::isSimVariantKeyword("#(sim)#", true);
    std::locale::global(before);
    EXPECT_TRUE(recognised);
}

TEST(VariantFeatures, FlagsAreDeclaredInOrder) {
    const std::vector<VtFeature*> expected{&VT::cacheSymExprSimplifyResultsFeature(),
                                           &VT::guardIncludesOfVariantDataFeature(), VTFEAT_VariantKeywordsSimCodegen};
    EXPECT_EQ(VtFeature::all(), expected);
    std::string listed;
    for (const VtFeature* flag : expected)
        listed += flag->name() + " " + flag->category() + " " + flag->sourceUnit() + " " +
                  std::to_string(flag->identifier()) + " " + std::to_string(flag->defaultValue()) + "\n";
    EXPECT_EQ(listed, "CacheSymExprSimplifyResults Vantor Variants base/VCService 1788779 1\n"
                      "GuardIncludesOfVariantData Vantor Variants/Codewright " +
                          expected[1]->sourceUnit() +
                          " 1816317 1\nVariantKeywordsSimCodegen Vantor Subsystem and Models [Variants] "
                          "parser/SymbolicExprParser 1375955 2\n");
    for (const std::int32_t value : {-1, 0, 1, 2}) {
        const VT::Testing::FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, value);
        EXPECT_EQ(VT::isVariantKeywordsSimCodegenFeatureOn(), value > 0) << value;
    }
}

TEST(VariantLoggers, HaveTheirNamesAndStayTheSame) {
    using namespace vt::variants;
    const std::array<std::pair<Logger& (*)(), const char*>, 4> loggers{
        {{&engine::getLogger, "vt::variants::engine"},
         {&condProp::getLogger, "vt::variants::condProp"},
         {&removal::getLogger, "vt::variants::removal"},
         {&vred::getLogger, "vt::variants::reducer"}}};
    for (const auto& [get, name] : loggers) {
        EXPECT_EQ(get().name(), name);
        EXPECT_EQ(&get(), &get());
    }
}

} // namespace
