// The catalogue of messages (host/Messages.def) as values, and the sentences made from it.
#pragma once

#include "host/Diagnostics.hpp"

#include <span>
#include <string_view>

namespace VT {

/// Type of a message's argument; the order is that of the alternatives of DiagnosticArgument.
enum class MessageArgument : std::uint8_t { Text, Integer, Real };

/// One row of the catalogue.
struct MessageInfo {
    std::string_view id;
    std::span<const MessageArgument> arguments;
    std::string_view sentence;
};

/// All rows, in the order of the catalogue.
VTSYM_API std::span<const MessageInfo> messageCatalogue();

/// The row of an id, or nullptr.
VTSYM_API const MessageInfo* findMessage(std::string_view id);

/// Whether the arguments have the number and the types that the row asks for.
VTSYM_API bool fits(const MessageInfo& message, std::span<const DiagnosticArgument> arguments);

/// The readable sentence for a message.  For an unknown id, or arguments that do not fit, it lists the id and the
/// arguments, so that an error is never hidden by an error in its report.  Length is bounded whatever the arguments
/// hold.
VTSYM_API std::string messageSentence(std::string_view id, std::span<const DiagnosticArgument> arguments,
                                      std::optional<std::size_t> offset);

} // namespace VT
