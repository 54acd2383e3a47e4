// Every bound of the language server: its unit, its reason and its consequence.
#pragma once

#include "tools/vtsym/io/Files.hpp"

#include <cstddef>
#include <cstdint>

namespace vtsym {

/// Bytes of one message.  JSON writes some bytes of a text as two; the largest file that the program reads fits.  A
/// larger message is skipped and answered with an error.
inline constexpr std::size_t mostMessageBytes = 2 * mostBytes;

/// Bytes of one line of a message's header.  Those of clients have some 30.  What is beyond is not a header.
inline constexpr std::size_t mostHeaderBytes = 4096;

/// Objects and lists inside of each other in a message.  The protocol needs about ten.  A deeper one is refused.
inline constexpr std::size_t mostNesting = 128;

/// Messages that are read before the first of them is answered, so that cancellations are seen early.  Further ones
/// wait in the pipe.
inline constexpr std::size_t mostWaiting = 1024;

/// Findings of one document that are sent.  Editors become slow with more; a last one counts those left out.
inline constexpr std::size_t mostDiagnostics = 1000;

/// Symbols of one document, and how deep they nest.  Further ones are left out, deeper ones are siblings.
inline constexpr std::size_t mostSymbols = 10'000;
inline constexpr std::size_t deepestSymbol = 32;

/// Directives that decide about a line, as a hover lists them.  Of more, the innermost are listed.
inline constexpr std::size_t mostHoverDirectives = 12;

/// Steps of the check of a model while it is edited: about an eighth of a second at most.  Beyond it the rest of the
/// model is reported as not checked.
inline constexpr std::uint64_t mostModelSteps = std::uint64_t{1} << 20U;

} // namespace vtsym
