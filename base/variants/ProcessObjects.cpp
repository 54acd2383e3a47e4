// Everything that the library creates when it is loaded: feature flags, loggers and keywords.
//
// One translation unit, because only within one does C++ guarantee an order of construction.
#include "base/variants/Features.hpp"
#include "base/variants/Loggers.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <locale>
#include <string_view>

namespace {

const std::string inheritKeyword = "(inherit)";
const std::string defaultKeyword = "(default)";
const std::string simKeyword = "(sim)";
const std::string codegenKeyword = "(codegen)";
const std::string defaultCGVarName = "@default";

VtFeature cacheSimplifyResults("CacheSymExprSimplifyResults",
                               "Cache results of SymbolicExprSimplify in VCService to speed up later calls",
                               "base/VCService", "Vantor Variants", 1788779, 1, nullptr);
VtFeature guardIncludes("GuardIncludesOfVariantData", "Guard the includes for data that are variant", "base/VCService",
                        "Vantor Variants/Codewright", 1816317, 1, nullptr);
VtFeature simCodegenKeywords("VariantKeywordsSimCodegen",
                             "Add (sim), (codegen) variant keywords to automatically switch between simulation and "
                             "codegeneration modes",
                             "parser/SymbolicExprParser", "Vantor Subsystem and Models [Variants]", 1375955, 2,
                             nullptr);

vt::variants::Logger engineLogger("vt::variants::engine");
vt::variants::Logger condPropLogger("vt::variants::condProp");
vt::variants::Logger removalLogger("vt::variants::removal");

std::string_view trimmed(std::string_view text) {
    const std::locale locale;
    const auto& letters = std::use_facet<std::ctype<char>>(locale);
    const auto blank = [&letters](char c) { return letters.is(std::ctype_base::space, c); };
    while (!text.empty() && blank(text.back()))
        text.remove_suffix(1);
    while (!text.empty() && blank(text.front()))
        text.remove_prefix(1);
    return text;
}

} // namespace

VtFeature* const VTFEAT_VariantKeywordsSimCodegen = &simCodegenKeywords;

namespace VT {

VtFeature& cacheSymExprSimplifyResultsFeature() {
    return cacheSimplifyResults;
}

VtFeature& guardIncludesOfVariantDataFeature() {
    return guardIncludes;
}

bool isVariantKeywordsSimCodegenFeatureOn() {
    return simCodegenKeywords.isOn();
}

std::string VariantKeywords::getInheritVariantKeyword() {
    return inheritKeyword;
}

std::string VariantKeywords::getDefaultVariantKeyword() {
    return defaultKeyword;
}

std::string VariantKeywords::getSimVariantKeyword() {
    return simKeyword;
}

std::string VariantKeywords::getCodegenVariantKeyword() {
    return codegenKeyword;
}

std::string VariantKeywords::getDefaultVariantCGVarName() {
    return defaultCGVarName;
}

bool VariantKeywords::isVariantKeyword(const std::string& text, bool withCGVarName) {
    return text == inheritKeyword || text == defaultKeyword || text == simKeyword || text == codegenKeyword ||
           (withCGVarName && text == defaultCGVarName);
}

bool VariantKeywords::isInheritVariantKeyword(const std::string& text, bool enabled) {
    return enabled && trimmed(text) == inheritKeyword;
}

bool VariantKeywords::isDefaultVariantKeyword(const std::string& text, bool enabled) {
    return enabled && trimmed(text) == defaultKeyword;
}

bool VariantKeywords::isSimVariantKeyword(const std::string& text, bool enabled) {
    return enabled && trimmed(text) == simKeyword;
}

bool VariantKeywords::isCodegenVariantKeyword(const std::string& text, bool enabled) {
    return enabled && trimmed(text) == codegenKeyword;
}

} // namespace VT

namespace vt::variants {

Logger& engine::getLogger() {
    return engineLogger;
}

Logger& condProp::getLogger() {
    return condPropLogger;
}

Logger& removal::getLogger() {
    return removalLogger;
}

Logger& vred::getLogger() {
    static Logger logger("vt::variants::reducer");
    return logger;
}

} // namespace vt::variants
