// The exception class of diagnostics.  Its contents are shared by all copies, so that copying, and so throwing and
// catching, cannot fail.
#include "host/Diagnostics.hpp"

#include <utility>

namespace VT {

struct HostDiagnostic::Content {
    std::string messageId;
    std::vector<DiagnosticArgument> arguments;
    std::string additionalText;
    std::optional<std::size_t> offset;
};

HostDiagnostic::HostDiagnostic(std::string messageId, std::vector<DiagnosticArgument> arguments,
                               std::string additionalText, std::optional<std::size_t> offset,
                               const std::string& sentence)
    : std::runtime_error(sentence),
      content_(std::make_shared<Content>(
          Content{std::move(messageId), std::move(arguments), std::move(additionalText), offset})) {}

// Copying a shared pointer cannot fail, and what is thrown must not fail to be copied.
HostDiagnostic::HostDiagnostic(const HostDiagnostic&) noexcept = default;
HostDiagnostic& HostDiagnostic::operator=(const HostDiagnostic&) noexcept = default;
HostDiagnostic::~HostDiagnostic() = default;

const std::string& HostDiagnostic::messageId() const noexcept {
    return content_->messageId;
}

const std::vector<DiagnosticArgument>& HostDiagnostic::arguments() const noexcept {
    return content_->arguments;
}

const std::string& HostDiagnostic::additionalText() const noexcept {
    return content_->additionalText;
}

std::optional<std::size_t> HostDiagnostic::offset() const noexcept {
    return content_->offset;
}

} // namespace VT
