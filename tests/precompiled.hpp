// What nearly every test includes; precompiled once for all test programs.
#include "cmake/precompiled.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>
