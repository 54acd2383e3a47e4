// Finds the directives of a C or C++ file.
//
// Method: the translation phases of the C standard that matter for directives, in one pass: splices, comments and
// literals are skipped in place, by a table that classifies bytes.  Only directives become tokens; of code, only names
// that hint at a pragma operator.
// Cost: linear in the text.  A raw string without an end costs a search to the end of the file, so their number is
// bounded (limits::endlessRawStrings).  Tokens are views of the text, but for those with a splice inside.
#include "base/scan/DirectiveReader.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <array>
#include <utility>

namespace VT {

namespace {

enum class Class : std::uint8_t { Plain, Name, Digit, Blank, NewLine, Slash, Quote, Backslash };

constexpr std::array<Class, 256> classes = [] {
    std::array<Class, 256> table{};
    for (unsigned c = 0; c < 256; ++c) {
        if ((c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == '$' || c >= 0x80)
            table[c] = Class::Name;
        else if (c >= '0' && c <= '9')
            table[c] = Class::Digit;
    }
    for (const unsigned char c : {' ', '\t', '\v', '\f', '\r', '\0'})
        table[c] = Class::Blank;
    table['\n'] = Class::NewLine;
    table['/'] = Class::Slash;
    table['"'] = table['\''] = Class::Quote;
    table['\\'] = Class::Backslash;
    return table;
}();

Class classOf(char c) {
    return classes[static_cast<unsigned char>(c)];
}

bool isOfName(char c) {
    return classOf(c) == Class::Name || classOf(c) == Class::Digit;
}

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

/// Names in code that hint at a pragma operator: a macro may make one from arguments with any of the others.
bool hintsAtPragma(std::string_view name) {
    return name == "_Pragma" || name == "__pragma" || name == "pop_macro" || name == "GCC" || name == "clang";
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

DirectiveReader::DirectiveReader(std::string_view text) : text_(text) {
    if (text_.starts_with("\xEF\xBB\xBF"))
        place_ = 3;
}

std::size_t DirectiveReader::afterSplices(std::size_t place) const {
    while (at(place) == '\\') {
        std::size_t end = place + 1;
        while (end < text_.size() && classOf(text_[end]) == Class::Blank)
            ++end;
        if (at(end) != '\n')
            break;
        place = end + 1;
    }
    return place;
}

bool DirectiveReader::beginsComment(std::size_t place) const {
    if (at(place) != '/')
        return false;
    const char next = at(afterSplices(place + 1));
    return next == '/' || next == '*';
}

std::size_t DirectiveReader::afterComment(std::size_t place) const {
    place = afterSplices(place + 1);
    if (at(place++) == '*') {
        while ((place = text_.find('*', place)) != std::string_view::npos) {
            const std::size_t next = afterSplices(++place);
            if (at(next) == '/')
                return next + 1;
        }
        return text_.size();
    }
    while ((place = text_.find('\n', place)) != std::string_view::npos) {
        std::size_t last = place;
        while (last > 0 && text_[last - 1] != '\n' && classOf(text_[last - 1]) == Class::Blank)
            --last;
        if (last == 0 || text_[last - 1] != '\\')
            return place;
        ++place;
    }
    return text_.size();
}

/// Returns the place after a comment, and notes it, once.
std::size_t DirectiveReader::passComment(std::size_t place) {
    const std::size_t end = afterComment(place);
    if (comments_ != nullptr && (comments_->empty() || comments_->back().begin < place))
        comments_->push_back({place, end});
    return end;
}

/// Returns the place after a literal; the end of its line for a literal without an end.
std::size_t DirectiveReader::afterQuoted(std::size_t place) const {
    const char quote = text_[place++];
    while (place < text_.size() && text_[place] != quote && text_[place] != '\n') {
        if (text_[place] != '\\') {
            ++place;
            continue;
        }
        const std::size_t next = afterSplices(place);
        place = next != place ? next : afterSplices(place + 1) + 1; // a splice, or an escaped character
    }
    return at(place) == quote ? place + 1 : std::min(place, text_.size());
}

/// Returns the place after a header's name in angle brackets; its beginning where it does not end on its line.
std::size_t DirectiveReader::afterHeaderName(std::size_t place) const {
    for (std::size_t at = place; at < text_.size() && text_[at] != '\n'; at = std::max(at + 1, afterSplices(at)))
        if (text_[at] == '>')
            return at + 1;
    return place;
}

/// Returns the place after the raw string with this quote; the quote itself where it is not a raw string.
std::size_t DirectiveReader::afterRawString(std::size_t quote) {
    if (endlessRawStrings_ == limits::endlessRawStrings)
        return quote;
    const std::size_t open = text_.substr(0, quote + 2 + rawDelimiterLength).find('(', quote + 1);
    if (open == std::string_view::npos)
        return quote;
    const std::string_view delimiter = text_.substr(quote + 1, open - quote - 1);
    if (delimiter.find_first_of(" \t\v\f\r\n\\)\"") != std::string_view::npos)
        return quote;
    std::string end(1, ')');
    end.append(delimiter).push_back('"');
    const std::size_t close = text_.find(end, open);
    endlessRawStrings_ += close == std::string_view::npos ? 1U : 0U;
    return close == std::string_view::npos ? quote : close + end.size();
}

/// Skips blanks, comments and splices; returns whether there were any.
bool DirectiveReader::skipBlanks() {
    const std::size_t before = place_;
    while (place_ < text_.size()) {
        const Class kind = classOf(text_[place_]);
        const std::size_t next = kind == Class::Blank                            ? place_ + 1
                                 : kind == Class::Backslash                      ? afterSplices(place_)
                                 : kind == Class::Slash && beginsComment(place_) ? passComment(place_)
                                                                                 : place_;
        if (next == place_)
            break;
        commentPassed_ = commentPassed_ || kind == Class::Slash;
        place_ = next;
    }
    return place_ != before;
}

/// Skips the rest of a logical line; returns the place of the first name in it that hints at a pragma operator, or
/// npos.
std::size_t DirectiveReader::skipLine() {
    std::size_t pragma = std::string_view::npos;
    while (place_ < text_.size()) {
        switch (classOf(text_[place_])) {
        case Class::NewLine:
            ++place_;
            return pragma;
        case Class::Name:
        case Class::Digit: {
            const bool number = classOf(text_[place_]) == Class::Digit;
            const std::size_t begin = place_++;
            while (place_ < text_.size() &&
                   (isOfName(text_[place_]) || (number && text_[place_] == '\'' && isOfName(at(place_ + 1)))))
                ++place_;
            std::string_view name = text_.substr(begin, place_ - begin);
            if (afterSplices(place_) != place_) {
                place_ = begin;
                name = readRun(number);
            }
            if (at(place_) == '"' && isRawPrefix(name))
                place_ = afterRawString(place_);
            if (pragma == std::string_view::npos && hintsAtPragma(name))
                pragma = begin;
            break;
        }
        case Class::Slash:
            place_ = beginsComment(place_) ? passComment(place_) : place_ + 1;
            break;
        case Class::Quote:
            place_ = afterQuoted(place_);
            break;
        case Class::Backslash:
            place_ = std::max(place_ + 1, afterSplices(place_));
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
        while (place_ < text_.size()) {
            const char c = text_[place_];
            const char before = place_ == begin ? '\0' : text_[place_ - 1];
            const bool sign = (c == '+' || c == '-') && std::string_view("eEpP").find(before) != std::string_view::npos;
            if (!isOfName(c) &&
                !(number && (c == '.' || (sign && before != '\0') || (c == '\'' && isOfName(at(place_ + 1))))))
                break;
            ++place_;
        }
        const std::size_t next = afterSplices(place_);
        if (next == place_ || !isOfName(at(next)))
            break;
        if (joined == nullptr)
            joined = &joined_.emplace_back();
        joined->append(text_.substr(begin, place_ - begin));
        begin = place_ = next;
    }
    const std::string_view last = text_.substr(begin, place_ - begin);
    return joined == nullptr ? last : std::string_view(joined->append(last));
}

/// Reads a token of the line; false at its end.
bool DirectiveReader::readToken(bool afterBlank, bool mayBeHeader, DirectiveToken& token) {
    if (place_ >= text_.size() || text_[place_] == '\n')
        return false;
    const std::size_t begin = place_;
    const char c = text_[begin];
    token = {DirectiveTokenKind::Other, afterBlank, {}, begin, begin};
    const std::size_t next = afterSplices(begin + 1);
    if (const std::size_t header = mayBeHeader && c == '<' ? afterHeaderName(begin) : begin; header != begin) {
        token.kind = DirectiveTokenKind::String;
        token.text = text_.substr(begin, header - begin);
        place_ = header;
    } else if (classOf(c) == Class::Digit || (c == '.' && classOf(at(next)) == Class::Digit)) {
        token.kind = DirectiveTokenKind::Number;
        token.text = readRun(true);
    } else if (classOf(c) == Class::Name) {
        token.kind = DirectiveTokenKind::Name;
        token.text = readRun(false);
        const bool raw = at(place_) == '"' && isRawPrefix(token.text);
        const std::size_t end = raw ? afterRawString(place_) : place_;
        const bool prefix = token.text == "L" || token.text == "u" || token.text == "U" || token.text == "u8";
        if (raw && end != place_)
            token.kind = DirectiveTokenKind::String;
        else if (prefix && classOf(at(place_)) == Class::Quote)
            token.kind = at(place_) == '"' ? DirectiveTokenKind::String : DirectiveTokenKind::Other;
        if (token.kind != DirectiveTokenKind::Name) {
            place_ = raw ? end : afterQuoted(place_);
            token.text = text_.substr(begin, place_ - begin);
        }
    } else if (classOf(c) == Class::Quote) {
        token.kind = c == '"' ? DirectiveTokenKind::String : DirectiveTokenKind::Character;
        place_ = afterQuoted(begin);
        token.text = text_.substr(begin, place_ - begin);
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
            token.text = text_.substr(begin, 1);
        }
    }
    token.end = place_;
    return true;
}

std::uint64_t DirectiveReader::lineOf(std::size_t place) {
    line_ += static_cast<std::uint64_t>(std::count(text_.begin() + static_cast<std::ptrdiff_t>(counted_),
                                                   text_.begin() + static_cast<std::ptrdiff_t>(place), '\n'));
    counted_ = place;
    return line_;
}

/// Reads a directive after its #; false for a kind that is ignored.
bool DirectiveReader::readDirective(Directive& directive) {
    directive.line = lineOf(directive.begin);
    skipBlanks();
    directive.keyword = place_;
    if (classOf(at(place_)) != Class::Name || place_ >= text_.size())
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
            place_ = afterHeaderName(place_);
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
        const std::string_view word = classOf(at(place_)) == Class::Name ? readRun(false) : std::string_view();
        skipBlanks();
        return word;
    };
    if (at(place_) == '@') // of a module
        ++place_;
    std::string_view word = nextWord();
    if (word == "export")
        word = nextWord();
    const char next = at(place_);
    if (word == "import" && (next == '<' || next == '"' || classOf(next) == Class::Name)) {
        if (next == '<')
            place_ = afterHeaderName(place_);
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
    while (place_ < text_.size()) {
        skipBlanks();
        tokens_.clear();
        joined_.clear();
        directive = {};
        directive.begin = place_;
        const bool digraph = at(place_) == '%' && at(afterSplices(place_ + 1)) == ':';
        if (at(place_) != '#' && !digraph) {
            if (readCode(directive))
                return true;
            continue;
        }
        place_ = digraph ? afterSplices(place_ + 1) + 1 : place_ + 1;
        if (readDirective(directive))
            return true;
        skipLine();
    }
    return false;
}

} // namespace VT
