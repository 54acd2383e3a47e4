// Parse trees of Quill text: a service that the library asks of its host.
#pragma once

#include "host/Export.hpp"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

// The names of this service are the host's.
// NOLINTBEGIN(bugprone-reserved-identifier,readability-identifier-naming)

/// One node of a parse tree.
template <class Char>
struct _Q_parse_tree_T {
    static constexpr std::int32_t terminal = 0;    ///< a token
    static constexpr std::int32_t nonTerminal = 1; ///< a rule and its parts

    std::int32_t kind;
    std::int32_t code;   ///< of the token or the rule: VT::QuillToken, VT::QuillRule
    std::uint32_t start; ///< characters before the token, or before the first token of the rule

    union {
        std::uint32_t length;    ///< of a terminal: characters of the token
        std::int32_t childCount; ///< of a non-terminal
    };

    union {
        const Char* text;                ///< of a terminal: the token, inside the text that was parsed
        const _Q_parse_tree_T* children; ///< of a non-terminal: the first of its children, followed by the others
    };
};

namespace VT {

/// Codes of terminals.
enum class QuillToken : std::int32_t {
#define VTSYM_QUILL_TOKEN(Code, Name, Text) Name = (Code),
#include "host/QuillCodes.def"
};

/// Codes of non-terminals.
enum class QuillRule : std::int32_t {
#define VTSYM_QUILL_RULE(Code, Name, Text, Children) Name = (Code),
#include "host/QuillCodes.def"
};

/// Why a text has no parse tree.
struct QuillFailure {
    std::size_t position = 0; ///< characters before the place where parsing stopped; at most those of the text
    std::string_view reason;  ///< a sentence for the author of the text; empty without a failure; has static lifetime
};

/// A second base of parsers whose trees of names, numbers, calls of names, fields of names, parentheses and operators
/// other than powers, transposes and ranges are those of the language.  The library then reads texts of nothing else by
/// itself, and asks for no tree.  All parsers of a host have this base, or none.
class ReadsOrdinaryQuill {};

} // namespace VT

/// A parser of Quill expressions.  It may be used for any number of texts, by one thread at a time.
///
/// Inside [ ] and { } white space, the ends of lines among it, separates elements.  Commas and semicolons without an
/// element between them are errors, empty rows are not.
template <class Char>
class PARSER_T {
public:
    using Tree = _Q_parse_tree_T<Char>;

    /// Makes a parser.
    ///
    /// @param nesting   brackets and anonymous functions that may be open at one place, and prefix operators that may
    ///                  follow each other; one more is a failure at that place
    /// @param keywords  texts, each beginning with a parenthesis, that are one identifier wherever an operand may start
    static std::unique_ptr<PARSER_T> create(std::size_t nesting, std::span<const std::string> keywords = {});

    PARSER_T(const PARSER_T&) = delete;
    PARSER_T& operator=(const PARSER_T&) = delete;
    virtual ~PARSER_T() = default;

    /// The tree of a text that ends with NUL.
    const Tree* generate_parse_tree(const Char* text) {
        return generate_parse_tree(text, std::char_traits<Char>::length(text));
    }

    /// The tree of a text: a node VT::QuillRule::Root with one child.  nullptr where the text is not an
    /// expression; failure() returns the reason then.  The tree points into the text, which must outlive it.
    ///
    /// Linear in the length of the text.  When memory runs out, std::bad_alloc passes and the parser stays usable.
    virtual const Tree* generate_parse_tree(const Char* text, std::size_t length) = 0;

    /// Frees a tree that this parser has made; does nothing for nullptr.
    virtual void delete_parse_tree(const Tree* tree) noexcept = 0;

    /// Why the last text has no tree.
    virtual VT::QuillFailure failure() const noexcept = 0;

protected:
    PARSER_T() = default;
};

template <>
VTSYM_API std::unique_ptr<PARSER_T<char>> PARSER_T<char>::create(std::size_t nesting,
                                                                 std::span<const std::string> keywords);

/// The name of a terminal's code, for people; "unknown" for a code that no terminal has.
VTSYM_API const char* vtuQParserTerminalName(std::int32_t code) noexcept;

/// The name of a non-terminal's code, for people; "unknown" for a code that no non-terminal has.
VTSYM_API const char* vtuQParserNonTerminalName(std::int32_t code) noexcept;

// NOLINTEND(bugprone-reserved-identifier,readability-identifier-naming)
