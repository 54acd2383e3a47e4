// Writes directives in the words of their author.  Linear in the tokens.
#include "base/scan/report/DirectiveTexts.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/DirectiveCondition.hpp"

namespace VT {

std::string_view keywordText(DirectiveKind kind) {
    switch (kind) {
    case DirectiveKind::If:
        return "#if";
    case DirectiveKind::Ifdef:
        return "#ifdef";
    case DirectiveKind::Ifndef:
        return "#ifndef";
    case DirectiveKind::Elif:
        return "#elif";
    case DirectiveKind::Elifdef:
        return "#elifdef";
    case DirectiveKind::Elifndef:
        return "#elifndef";
    default:
        return "#else";
    }
}

bool isExpression(DirectiveKind kind) {
    return kind == DirectiveKind::If || kind == DirectiveKind::Elif;
}

bool opensChain(DirectiveKind kind) {
    return kind == DirectiveKind::If || kind == DirectiveKind::Ifdef || kind == DirectiveKind::Ifndef;
}

bool continuesChain(DirectiveKind kind) {
    return kind == DirectiveKind::Elif || kind == DirectiveKind::Elifdef || kind == DirectiveKind::Elifndef ||
           kind == DirectiveKind::Else;
}

bool belongsToChain(DirectiveKind kind, bool isBegun) {
    return opensChain(kind) || (isBegun && (kind == DirectiveKind::Endif || continuesChain(kind)));
}

std::string directiveText(const Directive& directive) {
    std::string text(keywordText(directive.kind));
    if (directive.kind != DirectiveKind::Else && !directive.tokens.empty())
        text.append(" ").append(
            spelledTokens(isExpression(directive.kind) ? directive.tokens : directive.tokens.first(1)));
    return text;
}

std::string quotedDirective(std::string text) {
    if (text.size() > limits::quotedBytes)
        text.replace(limits::quotedBytes, std::string::npos, "...");
    return text;
}

std::string conditionText(const Directive& directive) {
    if (isExpression(directive.kind))
        return spelledTokens(directive.tokens);
    const bool negated = directive.kind == DirectiveKind::Ifndef || directive.kind == DirectiveKind::Elifndef;
    std::string text(negated ? "!defined(" : "defined(");
    return text.append(directive.tokens.front().text).append(")");
}

} // namespace VT
