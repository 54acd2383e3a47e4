// Commands on two conditions at a time.
#pragma once

#include "tools/vtsym/answers/Conditions.hpp"

#include <optional>
#include <string>

namespace vtsym {

/// What a command on pairs is told.  A pair is one text, its two conditions separated by a tab.
struct PairOptions : TextOptions {
    std::optional<std::string> first;
    std::optional<std::string> second;
    bool bits32 = false;
};

/// Two conditions as they were written, and what they are.
struct ConditionPair {
    std::string firstText;
    std::string secondText;
    VT::SymbolicExprId first;
    VT::SymbolicExprId second;
};

/// Gives a command two texts under the names that its help shows, --from, --json and --bits.
void addPairOptions(CLI::App& command, PairOptions& options, const std::string& first, const std::string& second);

/// The conditions of a pair.  Throws CommandError for those that cannot be read, with places in the whole text.
ConditionPair readPair(const Conditions& conditions, const TextOptions& options, const std::string& text);

/// An assignment as text, "A=3, B=0", and as a JSON object.
std::string witnessText(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness);
std::string witnessJson(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness);

} // namespace vtsym
