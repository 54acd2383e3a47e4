// Errors: those that the caller can handle, and those that end the process.
#pragma once

#include "host/Export.hpp"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <variant>
#include <vector>

namespace VT {

using DiagnosticArgument = std::variant<std::string, std::int64_t, double>;

/// An error that names a message of the catalogue (host/Messages.def).  what() is the readable sentence.  Copies share
/// their contents and do not throw.
class VTSYM_API HostDiagnostic : public std::runtime_error {
public:
    /// @param sentence  what the user reads
    /// @param offset    byte offset in the text that the message is about, where there is one
    HostDiagnostic(std::string messageId, std::vector<DiagnosticArgument> arguments, std::string additionalText,
                   std::optional<std::size_t> offset, const std::string& sentence);
    HostDiagnostic(const HostDiagnostic&) noexcept;
    HostDiagnostic& operator=(const HostDiagnostic&) noexcept;
    ~HostDiagnostic() override;

    const std::string& messageId() const noexcept;
    const std::vector<DiagnosticArgument>& arguments() const noexcept;
    const std::string& additionalText() const noexcept;

    /// Byte offset in the text that the message is about, where the message has a place.
    std::optional<std::size_t> offset() const noexcept;

private:
    struct Content;
    std::shared_ptr<const Content> content_;
};

} // namespace VT

/// Makes a diagnostic of a message id; throws nothing but std::bad_alloc, whatever the id and the arguments are.
///
/// @param additionalText  appended to the sentence of the catalogue as a sentence of its own
/// @param offset          byte offset in the text that the message is about, where there is one
VTSYM_API VT::HostDiagnostic vtsvCreateDiagnostic(std::string messageId, std::vector<VT::DiagnosticArgument> arguments,
                                                  std::string additionalText,
                                                  std::optional<std::size_t> offset = std::nullopt);

/// Throws the diagnostic.
[[noreturn]] VTSYM_API void vtsvThrowIExceptionFromDiagnostic(const VT::HostDiagnostic& diagnostic);

/// Ends the process: an invariant of the library, or a precondition of a call, does not hold.  The embedded host writes
/// one line to standard error and aborts.  A host may throw instead; the library stays usable then.
[[noreturn]] VTSYM_API void vtsvFatalDiagnostic(const char* message, const char* file, int line, const char* function);

/// Whether violated preconditions that the library could ignore without harm are fatal.  True by default.
VTSYM_API bool vtsvAssertionsEnabled() noexcept;
VTSYM_API void vtsvSetAssertionsEnabled(bool enabled) noexcept;
