// Two conditions a time, for `compare` and `given`: as two arguments, or as lines with a tab between them.
// Both are read before an error is reported, so that one line reports the errors of both.
#pragma once

#include "tools/vtsym/answers/Conditions.hpp"

#include <optional>
#include <string>

namespace vtsym {

class Command;

/// Options of a command on pairs.  A pair is one text whose two conditions are separated by a tab.
struct PairOptions : TextOptions {
    std::optional<std::string> first;
    std::optional<std::string> second;
    bool bits32 = false;
    bool why = false;
    std::vector<std::string> assumptions;
};

/// Two conditions, as written and as read.
struct ConditionPair {
    std::string firstText;
    std::string secondText;
    VT::SymbolicExprId first;
    VT::SymbolicExprId second;
};

/// Adds two positionals of these names, --from, --json, --bits, --assume and --why.
void addPairOptions(Command& command, PairOptions& options, const std::string& first, const std::string& second);

/// Reads a pair.  Throws CommandError with one error for each condition that cannot be read, placed in the whole text.
ConditionPair readPair(const Conditions& conditions, const TextOptions& options, const std::string& text);

/// An assignment as text, "A=3, B=0", and as a JSON object.
std::string witnessText(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness);
std::string witnessJson(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness);

} // namespace vtsym
