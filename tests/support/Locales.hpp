// Runs checks under locales that write numbers and fold letters in other ways.
#pragma once

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <locale>
#ifdef __SANITIZE_ADDRESS__
#include <sanitizer/lsan_interface.h>
#endif
#include <stdexcept>
#include <string>

namespace VT::Testing {

/// Sets the locale of C and answers that of C++; std::runtime_error where there is none.  The C library keeps the names
/// of folders that it looked into, which is no leak of ours.
inline std::locale setLocale(const char* name) {
#ifdef __SANITIZE_ADDRESS__
    const __lsan::ScopedDisabler keptByTheLibrary;
#endif
    return std::setlocale(LC_ALL, name) != nullptr ? std::locale(name) : throw std::runtime_error(name);
}

/// Calls `check` under each locale, set for C and for C++ alike.  The build makes these locales; one that cannot be set
/// is a failure.
template <class Check>
void inEveryLocale(Check check) {
    setenv("LOCPATH", VTSYM_TEST_LOCALES, 1); // NOLINT(concurrency-mt-unsafe): before any thread
    const std::string before = std::setlocale(LC_ALL, nullptr);
    for (const char* const name : {"de_DE.UTF-8", "de_DE.ISO-8859-1", "tr_TR.UTF-8", "C"}) {
        SCOPED_TRACE(name);
        const std::locale global = std::locale::global(setLocale(name));
        check();
        std::locale::global(global);
        setLocale(before.c_str());
    }
}

} // namespace VT::Testing
