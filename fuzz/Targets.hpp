// Fuzz targets: functions of any bytes that throw where a promise of the library is broken.
#pragma once

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>

namespace VT::Fuzz {

/// A target and the name by which seeds, words and the campaign know it.
struct Target {
    const char* name;
    void (*run)(std::span<const std::uint8_t> input);
};

/// All of them.
std::span<const Target> targets();

/// A promise that was broken, and for what.
struct Broken : std::logic_error {
    using std::logic_error::logic_error;
};

/// How often the following was called.
inline std::uint64_t& demandsMade() {
    static std::uint64_t made = 0;
    return made;
}

/// Throws unless the promise is kept.
inline void demand(bool kept, const char* promise, const std::string& details = {}) {
    ++demandsMade();
    if (!kept)
        throw Broken(std::string("broken: ") + promise + "\n" + details);
}

} // namespace VT::Fuzz
