// Escapes the bytes of paths in URIs, and reads them back (RFC 8089, RFC 3986).
#include "tools/vtsym/io/Uris.hpp"

namespace vtsym {

namespace {

/// The value of a hexadecimal digit; 16 for another character.
unsigned digitOf(char c) {
    if (c >= '0' && c <= '9')
        return static_cast<unsigned>(c - '0');
    const char lower = static_cast<char>(c | 0x20);
    return lower >= 'a' && lower <= 'f' ? static_cast<unsigned>(lower - 'a') + 10 : 16;
}

} // namespace

std::string uriOf(std::string_view path) {
    static constexpr char digits[] = "0123456789ABCDEF";
    static constexpr std::string_view plain = "-._~/!$&'()*+,;=@";
    std::string uri = path.starts_with('/') ? "file://" : "";
    for (const char c : path) {
        const auto byte = static_cast<unsigned char>(c);
        const bool isPlain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') ||
                             plain.find(c) != std::string_view::npos;
        if (isPlain)
            uri.push_back(c);
        else
            uri.append("%").append({digits[byte >> 4U], digits[byte & 15U]});
    }
    return uri;
}

std::optional<std::string> pathOf(std::string_view uri) {
    for (const std::string_view prefix : {"file://localhost/", "file:///", "file:/"}) {
        if (!uri.starts_with(prefix))
            continue;
        uri.remove_prefix(prefix.size() - 1);
        if (uri.starts_with("//"))
            return std::nullopt; // another host
        std::string path;
        for (std::size_t i = 0; i < uri.size(); ++i) {
            if (uri[i] != '%') {
                path.push_back(uri[i]);
                continue;
            }
            const unsigned high = i + 2 < uri.size() ? digitOf(uri[i + 1]) : 16;
            const unsigned low = i + 2 < uri.size() ? digitOf(uri[i + 2]) : 16;
            if (high > 15 || low > 15 || high + low == 0)
                return std::nullopt;
            path.push_back(static_cast<char>(high * 16 + low));
            i += 2;
        }
        return path;
    }
    return std::nullopt;
}

} // namespace vtsym
