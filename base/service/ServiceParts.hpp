// What a VCService is made of.
#pragma once

#include "base/decide/Decider.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/service/DecisionCache.hpp"
#include "base/service/SimplifyCache.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/simplify/VCCustomizer.hpp"
#include "base/transform/QuillConversion.hpp"
#include "parser/ErrorChecker.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <array>
#include <cstdint>
#include <memory>
#include <string>

namespace VT {

struct CustomizerRelease {
    void operator()(VCCustomizer* customizer) const noexcept { customizer->release(); }
};

/// Members are destroyed in reverse, so that the customizer goes last.
struct ServiceParts {
    ServiceParts();

    /// The cache of a language.
    template <class Cache>
    static Cache& of(std::array<Cache, 2>& caches, bool isQuill) {
        return caches[isQuill ? 0 : 1];
    }

    /// Whether the variant keywords are in force at this moment.
    [[nodiscard]] bool keywordsInForce() const;
    /// The decider for the keywords' present state.
    Decider& decider();

    std::unique_ptr<VCCustomizer, CustomizerRelease> customizer;
    std::int32_t useCount = 0;
    SymbolicExprTable table;
    SymbolicExprParser cParser;
    VTSymbolicExprErrorCheckerBlockVariants checker;
    SymbolicExprFromQParseTreeBlockVariants quillParser;
    SymbolicExprSimplify simplifier;
    SymbolicExprQ2C toC;
    SymbolicExprC2Q toQuill;
    SymbolicExprPrinter quillPrinter;
    SymbolicExprPrinter cPrinter;
    boost::unordered_map<std::string, std::string> parameterAliases;
    std::array<SimplifyCache<SymbolicExprId>, 2> simplified;      ///< by condition
    std::array<SimplifyCache<std::string>, 2> simplifiedFromText; ///< by text
    DecisionCache decisions;
    std::array<std::unique_ptr<Decider>, 2> deciders; ///< by whether the keywords are in force
    bool caching;                                     ///< the cache feature when the service was made
};

} // namespace VT
