// What the quick reader knows of bytes and spellings: one table for each language, made from the operator table.
#pragma once

#include "base/core/Operators.hpp"
#include "base/transform/QuillCalls.hpp"
#include "parser/SyntaxValue.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <string_view>

namespace VT::Parser {

inline constexpr std::uint8_t letterClass = 1;
inline constexpr std::uint8_t digitClass = 2;
inline constexpr std::uint8_t blankClass = 4;

inline constexpr auto byteClasses = [] {
    std::array<std::uint8_t, 256> classes{};
    for (unsigned c = 'a'; c <= 'z'; ++c)
        classes[c] = classes[c - 'a' + 'A'] = letterClass;
    classes['_'] = letterClass;
    for (unsigned c = '0'; c <= '9'; ++c)
        classes[c] = digitClass;
    for (const char c : {' ', '\t', '\n', '\v', '\f', '\r'})
        classes[static_cast<unsigned char>(c)] = blankClass;
    return classes;
}();

inline bool isOf(char c, unsigned classes) {
    return (byteClasses[static_cast<unsigned char>(c)] & classes) != 0;
}

/// The infix operators that begin with a byte: alone, and with a second byte.
struct Beginning {
    static constexpr std::size_t most = 2;

    SymbolicOp alone = SymbolicOp::None;
    std::array<char, most> seconds{};
    std::array<SymbolicOp, most> pairs{SymbolicOp::None, SymbolicOp::None};
};

using Beginnings = std::array<Beginning, 256>;

/// The infix operators of Quill that bind looser than signs and do not begin with a dot.
inline constexpr OperatorSet quickQuillOps = OperatorSet::where([](const OperatorInfo& row) {
    return row.form == OperatorForm::Infix && row.precedence > operatorInfo(SymbolicOp::UnaryMinus).precedence &&
           !row.quill.empty() && row.quill[0] != '.';
});

constexpr Beginnings beginningsOf(OperatorSet operators, bool isQuill) {
    Beginnings all{};
    all.fill(Beginning{}); // GCC 12 leaves the initializers of members out
    for (const OperatorInfo& row : operatorTable()) {
        if (!operators.contains(row.op))
            continue;
        const std::string_view spelling = isQuill ? row.quill : row.c;
        Beginning& beginning = all[static_cast<unsigned char>(spelling[0])];
        if (spelling.size() == 1) {
            beginning.alone = row.op;
            continue;
        }
        const std::size_t place = beginning.seconds[0] == '\0' ? 0 : 1;
        beginning.seconds.at(place) = spelling[1];
        beginning.pairs.at(place) = row.op;
    }
    if (isQuill)
        all['!'] = all['~']; // a second spelling
    return all;
}

inline constexpr Beginnings beginningsOfC = beginningsOf(conditionInfixOps, false);
inline constexpr Beginnings beginningsOfQuill = beginningsOf(quickQuillOps, true);
static_assert(beginningsOfQuill['_'].alone == SymbolicOp::None && beginningsOfC['_'].alone == SymbolicOp::None);

/// Whether a name is a word of Quill, or of a function that C has an operator for.
inline bool isQuillWord(std::string_view name, bool isCalled) {
    return name == "end" || (isCalled && std::ranges::any_of(quillCalls, [&](SymbolicOp op) {
                                 return operatorInfo(op).quillCall == name;
                             }));
}

} // namespace VT::Parser
