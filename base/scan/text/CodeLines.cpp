// Passes over lines of code.
//
// Method: sixteen bytes at once are compared with everything that may matter.  Comments and literals are skipped where
// they begin.  At anything else the line is left to the reader of directives, from its beginning.
// Cost: three instructions a byte between comments and literals.
#include "base/scan/text/CodeLines.hpp"

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>

namespace VT {

namespace {

// Sixteen bytes that are compared at once; compilers have vectors of this form on every machine.
using Bytes [[gnu::vector_size(16)]] = unsigned char;

constexpr std::size_t lookAhead = 2; ///< bytes after a place that are compared with it

/// Whether something may begin where three bytes are: code that matters, or a part of each hint and of `import`.  The
/// same for one place, and for sixteen neighbours.
template <class Byte>
auto matters(Byte a, Byte b, Byte c) {
    const auto spliced = b == '\\';
    return (a == '"') | (a == '\'') | (a == '#') | (a == '\\')     //
           | ((a == '/') & ((b == '/') | (b == '*') | spliced))    //
           | ((a == '%') & ((b == ':') | spliced))                 //
           | ((a == 'g') & (b == 'm')) | ((a == 'C') & (b == 'C')) // pragma, GCC
           | ((a == 'p') & (b == '_') & (c == 'm'))                // pop_macro
           | ((a == 'l') & (b == 'a') & (c == 'n'))                // clang
           | ((a == 'm') & (b == 'p') & (c == 'o'));               // import
}

Bytes bytesAt(const char* place) {
    Bytes bytes;
    std::memcpy(&bytes, place, sizeof bytes);
    return bytes;
}

/// Returns the first of sixteen places, which have bytes after them, that matters; 16 for none.
std::size_t firstOf(const char* text) {
    const auto flags = matters(bytesAt(text), bytesAt(text + 1), bytesAt(text + 2));
    std::array<std::uint64_t, 2> words{};
    std::memcpy(words.data(), &flags, sizeof flags);
    if ((words[0] | words[1]) == 0)
        return sizeof(Bytes);
    const std::size_t half = words[0] != 0 ? 0 : 1;
    const int zeros =
        std::endian::native == std::endian::little ? std::countr_zero(words[half]) : std::countl_zero(words[half]);
    return 8 * half + static_cast<std::size_t>(zeros) / 8;
}

/// Whether a name that matters is around a place where three of its bytes are.
bool isWithin(std::string_view text, std::size_t place, std::string_view name, std::size_t offset) {
    return place >= offset && text.substr(place - offset, name.size()) == name;
}

bool isPartOfName(std::string_view text, std::size_t place) {
    switch (text[place]) {
    case 'g':
        return isWithin(text, place, "Pragma", 3) || isWithin(text, place, "pragma", 3);
    case 'p':
        return isWithin(text, place, "pop_macro", 2);
    case 'C':
        return isWithin(text, place, "GCC", 1);
    case 'l':
        return isWithin(text, place, "clang", 1);
    default:
        return isWithin(text, place, "import", 1);
    }
}

} // namespace

bool mayMatter(std::string_view text) {
    const auto at = [&](std::size_t place) {
        return static_cast<unsigned char>(place < text.size() ? text[place] : '\0');
    };
    return matters(at(0), at(1), at(2)) != 0;
}

std::size_t nextThatMayMatter(std::string_view text, std::size_t from) {
    while (text.size() - from >= sizeof(Bytes) + lookAhead) {
        const std::size_t first = firstOf(text.data() + from);
        from += first;
        if (first != sizeof(Bytes))
            return from;
    }
    while (from < text.size() && !mayMatter(text.substr(from)))
        ++from;
    return from;
}

std::size_t CodeLines::pass(std::size_t line) const {
    const std::string_view text = text_.text();
    for (std::size_t place = line;;) {
        const std::size_t next = nextThatMayMatter(text, place);
        const std::size_t newLine = text.substr(place, next - place).rfind('\n');
        line = newLine == std::string_view::npos ? line : place + newLine + 1;
        if (next == text.size())
            return next;
        const char before = next == 0 ? '\0' : text[next - 1];
        switch (text[next]) {
        case '/':
            if (text[next + 1] == '\\')
                return line;
            place = text_.afterComment(next);
            break;
        case '"':  // of a raw string?
        case '\'': // in a number?
            if (text[next] == '"' ? before == 'R' : isOfName(before))
                return line;
            place = text_.afterQuoted(next);
            break;
        case '#':
        case '\\':
        case '%':
            return line;
        default:
            if (isPartOfName(text, next))
                return line;
            place = next + 1;
        }
    }
}

} // namespace VT
