// Parse trees of Quill text as text, for people.
#pragma once

#include "host/QuillParser.hpp"

#include <iosfwd>
#include <string_view>

namespace VT {

/// Writes a tree, one line for each node, depth first; for nullptr, the message that there is no tree.  A line begins
/// with its depth, which is shown by blanks too, as far as that stays readable.  Linear in the size of the tree.
VTSYM_API void dumpParseTree(std::ostream& out, std::string_view text, const _Q_parse_tree_T<char>* root);

} // namespace VT
