// Expressions from prefix text, for tables of cases.
#pragma once

#include "tests/support/AnyNode.hpp"

#include <algorithm>
#include <cstdlib>
#include <stdexcept>

namespace VT::Testing {

/// Reads what treeText writes; what stands in quotes is a name.  Recurses; for small expressions only.
class TreeReader {
public:
    TreeReader(SymbolicExprTable& table, const std::string& text) : make_{table}, rest_(text) {}

    SymbolicExprId operator()() { // NOLINT(misc-no-recursion)
        const bool isQuoted = rest_.starts_with('"');
        const std::string text = word();
        if (rest_.starts_with('(') && !isQuoted)
            return compound(text);
        char* end = nullptr;
        const double number = std::strtod(text.c_str(), &end);
        if (isQuoted || text.empty() || (*end != '\0' && std::string_view(end) != "r") || end == text.c_str())
            return text == "invalid" ? invalidId : make_.name(text);
        return *end == 'r' ? make_.real(number) : make_.integer(static_cast<int>(number));
    }

private:
    /// Up to a bracket, a comma or the closing quote.
    std::string word() {
        const std::size_t quotes = rest_.starts_with('"') ? 1 : 0;
        const std::size_t end = std::min(rest_.find_first_of(quotes != 0 ? "\"" : "(,)", quotes), rest_.size());
        std::string text(rest_.substr(quotes, end - quotes));
        rest_.erase(0, end + quotes);
        return text;
    }

    SymbolicExprId compound(const std::string& name) { // NOLINT(misc-no-recursion)
        const auto* const row = std::ranges::find(operatorTable(), name, &OperatorInfo::name);
        if (row == std::ranges::end(operatorTable()))
            throw std::runtime_error("no operator " + name);
        NodeParts parts;
        while (!rest_.starts_with(')') && !rest_.empty()) {
            rest_.erase(0, 1);
            if (row->op == SymbolicOp::MemberValue && !parts.inputs.empty())
                parts.text = word();
            else if (!rest_.starts_with(')'))
                parts.inputs.push_back((*this)());
        }
        rest_.erase(0, 1);
        return makeAny(make_.table, row->op, parts);
    }

    Trees make_;
    std::string rest_;
};

inline SymbolicExprId readTree(SymbolicExprTable& table, const std::string& text) {
    return TreeReader(table, text)();
}

} // namespace VT::Testing
