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
};

std::array<Kind, 4> kinds() {
    return {{{"(inherit)", &VariantKeywords::isInheritVariantKeyword},
             {"(default)", &VariantKeywords::isDefaultVariantKeyword},
             {"(sim)", &VariantKeywords::isSimVariantKeyword},
             {"(codegen)", &VariantKeywords::isCodegenVariantKeyword}}};
}

TEST(VariantKeywords, GettersHaveTheReservedTexts) {
    EXPECT_EQ(VariantKeywords::getInheritVariantKeyword(), "(inherit)");
    EXPECT_EQ(VariantKeywords::getDefaultVariantKeyword(), "(default)");
    EXPECT_EQ(VariantKeywords::getSimVariantKeyword(), "(sim)");
    EXPECT_EQ(VariantKeywords::getCodegenVariantKeyword(), "(codegen)");
    EXPECT_EQ(VariantKeywords::getDefaultVariantCGVarName(), "@default");
}

TEST(VariantKeywords, EachKindIsRecognisedByItsOwnKeywordOnly) {
    for (const Kind& kind : kinds()) {
        for (const Kind& other : kinds()) {
            for (const char* blank : {"", " ", "\t\n\v\f\r "}) {
                const std::string text = blank + other.keyword + blank;
                EXPECT_EQ(kind.recognise(text, true), kind.keyword == other.keyword) << kind.keyword << " in " << text;
                EXPECT_FALSE(kind.recognise(text, false)) << "not in force: " << text;
            }
        }
    }
}

TEST(VariantKeywords, NearMissesAreNotRecognised) {
    for (const Kind& kind : kinds()) {
        const std::string bare = kind.keyword.substr(1, kind.keyword.size() - 2);
        std::string shouted = kind.keyword;
        shouted[1] = static_cast<char>(shouted[1] - 'a' + 'A');
        for (const std::string& text :
             {std::string(), std::string("  "), bare, shouted, "( " + bare + ")", kind.keyword + "x",
              kind.keyword + std::string(1, '\0'), kind.keyword + kind.keyword})
            EXPECT_FALSE(kind.recognise(text, true)) << kind.keyword << " in \"" << text << '"';
    }
    EXPECT_FALSE(VariantKeywords::isDefaultVariantKeyword("@default", true));
}

TEST(VariantKeywords, AnyKeywordIsRecognisedExactly) {
    for (const bool withName : {false, true}) {
        for (const Kind& kind : kinds()) {
            EXPECT_TRUE(VariantKeywords::isVariantKeyword(kind.keyword, withName));
            EXPECT_FALSE(VariantKeywords::isVariantKeyword(" " + kind.keyword, withName));
            EXPECT_FALSE(VariantKeywords::isVariantKeyword(kind.keyword + " ", withName));
        }
        EXPECT_EQ(VariantKeywords::isVariantKeyword("@default", withName), withName);
        EXPECT_FALSE(VariantKeywords::isVariantKeyword("(SIM)", withName));
        EXPECT_FALSE(VariantKeywords::isVariantKeyword("", withName));
    }
}

/// Counts '#' as white space, as some locale might.
struct HashIsBlank : std::ctype<char> {
    HashIsBlank() : std::ctype<char>(rows().data()) {}

    static std::array<mask, table_size>& rows() {
        static std::array<mask, table_size> rows = [] {
            std::array<mask, table_size> changed{};
            std::copy_n(classic_table(), table_size, changed.begin());
            changed[static_cast<unsigned char>('#')] = space;
            return changed;
        }();
        return rows;
    }
};

TEST(VariantKeywords, WhiteSpaceIsWhatTheLocaleSays) {
    EXPECT_FALSE(VariantKeywords::isSimVariantKeyword("#(sim)#", true));
    const std::locale before = std::locale::global(std::locale(std::locale(), new HashIsBlank));
    const bool recognised = VariantKeywords::isSimVariantKeyword("#(sim)#", true);
    std::locale::global(before);
    EXPECT_TRUE(recognised);
}

TEST(VariantFeatures, FlagsAreDeclaredInOrder) {
    const std::vector<VtFeature*> flags = VtFeature::all();
    ASSERT_EQ(flags.size(), 3U);
    EXPECT_EQ(flags[0], &VT::cacheSymExprSimplifyResultsFeature());
    EXPECT_EQ(flags[1], &VT::guardIncludesOfVariantDataFeature());
    EXPECT_EQ(flags[2], VTFEAT_VariantKeywordsSimCodegen);

    const struct {
        const char* name;
        const char* category;
        int identifier;
        std::int32_t value;
    } expected[] = {{"CacheSymExprSimplifyResults", "Vantor Variants", 1788779, 1},
                    {"GuardIncludesOfVariantData", "Vantor Variants/Codewright", 1816317, 1},
                    {"VariantKeywordsSimCodegen", "Vantor Subsystem and Models [Variants]", 1375955, 2}};

    for (std::size_t i = 0; i < flags.size(); ++i) {
        EXPECT_EQ(flags[i]->name(), expected[i].name);
        EXPECT_EQ(flags[i]->category(), expected[i].category);
        EXPECT_EQ(flags[i]->identifier(), expected[i].identifier);
        EXPECT_EQ(flags[i]->defaultValue(), expected[i].value);
    }
    EXPECT_EQ(flags[0]->sourceUnit(), "base/VCService");
    EXPECT_EQ(flags[2]->sourceUnit(), "parser/SymbolicExprParser");
}

TEST(VariantFeatures, SimCodegenIsOnAboveZero) {
    for (const std::int32_t value : {-2147483647 - 1, -1, 0, 1, 2, 2147483647}) {
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
