// Applies definitions, inclusions and pragmas to the states of macros.  Linear in the tokens.
#include "base/scan/MacroChanges.hpp"

namespace VT {

void MacroChanges::take(const Directive& directive) {
    if (directive.kind == DirectiveKind::Include) {
        if (strictIncludes_)
            states_.changeAll();
        else
            states_.include();
        return;
    }
    if (directive.kind == DirectiveKind::Pragma) {
        if (pragmaChangesMacros(directive.tokens))
            states_.changeAll();
        return;
    }
    const std::span<const DirectiveToken> tokens = directive.tokens;
    if (tokens.empty())
        return;
    const bool isCut = tokens.size() > 1 && isOddName(tokens[1]) && tokens[1].begin == tokens[0].end;
    if (tokens[0].kind != DirectiveTokenKind::Name || isOddName(tokens[0]) || isCut) { // the macro is unknown
        states_.changeAll();
        return;
    }
    const auto nameOf = [&](const DirectiveToken& token) { // a text of the file, but for a token with splices inside
        return states_.nameOf(token.text, token.end - token.begin == token.text.size());
    };
    const MacroStates::Name macro = nameOf(tokens[0]);
    states_.change(macro);
    if (directive.kind == DirectiveKind::Undef)
        return;
    names_.clear();
    for (const DirectiveToken& token : tokens.subspan(1))
        if (token.kind == DirectiveTokenKind::Name)
            names_.push_back(nameOf(token));
    const MacroBody body = readMacroBody(tokens.subspan(1));
    states_.addBody(macro, body, names_);
    expandsToPragma_ = expandsToPragma_ || body.hasPragma;
}

} // namespace VT
