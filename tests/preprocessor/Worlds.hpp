// What a real preprocessor makes of a file under every definition of the macros of a small world.
#pragma once

#include "tests/preprocessor/RandomSource.hpp"

#include <cstddef>
#include <cstdint>
#include <set>
#include <string>
#include <vector>

namespace VT::Testing {

/// The branches that are entered, for every definition.  With `assumed`, a -1 is among them where that condition does
/// not hold before the file, or after a header.
std::vector<std::set<int>> entered(std::string text, const Values& values, const std::string& assumed = {});

/// Whether a branch is asked for where those that are entered are.
bool isReached(const Branch& branch, const std::set<int>& entered);

/// The byte of a line and a column of code points, from 1.
std::size_t offsetOf(const std::string& text, std::uint64_t line, std::uint64_t column);

} // namespace VT::Testing
