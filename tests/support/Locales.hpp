// Runs checks under locales that write numbers and fold letters in other ways.
#pragma once

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <locale>
#include <string>

namespace VT::Testing {

/// Calls `check` under each locale, set for C and for C++ alike.  The build makes these locales; one that cannot be set
/// is a failure.
template <class Check>
void inEveryLocale(Check check) {
    setenv("LOCPATH", VTSYM_TEST_LOCALES, 1); // NOLINT(concurrency-mt-unsafe): before any thread
    const std::string before = std::setlocale(LC_ALL, nullptr);
    for (const char* const name : {"de_DE.UTF-8", "de_DE.ISO-8859-1", "tr_TR.UTF-8", "C"}) {
        SCOPED_TRACE(name);
        ASSERT_NE(std::setlocale(LC_ALL, name), nullptr);
        const std::locale global = std::locale::global(std::locale(name));
        check();
        std::locale::global(global);
        std::setlocale(LC_ALL, before.c_str());
    }
}

} // namespace VT::Testing
