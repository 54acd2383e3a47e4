// Random conditions of linear arithmetic as text.
#pragma once

#include <random>
#include <string>

namespace VT::Testing {

/// One to four comparisons of sums of multiples of A, B, C and D, joined by && and ||.  Factors have up to 70 bits,
/// most of them few; parts may be quotients, remainders, shifts or masks of a name or a sum by literals.
std::string randomLinear(std::mt19937_64& random);

} // namespace VT::Testing
