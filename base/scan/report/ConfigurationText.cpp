// Writes values of unknowns as definitions.
#include "base/scan/report/ConfigurationText.hpp"

#include <map>

namespace VT {

std::string configurationText(const MacroUnknowns& unknowns, const Witness& witness,
                              const std::function<bool(std::string_view)>& isLogical) {
    using Kind = MacroUnknown::Kind;
    constexpr std::string_view moduleSuffix = "_MODULE";
    std::map<std::string, std::string> values;
    std::map<std::string, bool> isDefined;
    for (const UnknownValue& each : witness) {
        const MacroUnknown* const unknown = unknowns.find(each.unknown);
        if (unknown == nullptr || unknown->state.version != 0 || unknown->state.epoch != 0)
            continue;
        if (unknown->kind == Kind::Defined)
            isDefined.emplace(unknown->left, each.value != 0);
        else if (unknown->kind == Kind::Value)
            values.emplace(unknown->left, std::to_string(each.value));
    }
    for (const auto& [name, value] : values)
        isDefined.try_emplace(name, value != "0");
    std::map<std::string, std::string> settings;
    for (const auto& [name, defined] : isDefined) {
        const std::string base = name.ends_with(moduleSuffix) ? name.substr(0, name.size() - moduleSuffix.size()) : "";
        const auto value = values.find(name);
        if (!base.empty() && isLogical(base)) {
            if (defined)
                settings[base] = "m";
            else
                settings.try_emplace(base, "n");
        } else if (!defined) {
            settings.try_emplace(name, "n");
        } else {
            settings[name] = value == values.end() || isLogical(name) ? "y" : value->second;
        }
    }
    std::string text;
    for (const auto& [name, setting] : settings)
        text.append(text.empty() ? "" : ", ").append(name).append("=").append(setting);
    return text;
}

} // namespace VT
