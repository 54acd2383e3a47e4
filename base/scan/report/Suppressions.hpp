// Comments that keep a condition as it is, although something is found about it.
#pragma once

#include "base/scan/SourceScan.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// A comment that begins with `vtsym:`, at a directive: on its line, or alone on the line before it.
///
///     #if A && B /* vtsym: keep, B will go with release 4 */
///     // vtsym: keep dead removable, generated
///
/// It names the kinds of findings to keep quiet about, or none for all, and after the comma a reason.
struct VTSYM_API Suppression {
    SourceRegion region;               ///< of the comment
    std::string text;                  ///< of the comment, without its marks
    std::optional<std::uint64_t> line; ///< of the directive; nothing where there is none
    bool asksToKeep = false;           ///< its first word is `keep`; others count at a directive alone
    bool isMalformed = false;          ///< the comment cannot be read
    std::vector<std::string> kinds{};  ///< empty for all
    std::string reason{};

    /// Whether it is about a finding of a kind at the directive of a line.
    [[nodiscard]] bool covers(std::uint64_t directive, std::string_view kind) const;
};

/// Returns the suppressions of a file in their order.  Linear in the text; fast where there are none.
VTSYM_API std::vector<Suppression> readSuppressions(std::string_view text);

} // namespace VT
