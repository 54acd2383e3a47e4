// Parameters of conditions and what a customizer puts in their place.
#pragma once

#include "base/core/Table.hpp"
#include "base/simplify/VCCustomizer.hpp"

#include <functional>
#include <optional>
#include <string>

namespace VT {

/// What to put in the place of a parameter; nothing for one that stays.
using ParameterChoice = std::function<std::optional<ParameterReplacement>(const std::string& parameter)>;

/// The condition with its identifiers replaced by what `other` answers for them; the invalid identifier for those that
/// stay.  A name that does not occur is never asked for, so that nothing is interned in vain.
SymbolicExprId replaceIdentifiers(SymbolicExprTable& table, SymbolicExprId condition,
                                  const std::function<SymbolicExprId(const std::string& name)>& other);

/// The condition with its parameters replaced.  Truth constants and variant keywords are no parameters.
SymbolicExprId replaceParameters(SymbolicExprTable& table, SymbolicExprId condition, const ParameterChoice& choose);

/// The parameters of a condition, each once: the identifiers in it but truth constants, variant keywords, names of
/// functions and owners of members.
std::vector<std::string> parametersOf(const SymbolicExprTable& table, SymbolicExprId condition);

} // namespace VT
