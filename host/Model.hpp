// Services that the library asks of its host: the model whose blocks carry conditions.  The types are the host's own.
#pragma once

#include "host/Export.hpp"

#include <span>
#include <string_view>

/// A block of the host's model.
class VTBlock;
/// A port: where a signal leaves one block for others.
class vtPort;

namespace VT {

/// A variant condition as its author wrote it.
struct VariantCondition {
    std::string_view text; ///< empty without a condition
    bool isQuill = false;  ///< in Quill syntax; otherwise in C syntax
};

} // namespace VT

/// The block that holds a block, or nullptr.  Following parents must come to an end.
VTSYM_API const VTBlock* vtsvGetBlockParent(const VTBlock& block);
/// The condition of a block itself.  The text may be one of the variant keywords.
VTSYM_API VT::VariantCondition vtsvGetBlockVariantCondition(const VTBlock& block);
/// The choices of a block, each of which has this block as its parent; empty for most blocks.
VTSYM_API std::span<const VTBlock* const> vtsvGetBlockChoices(const VTBlock& block);

/// The block that a port belongs to, and those that its signal goes to.
VTSYM_API const VTBlock* vtsvGetPortSource(const vtPort& port);
VTSYM_API std::span<const VTBlock* const> vtsvGetPortDestinations(const vtPort& port);
