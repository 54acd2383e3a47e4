// Reasons of answers as text and as JSON.
#pragma once

#include "base/decide/reasons/Reasons.hpp"
#include "tools/vtsym/answers/Conditions.hpp"

#include <string>

namespace vtsym {

/// The operands of reasons as text, "A>2, A<=1", and as a JSON list.
std::string reasonsText(const Conditions& conditions, const TextOptions& options, const VT::Reasons& reasons);
std::string reasonsJson(const Conditions& conditions, const TextOptions& options, const VT::Reasons& reasons);

/// Appends why a condition has a shorter form, and for each operand that it lost the known facts that make it
/// redundant:
/// "; because: V>=3; without V>=2: V>=3".  As JSON these are the members "because" and "lost".
void appendReasons(const Conditions& conditions, const TextOptions& options, const VT::ShorteningReasons& reasons,
                   std::string& out);
void appendReasonsJson(const Conditions& conditions, const TextOptions& options, const VT::ShorteningReasons& reasons,
                       std::string& out);

} // namespace vtsym
