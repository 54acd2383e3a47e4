// The brackets of Quill.
#pragma once

#include "host/QuillParser.hpp"

namespace VT::Embedded {

/// A kind of bracket, and what it may hold.
struct QuillBracket {
    char closing;
    QuillToken open;
    QuillToken close;
    QuillRule rule;              ///< that the bracket makes
    std::string_view missing;    ///< the reason for a failure where another bracket closes, or nothing does
    bool commas = false;         ///< between arguments or elements
    bool semicolons = false;     ///< between rows
    bool blanksSeparate = false; ///< white space separates like a comma
    bool isIndex = false;        ///< `end` has a meaning
};

/// The text itself counts as a bracket that nothing closes.
inline constexpr QuillBracket wholeText{
    .closing = '\0', .open = {}, .close = {}, .rule = {}, .missing = "this bracket has not been opened"};

inline constexpr QuillBracket parentheses{.closing = ')',
                                          .open = QuillToken::OpenParenthesis,
                                          .close = QuillToken::CloseParenthesis,
                                          .rule = QuillRule::Parentheses,
                                          .missing = "a closing ) is missing"};

inline constexpr QuillBracket callParentheses{.closing = ')',
                                              .open = QuillToken::OpenParenthesis,
                                              .close = QuillToken::CloseParenthesis,
                                              .rule = QuillRule::Call,
                                              .missing = parentheses.missing,
                                              .commas = true,
                                              .isIndex = true};

inline constexpr QuillBracket indexBraces{.closing = '}',
                                          .open = QuillToken::OpenBrace,
                                          .close = QuillToken::CloseBrace,
                                          .rule = QuillRule::CellIndex,
                                          .missing = "a closing } is missing",
                                          .commas = true,
                                          .blanksSeparate = true,
                                          .isIndex = true};

inline constexpr QuillBracket matrixBrackets{.closing = ']',
                                             .open = QuillToken::OpenBracket,
                                             .close = QuillToken::CloseBracket,
                                             .rule = QuillRule::Matrix,
                                             .missing = "a closing ] is missing",
                                             .commas = true,
                                             .semicolons = true,
                                             .blanksSeparate = true};

inline constexpr QuillBracket cellBraces{.closing = '}',
                                         .open = QuillToken::OpenBrace,
                                         .close = QuillToken::CloseBrace,
                                         .rule = QuillRule::CellArray,
                                         .missing = indexBraces.missing,
                                         .commas = true,
                                         .semicolons = true,
                                         .blanksSeparate = true};

} // namespace VT::Embedded
