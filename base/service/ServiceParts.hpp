// The parts of a VCService: table, parsers, printers, simplifier, deciders and caches.
#pragma once

#include "base/decide/Assumptions.hpp"
#include "base/decide/Decider.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/service/DecisionCache.hpp"
#include "base/service/SimplifyCache.hpp"
#include "base/service/SymbolRegistry.hpp"
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

/// Members are destroyed in reverse order, so the customizer goes last.
struct ServiceParts {
    ServiceParts();

    /// Interns (sim) and (codegen) as identifiers, whether or not they are in force.
    void addSimCodegenVariantKeywordSymbols();

    /// The cache of a language.
    template <class Cache>
    static Cache& of(std::array<Cache, 2>& caches, bool isQuill) {
        return caches[isQuill ? 0 : 1];
    }

    /// Whether the variant keywords are in force at this moment: they were when the service was made, and are.
    [[nodiscard]] bool keywordsInForce() const;
    /// The mode that decisions depend on beside their conditions: 1 for keywords in force, 2 for 32-bit unknowns.
    [[nodiscard]] unsigned decisionMode() const;
    /// Whether a kept answer about a condition may differ from a fresh one: a customizer took part at some time, a
    /// value is bound to one of its members, or it names a variant keyword.  For checks.
    [[nodiscard]] bool mayHaveChanged(SymbolicExprId condition) const;
    /// The decider for the present mode.
    Decider& decider();

    std::unique_ptr<VCCustomizer, CustomizerRelease> customizer;
    bool customized = false; ///< there was a customizer at some time
    std::int32_t useCount = 0;
    SymbolicExprTable table;
    SymbolicExprParser cParser;
    VTSymbolicExprErrorCheckerBlockVariants checker;
    SymbolicExprFromQParseTreeBlockVariants quillParser;
    SymbolRegistry registry;
    SymbolicExprSimplify simplifier;
    bool keywordFlag; ///< the keyword feature when the service was made
    SymbolicExprQ2C toC;
    SymbolicExprC2Q toQuill;
    SymbolicExprPrinter quillPrinter;
    SymbolicExprPrinter cPrinter;
    boost::unordered_map<std::string, std::string> parameterAliases;
    std::array<SimplifyCache<SymbolicExprId>, 2> simplified;      ///< by condition
    std::array<SimplifyCache<std::string>, 2> simplifiedFromText; ///< by text
    /// The simplified texts of texts, for each language in and out.
    std::array<std::array<SimplifyCache<std::string, std::string>, 2>, 2> simplifiedTexts;
    DecisionCache decisions;
    std::array<std::unique_ptr<Decider>, 8> deciders; ///< by mode
    Budget* budget = nullptr;                         ///< of decisions, owned by the caller
    Assumptions assumptions;
    bool bits32 = false; ///< unknowns are signed 32-bit integers to decisions
    bool asksSolver = true;
    bool caching; ///< the cache feature when the service was made
};

} // namespace VT
