// Diagnostics of the embedded host: exceptions with sentences from the catalogue, and the end of the process.
//
// A fatal diagnostic writes one line to standard error and aborts, so that a debugger or a core dump shows the place.
#include "host/Diagnostics.hpp"

#include "host/Messages.hpp"

#include <fmt/format.h>

#include <cstdio>
#include <cstdlib>

namespace {
bool assertionsEnabled = true;
} // namespace

VT::HostDiagnostic vtsvCreateDiagnostic(std::string messageId, std::vector<VT::DiagnosticArgument> arguments,
                                        std::string additionalText, std::optional<std::size_t> offset) {
    std::string sentence = VT::messageSentence(messageId, arguments, offset);
    if (!additionalText.empty())
        sentence.append(" ").append(additionalText);
    return {std::move(messageId), std::move(arguments), std::move(additionalText), offset, sentence};
}

void vtsvThrowIExceptionFromDiagnostic(const VT::HostDiagnostic& diagnostic) {
    throw diagnostic; // NOLINT(misc-throw-by-value-catch-by-reference): a copy is thrown, and copying cannot fail
}

void vtsvFatalDiagnostic(const char* message, const char* file, int line, const char* function) {
    std::fputs(fmt::format("vtsym: fatal: {} ({}:{}, {})\n", message, file, line, function).c_str(), stderr);
    std::abort();
}

bool vtsvAssertionsEnabled() noexcept {
    return assertionsEnabled;
}

void vtsvSetAssertionsEnabled(bool enabled) noexcept {
    assertionsEnabled = enabled;
}
