// The dimension expressions of blocks under identifiers of their own.
//
// Method: the identifier is an injective encoding of the simplified expression's C text; where that is too long for a C
// compiler, a hash of the text replaces its end, and a text that meets another one under its hash takes the next
// number.
// Cost: linear in the size of the expression; look-ups O(1) on average.
#include "base/service/SymbolRegistry.hpp"

#include "base/core/Limits.hpp"
#include "base/service/AliasText.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>
#include <cstdint>

namespace VT {

namespace {

constexpr std::string_view hexDigits = "0123456789abcdef";

bool isLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

bool isLetterOrDigit(char c) {
    return isLetter(c) || (c >= '0' && c <= '9');
}

/// Whether a text is an identifier that no other text is encoded as.
bool isOwnIdentifier(const std::string& text) {
    return text.size() <= limits::identifierLength && !text.empty() && isLetter(text.front()) &&
           std::ranges::all_of(text, [](char c) { return isLetterOrDigit(c) || c == '_'; }) &&
           !text.starts_with("dim_") && !text.starts_with("dimx_");
}

/// Encodes a text as letters, digits and _, from which it could be decoded.
std::string encoded(const std::string& text) {
    std::string code;
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        if (isLetterOrDigit(c))
            code += c;
        else if (c == '_')
            code += "__";
        else
            code.append({'_', hexDigits[byte >> 4U], hexDigits[byte & 15U]});
    }
    return code;
}

std::string sixteenDigits(std::uint64_t number) {
    std::string digits(16, '0');
    for (std::size_t i = digits.size(); i > 0; --i, number >>= 4U)
        digits[i - 1] = hexDigits[number & 15U];
    return digits;
}

} // namespace

SymbolRegistry::SymbolRegistry(SymbolicExprTable& table) : table_(table), simplifier_(table), printer_(table, false) {}

std::string SymbolRegistry::identifierOf(const std::string& text) const {
    if (isOwnIdentifier(text))
        return text;
    const std::string code = encoded(text);
    std::string identifier = "dim_" + code;
    if (identifier.size() <= limits::identifierLength)
        return identifier;
    // Two long texts with one number are as good as impossible, but the second would get another expression's
    // identifier.
    for (std::uint64_t number = hashBytes(0, text);; ++number) {
        const std::string digits = sixteenDigits(number);
        identifier = "dimx_" + code.substr(0, limits::identifierLength - 6 - digits.size()) + '_' + digits;
        const auto taken = entries_.find(identifier);
        if (taken == entries_.end() || taken->second.text == text)
            return identifier;
    }
}

std::string SymbolRegistry::registerExpression(const VTBlock* block, SymbolicExprId expression) {
    if (table_.get(expression) == nullptr)
        return {};
    std::uint64_t passes = 0;
    const SymbolicExprId simplified = simplifier_.simplify(expression, passes);
    const std::string text = printer_(simplified);
    std::string identifier = identifierOf(text);
    entries_.try_emplace(identifier, Entry{text, simplified});
    if (identifier != text)
        table_.insertAliasInfo(identifier, table_.get(simplified)->isTermExpr() ? aliasText(text) : '(' + text + ')');
    Registered& registered = blocks_[block];
    if (const auto [place, isNew] = registered.all.insert(identifier); isNew) {
        try {
            registered.inOrder.push_back(identifier);
        } catch (...) {
            registered.all.erase(place);
            throw;
        }
    }
    return identifier;
}

std::vector<std::string> SymbolRegistry::registeredBy(const VTBlock* block) const {
    const auto known = blocks_.find(block);
    return known == blocks_.end() ? std::vector<std::string>() : known->second.inOrder;
}

void SymbolRegistry::forgetBlock(const VTBlock* block) {
    blocks_.erase(block);
}

SymbolicExprId SymbolRegistry::expressionOf(const std::string& identifier) const {
    const auto known = entries_.find(identifier);
    return known == entries_.end() ? invalidId : known->second.expression;
}

void SymbolRegistry::insertAlias(const std::string& identifier, const std::string& alias) {
    table_.insertAliasInfo(identifier, aliasText(alias));
}

std::string SymbolRegistry::aliasOf(const std::string& identifier) const {
    return table_.getAliasForSymbolicIdentifier(identifier);
}

} // namespace VT
