// What is found in a document, as editors are told: diagnostics, hovers, actions and symbols.
#pragma once

#include "tools/vtsym/lsp/OpenDocument.hpp"
#include "tools/vtsym/lsp/RpcMessages.hpp"

namespace vtsym {

/// What an editor can show.
struct EditorAbilities {
    bool markdown = true;        ///< in hovers
    bool nestedSymbols = false;  ///< symbols in symbols
    bool literalActions = false; ///< actions that are edits rather than commands
    bool versionedEdits = false; ///< edits of one version of a document
    bool relatedPlaces = false;  ///< of diagnostics
    bool tags = false;           ///< text that is not needed
};

// The functions below are about an analysed document.  Each returns a value of the protocol.

Json rangeOf(const TextDocument& text, std::size_t begin, std::size_t end);
/// The parameters of textDocument/publishDiagnostics.  Without the ability to dim text, what no build has is left out.
Json diagnosticsOf(const OpenDocument& document, const EditorAbilities& abilities);
/// Under which condition the line of a byte is built, and why it may not be; null outside of all branches.
Json hoverAt(const OpenDocument& document, std::size_t byte, const EditorAbilities& abilities);
/// The actions for what is marked between two bytes, of the kinds that are asked for: null for all.
Json actionsFor(const OpenDocument& document, std::size_t begin, std::size_t end, const Json& only,
                const EditorAbilities& abilities);
/// The branches of the document.
Json symbolsOf(const OpenDocument& document, const EditorAbilities& abilities);

} // namespace vtsym
