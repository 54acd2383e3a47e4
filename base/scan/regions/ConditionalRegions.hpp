// The branches of a file as regions of its text.
#pragma once

#include "base/scan/DirectiveReader.hpp"
#include "host/Export.hpp"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// A branch: its directive, and the lines that are built if it is entered.  Places are bytes of the text.
struct ConditionalRegion {
    DirectiveKind kind;
    std::uint32_t parent;  ///< the branch around it, or ConditionalRegions::none
    std::uint32_t chain;   ///< the first branch of its chain
    std::string directive; ///< "#elif A > 2"
    std::uint64_t line;    ///< of the directive, from 1
    std::size_t begin;     ///< of the directive, from # to after its last token
    std::size_t end;
    std::size_t bodyBegin;      ///< the first line after the directive
    std::size_t bodyEnd;        ///< the line of the directive that ends the branch, or the end of the text
    bool isSwitchedOff = false; ///< by a constant: #if 0, or #else of #if 1
    bool isAfterElse = false;   ///< not a branch with a meaning
};

/// The end of a chain.
struct ConditionalEnd {
    std::uint32_t chain; ///< its first branch
    std::size_t begin;   ///< of the #endif, from # to after its last token
    std::size_t end;
};

/// All branches of a file.
class VTSYM_API ConditionalRegions {
public:
    static constexpr std::uint32_t none = ~std::uint32_t{0};

    /// Reads a text, which may be any bytes and end anywhere.  There are no regions in one that preprocessors read in
    /// different ways.  Linear.
    explicit ConditionalRegions(std::string_view text);

    /// In the order of their directives.
    [[nodiscard]] const std::vector<ConditionalRegion>& all() const noexcept { return regions_; }

    [[nodiscard]] const ConditionalRegion& operator[](std::uint32_t at) const { return regions_[at]; }

    /// Returns the innermost branch whose directive or lines hold a byte, or none.  Logarithmic, and linear in the
    /// depth.
    [[nodiscard]] std::uint32_t at(std::size_t byte) const;
    /// Returns the first #endif that begins between two bytes, or nullptr.  Logarithmic.
    [[nodiscard]] const ConditionalEnd* endWithin(std::size_t begin, std::size_t end) const;
    /// Returns the branch whose directive is on a line, or none.  Logarithmic.
    [[nodiscard]] std::uint32_t onLine(std::uint64_t line) const;

    /// The last byte of a chain: after its #endif, or the end of the text.
    [[nodiscard]] std::size_t chainEnd(std::uint32_t chain) const { return chainEnds_[chain]; }

private:
    void add(std::string_view text, const Directive& directive, std::uint32_t parent, std::uint32_t chain);

    std::vector<ConditionalRegion> regions_;
    std::vector<ConditionalEnd> ends_;
    std::vector<std::size_t> lineBegins_; ///< by region
    std::vector<std::size_t> chainEnds_;  ///< by region, of those that begin a chain
};

} // namespace VT
