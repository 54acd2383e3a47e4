// Cases as "BEFORE => AFTER".
#pragma once

#include <string>
#include <utility>

namespace VT::Testing {

inline std::pair<std::string, std::string> sides(const std::string& text) {
    const std::size_t arrow = text.find(" => ");
    return {text.substr(0, arrow), text.substr(arrow + 4)};
}

} // namespace VT::Testing
