// Writes shortened conditions in the words of their author: parts are looked up by node among the spellings of the
// condition, and && and || between them are written with an explicit stack.  Linear in the shorter condition, times the
// spellings.
#include "base/scan/report/ConditionProposal.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Whether `!` before a text would negate a part of it alone.
bool needsBrackets(std::string_view text) {
    std::size_t depth = 0;
    for (const char c : text) {
        depth += c == '(' ? 1U : 0U;
        depth -= c == ')' && depth > 0 ? 1U : 0U;
        if (depth == 0 && std::string_view("=<>&|+-*/%^?! ").find(c) != std::string_view::npos)
            return true;
    }
    return false;
}

} // namespace

std::optional<std::string> partText(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                    const std::vector<PartSpelling>& spellings, std::span<const DirectiveToken> tokens,
                                    SymbolicExprId part) {
    const auto spelling = std::ranges::find(spellings, part, &PartSpelling::part);
    if (spelling != spellings.end())
        return spelledTokens(tokens.subspan(spelling->first, spelling->last - spelling->first + 1));
    const SymbolicExpr& node = *table.get(part);
    if (!comparisonOps.contains(node.op()))
        return std::nullopt;
    const MacroUnknown* const unknown = unknowns.find(node.getInput(0));
    const SymbolicExpr* const literal = table.get(node.getInput(1));
    if (unknown == nullptr || literal->op() != SymbolicOp::IntValue)
        return std::nullopt;
    const int value = static_cast<const SymbolicIntValue*>(literal)->getValue();
    const bool ofTwo = unknown->kind == MacroUnknown::Kind::Comparison;
    if (unknown->kind == MacroUnknown::Kind::Defined || (ofTwo && value != 0))
        return std::nullopt;
    std::string text = unknown->left;
    text.append(" ").append(operatorInfo(node.op()).c).append(" ");
    return text.append(ofTwo ? unknown->right : std::to_string(value));
}

std::string negatedText(const std::string& text) {
    return needsBrackets(text) ? "!(" + text + ")" : "!" + text;
}

std::optional<std::string> chainText(const SymbolicExprTable& table, SymbolicExprId condition, ChainStyle style,
                                     const PartText& textOf) {
    struct Piece {
        SymbolicExprId id; ///< invalid for a text
        SymbolicOp around;
        const char* text;
        bool isNegated = false;
    };

    std::string result;
    std::vector<Piece> pieces{{condition, SymbolicOp::None, ""}};
    while (!pieces.empty()) {
        Piece piece = pieces.back();
        pieces.pop_back();
        if (piece.id == invalidId) {
            result.append(piece.text);
            continue;
        }
        for (; style.withoutNots && table.get(piece.id)->op() == SymbolicOp::Not; piece.isNegated = !piece.isNegated)
            piece.id = table.get(piece.id)->getInput(0);
        const SymbolicExpr& node = *table.get(piece.id);
        if (node.op() != SymbolicOp::And && node.op() != SymbolicOp::Or) {
            const auto text = textOf(piece.id, piece.isNegated);
            if (!text)
                return std::nullopt;
            result.append(*text);
            continue;
        }
        const bool isAnd = (node.op() == SymbolicOp::And) != piece.isNegated;
        const SymbolicOp op = isAnd ? SymbolicOp::And : SymbolicOp::Or;
        const bool brackets =
            (isAnd && piece.around == SymbolicOp::Or && style.bracketed) || (!isAnd && piece.around == SymbolicOp::And);
        if (brackets)
            pieces.push_back({invalidId, SymbolicOp::None, ")"});
        pieces.push_back({node.getInput(1), op, "", piece.isNegated});
        pieces.push_back({invalidId, SymbolicOp::None, isAnd ? " && " : " || "});
        pieces.push_back({node.getInput(0), op, "", piece.isNegated});
        if (brackets)
            pieces.push_back({invalidId, SymbolicOp::None, "("});
    }
    return result;
}

std::optional<std::string> proposalText(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                        const DirectiveCondition& condition, std::span<const DirectiveToken> tokens,
                                        SymbolicExprId proposal) {
    return chainText(table, proposal, {.bracketed = condition.bracketed}, [&](SymbolicExprId part, bool) {
        return partText(table, unknowns, condition.spellings, tokens, part);
    });
}

} // namespace VT
