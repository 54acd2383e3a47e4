// JSON held against a schema: the keywords that the schemas of the tests use.
#pragma once

#include <nlohmann/json.hpp>

#include <algorithm>
#include <regex>
#include <set>
#include <string>

namespace VT::Testing {

/// What is wrong with a value, by its place; empty where nothing is.
inline std::string schemaErrors(const nlohmann::json& root, const nlohmann::json& schema, const nlohmann::json& value,
                                const std::string& place = {}) {
    if (schema.contains("$ref"))
        return schemaErrors(root, root.at(nlohmann::json::json_pointer(schema["$ref"].get<std::string>().substr(1))),
                            value, place);
    if (schema.contains("anyOf"))
        return std::ranges::any_of(schema["anyOf"],
                                   [&](const auto& one) { return schemaErrors(root, one, value).empty(); })
                   ? ""
                   : place + ": is none of the forms\n";
    const std::string type = schema.value("type", "");
    const bool isOfType = type.empty() || (type == "integer" ? value.is_number_integer() : type == value.type_name());
    if (!isOfType)
        return place + ": is no " + type + "\n";
    std::string errors;
    if (schema.contains("enum") && std::ranges::find(schema["enum"], value) == schema["enum"].end())
        errors += place + ": is none of the values\n";
    if (schema.contains("minimum") && value < schema["minimum"])
        errors += place + ": is too small\n";
    if (schema.contains("maximum") && value > schema["maximum"])
        errors += place + ": is too large\n";
    if (value.is_string() && schema.contains("pattern") &&
        !std::regex_match(value.get<std::string>(), std::regex(schema["pattern"].get<std::string>())))
        errors += place + ": is not of the pattern\n";
    if (value.is_array()) {
        if (value.size() < schema.value("minItems", 0U))
            errors += place + ": has too few items\n";
        if (schema.value("uniqueItems", false) && std::set(value.begin(), value.end()).size() != value.size())
            errors += place + ": repeats an item\n";
        for (std::size_t i = 0; i < value.size(); ++i)
            errors += schemaErrors(root, schema["items"], value[i], place + "/" + std::to_string(i));
    }
    if (!value.is_object())
        return errors;
    for (const auto& name : schema.value("required", nlohmann::json::array()))
        if (!value.contains(name.get<std::string>()))
            errors += place + ": lacks " + name.get<std::string>() + "\n";
    const auto members = schema.value("properties", nlohmann::json::object());
    const auto others = schema.value("additionalProperties", nlohmann::json(true));
    for (const auto& [name, member] : value.items())
        if (members.contains(name) || others.is_object())
            errors += schemaErrors(root, members.contains(name) ? members[name] : others, member, place + "/" + name);
        else if (others == false)
            errors += place + ": has a strange " + name + "\n";
    return errors;
}

} // namespace VT::Testing
