// Replaces parameters of conditions as a customizer asks for.
#pragma once

#include "base/core/Table.hpp"
#include "base/simplify/VCCustomizer.hpp"

#include <functional>
#include <optional>
#include <string>

namespace VT {

/// Chooses the replacement of a parameter; nothing for one that stays.
using ParameterChoice = std::function<std::optional<ParameterReplacement>(const std::string& parameter)>;

/// Returns the condition with each identifier replaced by `other(name)`; one for which that is the invalid identifier
/// stays.  `other` is called only for names that occur, so that no unused node is interned.
SymbolicExprId replaceIdentifiers(SymbolicExprTable& table, SymbolicExprId condition,
                                  const std::function<SymbolicExprId(const std::string& name)>& other);

/// Returns the condition with its parameters replaced.  Truth constants and variant keywords are not parameters.
SymbolicExprId replaceParameters(SymbolicExprTable& table, SymbolicExprId condition, const ParameterChoice& choose);

/// The parameters of a condition, each once: the identifiers in it but truth constants, variant keywords, names of
/// functions and owners of members.
std::vector<std::string> parametersOf(const SymbolicExprTable& table, SymbolicExprId condition);

} // namespace VT
