// The preprocessor directives of a C or C++ file.
#pragma once

#include "base/scan/text/SourceText.hpp"
#include "host/Export.hpp"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// Whether preprocessors read the lines of a text in different ways: where trigraphs stand for # or a backslash, or
/// carriage returns end lines.  Linear in the text.
[[nodiscard]] bool hasManyReadings(std::string_view text);

/// The kind of a preprocessing token; Other for everything that is not one of the kinds.
enum class DirectiveTokenKind : std::uint8_t { Name, Number, Character, String, Operator, Other };

/// A token of a directive.
struct DirectiveToken {
    DirectiveTokenKind kind;
    bool afterBlank;       ///< blanks or a comment precede it
    std::string_view text; ///< without line splices; operators in their ordinary spelling
    std::size_t begin;     ///< byte offsets in the file
    std::size_t end;
};

/// The directives that conditions depend on; all others are skipped.
enum class DirectiveKind : std::uint8_t {
    If,
    Ifdef,
    Ifndef,
    Elif,
    Elifdef,
    Elifndef,
    Else,
    Endif,
    Define,
    Undef,
    Include, ///< and import declarations
    Pragma,  ///< and lines of code with a pragma operator
};

/// A directive and its tokens.  Valid until the next one is read.
struct Directive {
    DirectiveKind kind;
    bool hasComment;    ///< between the keyword and the last token
    std::uint64_t line; ///< from 1
    std::size_t begin;  ///< byte offsets: of the #, of the keyword, after the keyword, after the last token
    std::size_t keyword;
    std::size_t keywordEnd;
    std::size_t end;
    std::span<const DirectiveToken> tokens; ///< after the keyword; of code from the pragma operator on
};

/// A comment, in bytes.
struct CommentPlace {
    std::size_t begin;
    std::size_t end;
};

/// Reads the directives of a text one by one, as a C preprocessor finds them: after line splices and comments, not in
/// comments, string literals, character constants and raw strings.  Blanks between a backslash and the end of its line
/// are ignored.  Trigraphs are not replaced.  An `import` at the beginning of a line is an inclusion.  A literal that
/// does not end on its line ends with it, as in prose that is left out; a raw string without an end is an ordinary
/// string.
///
/// Code is searched for possible pragma operators: _Pragma, __pragma, and names in arguments of macros that make one.
///
/// Linear in the text, which may be any bytes and outlives the reader.
class VTSYM_API DirectiveReader {
public:
    explicit DirectiveReader(std::string_view text);

    /// Appends the comments that are passed from now on, in order, to a list that outlives the reader.
    void noteComments(std::vector<CommentPlace>* comments) noexcept { comments_ = comments; }

    /// Reads the next directive of the kinds above; false at the end.  Tokens are valid until the next call.
    bool next(Directive& directive);

private:
    [[nodiscard]] std::string_view text() const noexcept { return source_.text(); }

    [[nodiscard]] char at(std::size_t place) const { return source_.at(place); }

    std::size_t passComment(std::size_t place);
    [[nodiscard]] std::size_t afterRawString(std::size_t quote);
    bool skipBlanks();
    std::size_t skipLine();
    bool skipImport();
    bool readCode(Directive& directive);
    void readTokens(Directive& directive, bool blank);
    std::string_view readRun(bool number);
    bool readToken(bool afterBlank, bool mayBeHeader, DirectiveToken& token);
    bool readDirective(Directive& directive);
    std::uint64_t lineOf(std::size_t place);

    SourceText source_;
    std::size_t place_ = 0;
    std::size_t counted_ = 0; ///< up to where lines were counted
    std::uint64_t line_ = 1;
    bool commentPassed_ = false;
    unsigned endlessRawStrings_ = 0;
    std::vector<CommentPlace>* comments_ = nullptr;
    std::vector<DirectiveToken> tokens_;
    std::deque<std::string> joined_; ///< tokens with splices inside
};

} // namespace VT
