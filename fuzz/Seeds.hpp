// The inputs that are kept for a target: a line each in fuzz/seeds/TARGET.txt, in which bytes other than printable
// ones, and the backslash, are \xHH.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace VT::Fuzz {

using Seed = std::vector<std::uint8_t>;

/// The inputs of such a text.  Throws std::runtime_error for a line that is not one.
inline std::vector<Seed> seedsOf(const std::string& text) {
    std::vector<Seed> seeds;
    Seed seed;
    for (std::size_t at = 0; at < text.size(); ++at)
        if (text[at] == '\n') {
            seeds.push_back(seed);
            seed.clear();
        } else if (text[at] == '\\') {
            seed.push_back(static_cast<std::uint8_t>(std::stoul(text.substr(at + 2, 2), nullptr, 16)));
            at += 3;
        } else {
            seed.push_back(static_cast<std::uint8_t>(text[at]));
        }
    return seeds;
}

/// The line of an input.
inline std::string lineOf(const Seed& seed) {
    static constexpr char digits[] = "0123456789abcdef";
    std::string line;
    for (const std::uint8_t byte : seed)
        if (byte >= ' ' && byte <= '~' && byte != '\\')
            line += static_cast<char>(byte);
        else
            line += std::string("\\x") + digits[byte >> 4U] + digits[byte & 15U];
    return line + "\n";
}

} // namespace VT::Fuzz
