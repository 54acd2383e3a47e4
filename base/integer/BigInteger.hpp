// Integers of any size.
#pragma once

#include <boost/multiprecision/cpp_int.hpp>

namespace VT {

using BigInteger = boost::multiprecision::cpp_int;

} // namespace VT
