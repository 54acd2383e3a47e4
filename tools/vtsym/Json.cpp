#include "tools/vtsym/Json.hpp"

#include "host/Numbers.hpp"

#include <cmath>
#include <nlohmann/json.hpp>

namespace vtsym {

std::string jsonString(std::string_view text) {
    using Json = nlohmann::json;
    return Json(text).dump(-1, ' ', false, Json::error_handler_t::replace);
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
