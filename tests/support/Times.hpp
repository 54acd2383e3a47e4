// Long texts.
#pragma once

#include <string>

namespace VT::Testing {

inline std::string times(std::size_t count, const std::string& text) {
    std::string all;
    all.reserve(count * text.size());
    for (std::size_t i = 0; i < count; ++i)
        all += text;
    return all;
}

} // namespace VT::Testing
