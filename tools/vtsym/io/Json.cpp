// Quotes strings with nlohmann-json, which validates their UTF-8, and then escapes what a terminal would act upon or
// hide: control characters, invisible ones and those that change the direction of writing.  Linear in the length of the
// text.
#include "tools/vtsym/io/Json.hpp"

#include "host/Numbers.hpp"
#include "host/Text.hpp"

#include <cmath>
#include <nlohmann/json.hpp>

namespace vtsym {

namespace {

/// Removes the first character of a text, which is valid UTF-8, and returns its code point.
char32_t takeCharacter(std::string_view& text) {
    const auto byte = [&text](std::size_t at) { return static_cast<unsigned char>(text[at]); };
    const std::size_t length = byte(0) < 0x80 ? 1 : byte(0) < 0xe0 ? 2 : byte(0) < 0xf0 ? 3 : 4;
    char32_t point = length == 1 ? byte(0) : byte(0) & (0x7fU >> length);
    for (std::size_t at = 1; at < length; ++at)
        point = point << 6U | (byte(at) & 0x3fU);
    text.remove_prefix(length);
    return point;
}

void appendEscaped(std::string& json, char32_t point) {
    const auto append = [&json](unsigned unit) {
        json += "\\u";
        for (const unsigned shift : {12U, 8U, 4U, 0U})
            json += "0123456789abcdef"[(unit >> shift) & 0xfU];
    };
    if (point > 0xffff)
        append(0xd800U + ((point - 0x10000U) >> 10U));
    append(point > 0xffff ? 0xdc00U + (point & 0x3ffU) : point);
}

} // namespace

std::string jsonString(std::string_view text) {
    using Json = nlohmann::json;
    const std::string json = Json(text).dump(-1, ' ', false, Json::error_handler_t::replace);
    std::string shown;
    shown.reserve(json.size());
    for (std::string_view rest = json; !rest.empty();) {
        if (const std::size_t plain = VT::plainCharacter(rest); plain > 0) {
            shown.append(rest.substr(0, plain));
            rest.remove_prefix(plain);
        } else {
            appendEscaped(shown, takeCharacter(rest));
        }
    }
    return shown;
}

std::string jsonNumber(double value) {
    if (std::isnan(value))
        return "\"NaN\"";
    if (std::isinf(value))
        return value > 0 ? "\"Infinity\"" : "\"-Infinity\"";
    return vtsv_dtoa(value, true);
}

void appendMember(std::string& json, std::string_view name, std::string_view value) {
    json.append(",\"").append(name).append("\":").append(value);
}

} // namespace vtsym
