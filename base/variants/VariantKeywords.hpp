// The reserved words that may be written instead of a variant condition.
#pragma once

#include "host/Export.hpp"

#include <string>

namespace VT {

/// The spellings of the keywords.  All of them are O(length of the text).
class VTSYM_API VariantKeywords {
public:
    static std::string getInheritVariantKeyword();   ///< "(inherit)": the variant follows its parent
    static std::string getDefaultVariantKeyword();   ///< "(default)": active where no other choice is
    static std::string getSimVariantKeyword();       ///< "(sim)": active in simulation
    static std::string getCodegenVariantKeyword();   ///< "(codegen)": active in generated code
    static std::string getDefaultVariantCGVarName(); ///< "@default": name of the default choice in generated code

    /// Whether the text is exactly one of the four keywords or, withCGVarName, the name "@default".
    static bool isVariantKeyword(const std::string& text, bool withCGVarName);

    // Whether the text, apart from white space around it, is the keyword.  The current locale defines white space.
    // Always false unless `enabled`: the caller knows whether that kind of keyword is in force.
    static bool isInheritVariantKeyword(const std::string& text, bool enabled);
    static bool isDefaultVariantKeyword(const std::string& text, bool enabled);
    static bool isSimVariantKeyword(const std::string& text, bool enabled);
    static bool isCodegenVariantKeyword(const std::string& text, bool enabled);
};

/// Whether the keywords "(sim)" and "(codegen)" are in force: the state of the flag "VariantKeywordsSimCodegen".
VTSYM_API bool isVariantKeywordsSimCodegenFeatureOn();

} // namespace VT
