// Expressions from prefix text, for tables of cases.
#pragma once

#include "tests/support/generators/AnyNode.hpp"

#include <algorithm>
#include <cstdlib>
#include <stdexcept>

namespace VT::Testing {

/// Takes what is in quotes, or what is before a bracket or a comma.
inline std::string takeWord(std::string_view& rest) {
    const bool isQuoted = rest.starts_with('"');
    rest.remove_prefix(isQuoted ? 1 : 0);
    const std::string word(rest.substr(0, rest.find_first_of(isQuoted ? "\"" : "(,)")));
    rest.remove_prefix(word.size() + (isQuoted ? 1 : 0));
    return word;
}

inline SymbolicExprId takeTree(SymbolicExprTable& table, std::string_view& rest) { // NOLINT(misc-no-recursion)
    const Trees tree{table};
    const bool isQuoted = rest.starts_with('"');
    const std::string word = takeWord(rest);
    if (isQuoted || !rest.starts_with('(')) {
        char* end = nullptr;
        const double number = std::strtod(word.c_str(), &end);
        if (isQuoted || end == word.c_str() || (*end != '\0' && std::string_view(end) != "r"))
            return word == "invalid" ? invalidId : tree.name(word);
        return *end == 'r' ? tree.real(number) : tree.integer(static_cast<int>(number));
    }
    const auto* const row = std::ranges::find(operatorTable(), word, &OperatorInfo::name);
    if (row == std::ranges::end(operatorTable()))
        throw std::runtime_error("no operator " + word);
    NodeParts parts;
    do {
        rest.remove_prefix(1);
        if (row->op == SymbolicOp::MemberValue && !parts.inputs.empty())
            parts.text = takeWord(rest);
        else if (!rest.starts_with(')'))
            parts.inputs.push_back(takeTree(table, rest));
    } while (rest.starts_with(','));
    rest.remove_prefix(1);
    return makeAny(table, row->op, parts);
}

/// Reads what treeText writes; what stands in quotes is a name.  Recurses; for small expressions only.
inline SymbolicExprId readTree(SymbolicExprTable& table, std::string_view text) {
    const SymbolicExprId id = takeTree(table, text);
    if (!text.empty())
        throw std::runtime_error("more than a tree");
    return id;
}

} // namespace VT::Testing
