// The library's feature flags.
#pragma once

#include "host/Feature.hpp"

namespace VT {

/// "CacheSymExprSimplifyResults": whether the condition service keeps the results of simplification.
VTSYM_API VtFeature& cacheSymExprSimplifyResultsFeature();

/// "GuardIncludesOfVariantData": for the host's code generation; the library does not read it.
VTSYM_API VtFeature& guardIncludesOfVariantDataFeature();

} // namespace VT

/// "VariantKeywordsSimCodegen": whether the keywords "(sim)" and "(codegen)" are in force.  A data symbol, so that
/// other components of the host can read the flag.
extern VTSYM_API VtFeature* const VTFEAT_VariantKeywordsSimCodegen;
