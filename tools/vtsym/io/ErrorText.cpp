// Turns the exception of a text into its message, and places a caret under the byte that it is about.
//
// Lines are cut around that byte, at the beginnings of UTF-8 characters, so that text and caret fit a screen however
// long the text is.  Bytes that are not UTF-8 count as one column each.
#include "tools/vtsym/io/ErrorText.hpp"

#include "host/Diagnostics.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/io/ErrorHints.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>
#include <new>

namespace vtsym {

namespace {

// Bytes of the text that are shown before and after the place of an error.
constexpr std::size_t shownBefore = 48;
constexpr std::size_t shownAfter = 32;

bool continuesCharacter(char byte) {
    return (static_cast<unsigned char>(byte) & 0xc0U) == 0x80U;
}

/// The nearest beginning of a character at or before a byte; the byte itself where the text is not UTF-8.
std::size_t characterAt(std::string_view text, std::size_t offset) {
    std::size_t begin = offset;
    while (begin > 0 && begin < text.size() && offset - begin < 3 && continuesCharacter(text[begin]))
        --begin;
    return begin < text.size() && continuesCharacter(text[begin]) ? offset : begin;
}

} // namespace

std::vector<TextError> currentTextErrors() {
    try {
        throw;
    } catch (const VT::HostDiagnostic& diagnostic) {
        return {{diagnostic.messageId(), diagnostic.what(), diagnostic.offset()}};
    } catch (const CommandError& error) {
        return error.errors();
    } catch (const std::length_error&) {
        return {{"vtsym:TextTooLong", "The answer is longer than a text may be.", std::nullopt}};
    } catch (const std::bad_alloc&) {
        return {{"vtsym:OutOfMemory", "There is not enough memory for the answer.", std::nullopt}};
    }
}

TextError currentTextError() {
    return currentTextErrors().front();
}

std::string withCaret(std::string_view text, std::size_t offset, const Style& style) {
    offset = std::min(offset, text.size());
    const std::size_t begin = characterAt(text, offset > shownBefore ? offset - shownBefore : 0);
    const std::size_t end = characterAt(text, std::min(text.size() - offset, shownAfter) + offset);
    std::string before = begin > 0 ? "..." : "";
    before += VT::shownText(text.substr(begin, offset - begin));
    std::string after = VT::shownText(text.substr(offset, end - offset));
    if (end < text.size())
        after += "...";
    const auto columns = std::ranges::count_if(before, [](char byte) { return !continuesCharacter(byte); });
    std::string result = "  " + before + after + "\n  ";
    result.append(static_cast<std::size_t>(columns), ' ').append(style.bad("^")).append("\n");
    return result;
}

std::string errorText(std::string_view text, const TextError& error, const Style& style) {
    std::string lines = error.message + "\n";
    if (!error.offset)
        return lines;
    const std::string_view part = text.substr(error.begin, error.end - error.begin);
    lines += withCaret(part, *error.offset - error.begin, style);
    if (error.id != "Vantor:Variants:ExpressionParseError")
        return lines;
    if (const std::string_view hint = errorHint(part, *error.offset - error.begin); !hint.empty()) {
        lines.pop_back();
        lines.append(" ").append(hint).append("\n");
    }
    return lines;
}

std::string errorLines(std::uint64_t line, std::string_view text, std::span<const TextError> errors,
                       const Style& style) {
    std::string lines;
    for (const TextError& error : errors)
        lines += style.strong("line " + std::to_string(line) + ":") + " " + errorText(text, error, style);
    return lines;
}

std::string warningLine(std::uint64_t line, std::string_view warning, const Style& style) {
    return style.strong("line " + std::to_string(line) + ":").append(" warning: ").append(warning).append("\n");
}

std::string jsonOf(std::span<const TextError> errors) {
    const auto members = [](const TextError& error) {
        std::string json = "{\"id\":" + jsonString(error.id);
        appendMember(json, "message", jsonString(error.message));
        if (error.offset)
            appendMember(json, "offset", std::to_string(*error.offset));
        return json;
    };
    std::string further;
    for (const TextError& error : errors.subspan(1))
        further.append(further.empty() ? "" : ",").append(members(error)).append("}");
    std::string json = members(errors.front());
    if (!further.empty())
        appendMember(json, "further", "[" + further + "]");
    return json + "}";
}

} // namespace vtsym
