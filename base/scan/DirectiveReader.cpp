// Finds the directives of a C or C++ file.
//
// Method: the translation phases of the C standard that matter for directives, in one pass: splices, comments and
// literals are skipped in place, by a table that classifies bytes.  Only directives become tokens; of code, only names
// that hint at a pragma operator.
// Cost: linear in the text.  A raw string without an end costs a search to the end of the file, so their number is
// bounded (limits::endlessRawStrings).  Tokens are views of the text, but for those with a splice inside.
#include "base/scan/DirectiveReader.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/text/CodeLines.hpp"

#include <algorithm>
#include <array>
#include <utility>

namespace VT {

namespace {

bool isRawPrefix(std::string_view name) {
    return name == "R" || name == "LR" || name == "uR" || name == "UR" || name == "u8R";
}

constexpr std::size_t rawDelimiterLength = 16;

constexpr auto keywords = std::to_array<std::pair<std::string_view, DirectiveKind>>({
    {"if", DirectiveKind::If},
    {"ifdef", DirectiveKind::Ifdef},
    {"ifndef", DirectiveKind::Ifndef},
    {"elif", DirectiveKind::Elif},
    {"elifdef", DirectiveKind::Elifdef},
    {"elifndef", DirectiveKind::Elifndef},
    {"else", DirectiveKind::Else},
    {"endif", DirectiveKind::Endif},
    {"define", DirectiveKind::Define},
    {"undef", DirectiveKind::Undef},
    {"include", DirectiveKind::Include},
    {"include_next", DirectiveKind::Include},
    {"import", DirectiveKind::Include},
    {"pragma", DirectiveKind::Pragma},
});

constexpr auto longOperators =
    std::to_array<std::string_view>({"&&", "||", "==", "!=", "<=", ">=", "<<", ">>", "##", "->"});
constexpr std::string_view shortOperators = "()!~+-*/%<>&^|?:,=#.;[]{}";

bool hintsAtPragma(std::string_view name) {
    return std::ranges::find(pragmaHints, name) != std::end(pragmaHints);
}

bool takesHeaderName(std::string_view name) {
    return name == "__has_include" || name == "__has_include_next" || name == "__has_embed";
}

} // namespace

bool hasManyReadings(std::string_view text) {
    for (std::size_t at = 0; (at = text.find("?\?", at)) != std::string_view::npos; ++at)
        if (at + 2 < text.size() && std::string_view("=/'").find(text[at + 2]) != std::string_view::npos)
            return true;
    for (std::size_t at = 0; (at = text.find('\r', at)) != std::string_view::npos;) {
        at = text.find_first_not_of('\r', at);
        if (at == std::string_view::npos || text[at] != '\n')
            return at != std::string_view::npos;
    }
    return false;
}

DirectiveReader::DirectiveReader(std::string_view text) : source_(text) {
    if (text.starts_with("\xEF\xBB\xBF"))
        place_ = 3;
}

/// Returns the place after a comment, and notes it, once.
std::size_t DirectiveReader::passComment(std::size_t place) {
    const std::size_t end = source_.afterComment(place);
    if (comments_ != nullptr && (comments_->empty() || comments_->back().begin < place))
        comments_->push_back({place, end});
    return end;
}

/// Returns the place after the raw string with this quote; the quote itself where it is not a raw string.
std::size_t DirectiveReader::afterRawString(std::size_t quote) {
    if (endlessRawStrings_ == limits::endlessRawStrings)
        return quote;
    const std::size_t open = text().substr(0, quote + 2 + rawDelimiterLength).find('(', quote + 1);
    if (open == std::string_view::npos)
        return quote;
    const std::string_view delimiter = text().substr(quote + 1, open - quote - 1);
    if (delimiter.find_first_of(" \t\v\f\r\n\\)\"") != std::string_view::npos)
        return quote;
    std::string end(1, ')');
    end.append(delimiter).push_back('"');
    const std::size_t close = text().find(end, open);
    endlessRawStrings_ += close == std::string_view::npos ? 1U : 0U;
    return close == std::string_view::npos ? quote : close + end.size();
}

/// Skips blanks, comments and splices; returns whether there were any.
bool DirectiveReader::skipBlanks() {
    const std::size_t before = place_;
    while (place_ < text().size()) {
        const SourceByte kind = byteClass(text()[place_]);
        const std::size_t next = kind == SourceByte::Blank       ? place_ + 1
                                 : kind == SourceByte::Backslash ? source_.afterSplices(place_)
                                 : kind == SourceByte::Slash && source_.beginsComment(place_) ? passComment(place_)
                                                                                              : place_;
        if (next == place_)
            break;
        commentPassed_ = commentPassed_ || kind == SourceByte::Slash;
        place_ = next;
    }
    return place_ != before;
}

/// Skips the rest of a logical line; returns the place of the first name in it that hints at a pragma operator, or
/// npos.
std::size_t DirectiveReader::skipLine() {
    std::size_t pragma = std::string_view::npos;
    while (place_ < text().size()) {
        switch (byteClass(text()[place_])) {
        case SourceByte::NewLine:
            ++place_;
            return pragma;
        case SourceByte::Name:
        case SourceByte::Digit: {
            const bool number = byteClass(text()[place_]) == SourceByte::Digit;
            const std::size_t begin = place_++;
            while (place_ < text().size() &&
                   (isOfName(text()[place_]) || (number && text()[place_] == '\'' && isOfName(at(place_ + 1)))))
                ++place_;
            std::string_view name = text().substr(begin, place_ - begin);
            if (source_.afterSplices(place_) != place_) {
                place_ = begin;
                name = readRun(number);
            }
            if (at(place_) == '"' && isRawPrefix(name))
                place_ = afterRawString(place_);
            if (pragma == std::string_view::npos && hintsAtPragma(name))
                pragma = begin;
            break;
        }
        case SourceByte::Slash:
            place_ = source_.beginsComment(place_) ? passComment(place_) : place_ + 1;
            break;
        case SourceByte::Quote:
            place_ = source_.afterQuoted(place_);
            break;
        case SourceByte::Backslash:
            place_ = std::max(place_ + 1, source_.afterSplices(place_));
            break;
        default:
            ++place_;
        }
    }
    return pragma;
}

/// Reads a name or a preprocessing number; one with splices inside is copied without them.
std::string_view DirectiveReader::readRun(bool number) {
    std::size_t begin = place_;
    std::string* joined = nullptr;
    for (;;) {
        while (place_ < text().size()) {
            const char c = text()[place_];
            const char before = place_ == begin ? '\0' : text()[place_ - 1];
            const bool sign = (c == '+' || c == '-') && std::string_view("eEpP").find(before) != std::string_view::npos;
            if (!isOfName(c) &&
                !(number && (c == '.' || (sign && before != '\0') || (c == '\'' && isOfName(at(place_ + 1))))))
                break;
            ++place_;
        }
        const std::size_t next = source_.afterSplices(place_);
        if (next == place_ || !isOfName(at(next)))
            break;
        if (joined == nullptr)
            joined = &joined_.emplace_back();
        joined->append(text().substr(begin, place_ - begin));
        begin = place_ = next;
    }
    const std::string_view last = text().substr(begin, place_ - begin);
    return joined == nullptr ? last : std::string_view(joined->append(last));
}

/// Reads a token of the line; false at its end.
bool DirectiveReader::readToken(bool afterBlank, bool mayBeHeader, DirectiveToken& token) {
    if (place_ >= text().size() || text()[place_] == '\n')
        return false;
    const std::size_t begin = place_;
    const char c = text()[begin];
    token = {DirectiveTokenKind::Other, afterBlank, {}, begin, begin};
    const std::size_t next = source_.afterSplices(begin + 1);
    if (const std::size_t header = mayBeHeader && c == '<' ? source_.afterHeaderName(begin) : begin; header != begin) {
        token.kind = DirectiveTokenKind::String;
        token.text = text().substr(begin, header - begin);
        place_ = header;
    } else if (byteClass(c) == SourceByte::Digit || (c == '.' && byteClass(at(next)) == SourceByte::Digit)) {
        token.kind = DirectiveTokenKind::Number;
        token.text = readRun(true);
    } else if (byteClass(c) == SourceByte::Name) {
        token.kind = DirectiveTokenKind::Name;
        token.text = readRun(false);
        const bool raw = at(place_) == '"' && isRawPrefix(token.text);
        const std::size_t end = raw ? afterRawString(place_) : place_;
        const bool prefix = token.text == "L" || token.text == "u" || token.text == "U" || token.text == "u8";
        if (raw && end != place_)
            token.kind = DirectiveTokenKind::String;
        else if (prefix && byteClass(at(place_)) == SourceByte::Quote)
            token.kind = at(place_) == '"' ? DirectiveTokenKind::String : DirectiveTokenKind::Other;
        if (token.kind != DirectiveTokenKind::Name) {
            place_ = raw ? end : source_.afterQuoted(place_);
            token.text = text().substr(begin, place_ - begin);
        }
    } else if (byteClass(c) == SourceByte::Quote) {
        token.kind = c == '"' ? DirectiveTokenKind::String : DirectiveTokenKind::Character;
        place_ = source_.afterQuoted(begin);
        token.text = text().substr(begin, place_ - begin);
    } else {
        for (const std::string_view spelling : longOperators) {
            if (spelling[0] == c && spelling[1] == at(next)) {
                token.kind = DirectiveTokenKind::Operator;
                token.text = spelling;
                place_ = next + 1;
            }
        }
        if (token.text.empty()) {
            place_ = begin + 1;
            const std::size_t known = shortOperators.find(c);
            if (known != std::string_view::npos)
                token.kind = DirectiveTokenKind::Operator;
            token.text = text().substr(begin, 1);
        }
    }
    token.end = place_;
    return true;
}

std::uint64_t DirectiveReader::lineOf(std::size_t place) {
    line_ += countLineEnds(text().substr(counted_, place - counted_));
    counted_ = place;
    return line_;
}

/// Reads a directive after its #; false for a kind that is ignored.
bool DirectiveReader::readDirective(Directive& directive) {
    directive.line = lineOf(directive.begin);
    skipBlanks();
    directive.keyword = place_;
    if (byteClass(at(place_)) != SourceByte::Name || place_ >= text().size())
        return false;
    const std::string_view word = readRun(false);
    const auto* const known =
        std::ranges::find(keywords, word, [](const auto& each) -> std::string_view { return each.first; });
    if (known == keywords.end())
        return false;
    directive.kind = known->second;
    directive.keywordEnd = directive.end = place_;
    commentPassed_ = false;
    bool blank = skipBlanks();
    if (directive.kind == DirectiveKind::Include) { // a header's name is not a token: <sys//types.h>
        if (at(place_) == '<')
            place_ = source_.afterHeaderName(place_);
        skipLine();
        return true;
    }
    readTokens(directive, blank);
    return true;
}

/// Reads the tokens up to the end of the line.
void DirectiveReader::readTokens(Directive& directive, bool blank) {
    const bool isCondition = directive.kind == DirectiveKind::If || directive.kind == DirectiveKind::Elif;
    DirectiveToken token{};
    bool mayBeHeader = false;
    while (readToken(blank, mayBeHeader, token)) {
        directive.end = token.end;
        directive.hasComment = commentPassed_; // up to this token
        tokens_.push_back(token);
        mayBeHeader = isCondition && ((mayBeHeader && token.text == "(") || takesHeaderName(token.text));
        blank = skipBlanks();
    }
    directive.tokens = tokens_;
}

/// Skips the beginning of an import declaration, `import <a.h>`, if there is one; returns whether there was.
bool DirectiveReader::skipImport() {
    const std::size_t begin = place_;
    const auto nextWord = [&] {
        const std::string_view word = byteClass(at(place_)) == SourceByte::Name ? readRun(false) : std::string_view();
        skipBlanks();
        return word;
    };
    if (at(place_) == '@') // of a module
        ++place_;
    std::string_view word = nextWord();
    if (word == "export")
        word = nextWord();
    const char next = at(place_);
    if (word == "import" && (next == '<' || next == '"' || byteClass(next) == SourceByte::Name)) {
        if (next == '<')
            place_ = source_.afterHeaderName(place_);
        return true;
    }
    place_ = begin;
    return false;
}

/// Reads a line of code; returns whether it is an import declaration or may hold a pragma operator.
bool DirectiveReader::readCode(Directive& directive) {
    const bool isImport = skipImport();
    const std::size_t pragma = skipLine();
    if (isImport) {
        directive.kind = DirectiveKind::Include;
        return true;
    }
    if (pragma == std::string_view::npos)
        return false;
    directive.kind = DirectiveKind::Pragma;
    place_ = pragma;
    readTokens(directive, false);
    return true;
}

bool DirectiveReader::next(Directive& directive) {
    while (place_ < text().size()) {
        if (comments_ == nullptr && (place_ == 0 || text()[place_ - 1] == '\n'))
            place_ = CodeLines(source_).pass(place_);
        skipBlanks();
        tokens_.clear();
        joined_.clear();
        directive = {};
        directive.begin = place_;
        const bool digraph = at(place_) == '%' && at(source_.afterSplices(place_ + 1)) == ':';
        if (at(place_) != '#' && !digraph) {
            if (readCode(directive))
                return true;
            continue;
        }
        place_ = digraph ? source_.afterSplices(place_ + 1) + 1 : place_ + 1;
        if (readDirective(directive))
            return true;
        skipLine();
    }
    return false;
}

} // namespace VT
