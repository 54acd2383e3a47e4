#include "base/core/Up.hpp"
constexpr std::size_t mostSamples = 8;
constexpr std::size_t pageSize = 64;
