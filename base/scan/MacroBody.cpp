// Classifies the definition of a macro by its tokens: one operand, another macro, or operators that may come apart.
// Linear in the tokens.
#include "base/scan/MacroBody.hpp"

#include <algorithm>
#include <array>

namespace VT {

namespace {

using Tokens = std::span<const DirectiveToken>;

bool is(Tokens tokens, std::size_t at, std::string_view text) {
    return at < tokens.size() && tokens[at].text == text;
}

/// Returns the position after the parenthesis that closes the first one; beyond the end where none does.
std::size_t afterParentheses(Tokens tokens) {
    std::size_t open = 0;
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        open += tokens[i].text == "(" ? 1U : 0U;
        open -= tokens[i].text == ")" ? 1U : 0U;
        if (open == 0)
            return i + 1;
    }
    return tokens.size() + 1;
}

bool isPrefix(std::string_view text) {
    return text == "!" || text == "~" || text == "-" || text == "+";
}

bool hasPaste(Tokens tokens) {
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        const bool digraph =
            is(tokens, i, "%") && is(tokens, i + 1, ":") && is(tokens, i + 2, "%") && is(tokens, i + 3, ":");
        if (tokens[i].text == "##" || digraph)
            return true;
    }
    return false;
}

MacroBody formOf(Tokens body, Tokens parameters) {
    using Form = MacroBody::Form;
    while (!body.empty() && isPrefix(body.front().text))
        body = body.subspan(1);
    if (is(body, 0, "defined") && body.size() == 2)
        return {};
    if (is(body, 0, "("))
        return {.form = afterParentheses(body) == body.size() ? Form::Operand : Form::Open};
    if (body.size() > 1 && !(is(body, 1, "(") && afterParentheses(body.subspan(1)) == body.size() - 1))
        return {.form = Form::Open};
    if (body.empty() || body.front().kind != DirectiveTokenKind::Name)
        return {.form = body.size() > 1 ? Form::Open : Form::Operand};
    const std::string_view name = body.front().text;
    if (std::ranges::find(parameters, name, &DirectiveToken::text) != parameters.end() || name == "__VA_ARGS__")
        return {.form = Form::Open};
    return {.form = Form::Alias, .alias = name};
}

/// Whether a token's text, a name or a string, holds a word of a pragma.
bool holds(const DirectiveToken& token, std::string_view word) {
    return token.kind == DirectiveTokenKind::String ? token.text.find(word) != std::string_view::npos
                                                    : token.text == word;
}

} // namespace

bool variesByItself(std::string_view name) {
    static constexpr auto names =
        std::to_array<std::string_view>({"__LINE__", "__COUNTER__", "__INCLUDE_LEVEL__", "__FILE__", "__FILE_NAME__",
                                         "__BASE_FILE__", "__TIMESTAMP__", "__DATE__", "__TIME__"});
    return std::ranges::find(names, name) != names.end();
}

bool isOddName(const DirectiveToken& token) {
    if (token.text == "\\")
        return true;
    if (token.kind != DirectiveTokenKind::Name)
        return false;
    const std::string_view text = token.text;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const auto lead = static_cast<unsigned char>(text[i]);
        if (lead < 0x80)
            continue;
        const unsigned next = ++i < text.size() ? static_cast<unsigned char>(text[i]) : 0U;
        const unsigned letter = (lead & 0x1FU) << 6U | (next & 0x3FU);
        const bool isLatin = letter >= 0xC0 && letter < 0x250 && letter != 0xD7 && letter != 0xF7;
        const bool isCyrillic = letter >= 0x400 && letter < 0x482;
        if ((lead & 0xE0U) != 0xC0U || (next & 0xC0U) != 0x80U || !(isLatin || isCyrillic))
            return true;
    }
    return false;
}

MacroBody readMacroBody(Tokens definition) {
    const bool isFunction = is(definition, 0, "(") && !definition.front().afterBlank;
    const std::size_t begin =
        isFunction ? std::min<std::size_t>(afterParentheses(definition), definition.size()) : std::size_t{0};
    const Tokens body = definition.subspan(begin);
    MacroBody result = formOf(body, definition.first(begin));
    result.varies = hasPaste(body) || std::ranges::any_of(body, isOddName);
    result.hasPragma = pragmaChangesMacros(body);
    return result;
}

bool pragmaChangesMacros(Tokens tokens) {
    const auto anyHolds = [&](std::string_view word) {
        return std::ranges::any_of(tokens, [&](const DirectiveToken& token) { return holds(token, word); });
    };
    // Options of the compiler set predefined macros; a poisoned macro cannot be read.
    static constexpr auto ofCompiler =
        std::to_array<std::string_view>({"target", "optimize", "pop_options", "reset_options", "poison"});
    static constexpr auto others = std::to_array<std::string_view>({"pop_macro", "include_alias"});
    // The text of an operator may begin on another line, or be made by a macro from its argument.
    const bool isOperator = anyHolds("_Pragma") || anyHolds("__pragma");
    const bool isSplit = std::ranges::any_of(tokens, [](const DirectiveToken& token) {
        return token.kind == DirectiveTokenKind::String && token.text.find('\n') != std::string_view::npos;
    });
    const bool hasEnd = std::ranges::any_of(tokens, [](const DirectiveToken& token) { return token.text == ")"; });
    return (isOperator && (isSplit || !hasEnd)) || std::ranges::any_of(others, anyHolds) ||
           ((anyHolds("GCC") || anyHolds("clang")) && std::ranges::any_of(ofCompiler, anyHolds));
}

} // namespace VT
