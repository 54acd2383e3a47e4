// Writes witnesses about the unknowns of a file.
#include "base/scan/report/WitnessText.hpp"

namespace VT {

namespace {

/// "A=1", "A < B".
std::string valueText(const MacroUnknowns& unknowns, const Decider& decider, const UnknownValue& value) {
    const MacroUnknown* const unknown = unknowns.find(value.unknown);
    if (unknown == nullptr)
        return decider.nameOf(value.unknown) + "=" + std::to_string(value.value);
    if (unknown->kind == MacroUnknown::Kind::Comparison)
        return unknown->left + (value.value < 0 ? " < " : value.value > 0 ? " > " : " == ") + unknown->right;
    const bool isDefined = unknown->kind == MacroUnknown::Kind::Defined;
    return (isDefined ? "defined(" + unknown->left + ")" : unknown->left) + "=" + std::to_string(value.value);
}

} // namespace

std::string witnessText(const MacroUnknowns& unknowns, const Decider& decider, const Witness& witness) {
    std::string text;
    for (const UnknownValue& value : witness)
        text.append(text.empty() ? "" : ", ").append(valueText(unknowns, decider, value));
    return text;
}

} // namespace VT
