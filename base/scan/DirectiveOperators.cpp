// Reads the operators of directives' conditions, and applies them to operands that were read.  O(1), or the length of a
// text where an operand becomes an unknown.
#include "base/scan/DirectiveOperators.hpp"

#include "base/decide/shorten/ImpliedCondition.hpp"
#include "base/scan/DirectiveCondition.hpp"

#include <algorithm>
#include <array>
#include <limits>
#include <utility>

namespace VT {

namespace {

constexpr auto infixOperators = std::to_array<std::pair<std::string_view, SymbolicOp>>({
    {"&&", SymbolicOp::And},
    {"||", SymbolicOp::Or},
    {"==", SymbolicOp::Equal},
    {"!=", SymbolicOp::NotEqual},
    {">=", SymbolicOp::GreaterThanEqual},
    {"<=", SymbolicOp::LessThanEqual},
    {">", SymbolicOp::GreaterThan},
    {"<", SymbolicOp::LessThan},
    {"+", SymbolicOp::Plus},
    {"-", SymbolicOp::Minus},
    {"*", SymbolicOp::Multiply},
    {"/", SymbolicOp::Divide},
    {"%", SymbolicOp::Modulo},
    {"&", SymbolicOp::BitAnd},
    {"|", SymbolicOp::BitOr},
    {"^", SymbolicOp::BitXOr},
    {"<<", SymbolicOp::ShiftLeft},
    {">>", SymbolicOp::ShiftRight},
    {"and", SymbolicOp::And},
    {"or", SymbolicOp::Or},
    {"not_eq", SymbolicOp::NotEqual},
    {"bitand", SymbolicOp::BitAnd},
    {"bitor", SymbolicOp::BitOr},
    {"xor", SymbolicOp::BitXOr},
});

} // namespace

SymbolicOp infixOf(const DirectiveToken& token) {
    const bool mayBe = token.kind == DirectiveTokenKind::Operator || token.kind == DirectiveTokenKind::Name;
    const auto* const known =
        std::ranges::find(infixOperators, token.text, [](const auto& each) -> std::string_view { return each.first; });
    return mayBe && known != infixOperators.end() ? known->second : SymbolicOp::None;
}

SymbolicOp prefixOf(const DirectiveToken& token) {
    const std::string_view text = token.text;
    return text == "!" || text == "not"     ? SymbolicOp::Not
           : text == "-"                    ? SymbolicOp::UnaryMinus
           : text == "~" || text == "compl" ? SymbolicOp::BitCompl
           : text == "+"                    ? SymbolicOp::Plus
                                            : SymbolicOp::None;
}

DirectiveConditionReader::Operand DirectiveConditionReader::prefixed(const Operation& operation, const Operand& a) {
    const std::uint32_t first = operation.token;
    Operand result{.compound = true, .first = first, .last = a.last, .innerFirst = first, .innerLast = a.last};
    if (a.kind == Operand::Kind::Constant) {
        const auto value =
            operation.op == SymbolicOp::Plus ? std::optional(a.constant) : computeConstant(operation.op, a.constant);
        if (value) {
            result.kind = Operand::Kind::Constant;
            result.constant = *value;
            return result;
        }
    }
    if (operation.op == SymbolicOp::Not)
        return truthOf(SymbolicNotExpr(table_, truth(a)).getId(table_), first, a.last);
    return result;
}

DirectiveConditionReader::Operand DirectiveConditionReader::joined(SymbolicOp op, const Operand& a, const Operand& b) {
    if (op == SymbolicOp::And || op == SymbolicOp::Or) {
        for (const Operand* const each : {&a, &b}) {
            condition_.bracketed = condition_.bracketed || (op == SymbolicOp::Or && each->first != each->innerFirst &&
                                                            each->kind == Operand::Kind::Truth &&
                                                            table_.get(each->truth)->op() == SymbolicOp::And);
        }
        const SymbolicExprId left = truth(a);
        const SymbolicExprId right = truth(b);
        const SymbolicExprId node = op == SymbolicOp::And ? SymbolicAndExpr(table_, left, right).getId(table_)
                                                          : SymbolicOrExpr(table_, left, right).getId(table_);
        return truthOf(node, a.first, b.last);
    }
    Operand result{.compound = true, .first = a.first, .last = b.last, .innerFirst = a.first, .innerLast = b.last};
    if (a.kind == Operand::Kind::Constant && b.kind == Operand::Kind::Constant) {
        if (const auto value = computeConstant(op, a.constant, b.constant)) {
            result.kind = Operand::Kind::Constant;
            result.constant = *value;
        }
        return result;
    }
    if (!comparisonOps.contains(op))
        return result;
    return a.kind == Operand::Kind::Constant ? compared(operatorInfo(op).mirrored, b, a) : compared(op, a, b);
}

DirectiveConditionReader::Operand DirectiveConditionReader::compared(SymbolicOp op, const Operand& a,
                                                                     const Operand& b) {
    using Kind = Operand::Kind;
    if (b.kind != Kind::Constant)
        return difference(op, a, b);
    const std::uint32_t first = std::min(a.first, b.first);
    const std::uint32_t last = std::max(a.last, b.last);
    if (a.kind == Kind::Truth) {
        const bool ofFalse = computeConstant(op, {0, false}, b.constant)->bits != 0;
        const bool ofTrue = computeConstant(op, {1, false}, b.constant)->bits != 0;
        if (ofFalse != ofTrue)
            return truthOf(ofTrue ? a.truth : SymbolicNotExpr(table_, a.truth).getId(table_), first, last);
        Operand constant{.kind = Kind::Constant, .first = first, .last = last, .innerFirst = first, .innerLast = last};
        constant.constant.bits = ofTrue ? 1 : 0;
        return constant;
    }
    const bool ordered = op != SymbolicOp::Equal && op != SymbolicOp::NotEqual;
    if (b.constant.bits > static_cast<std::uint64_t>(std::numeric_limits<int>::max()) ||
        (ordered && b.constant.isUnsigned))
        return difference(op, a, b);
    return truthOf(compareWith(table_, op, symbol(a), static_cast<int>(b.constant.bits)), first, last);
}

/// A comparison as one of an unknown with 0.
DirectiveConditionReader::Operand DirectiveConditionReader::difference(SymbolicOp op, const Operand& a,
                                                                       const Operand& b) {
    const auto key = [&](const Operand& each) { return text(each.innerFirst, each.innerLast, true); };
    const auto shown = [&](const Operand& each) { return text(each.first, each.last, false); };
    const std::string keyA = key(a);
    const std::string keyB = key(b);
    const bool swapped = keyB < keyA;
    std::vector<MacroStates::Name> names = macros(a.first, a.last);
    for (const MacroStates::Name name : macros(b.first, b.last))
        names.push_back(name);
    const MacroUnknownId unknown = unknowns_.comparison((swapped ? keyB : keyA) + "\n=\n" + (swapped ? keyA : keyB),
                                                        shown(swapped ? b : a), shown(swapped ? a : b), names);
    std::vector<std::string> known;
    const auto valueA = this->known(a.first, a.last, known);
    const auto valueB = this->known(b.first, b.last, known);
    if (valueA && valueB) {
        const auto is = [&](SymbolicOp order) { return computeConstant(order, *valueA, *valueB)->bits != 0; };
        const SymbolicOp order = is(SymbolicOp::LessThan)      ? SymbolicOp::LessThan
                                 : is(SymbolicOp::GreaterThan) ? SymbolicOp::GreaterThan
                                                               : SymbolicOp::Equal;
        const SymbolicOp ordered = swapped ? operatorInfo(order).mirrored : order;
        condition_.known.push_back(
            {unknown, compareWith(table_, ordered, unknowns_[unknown].node, 0), std::move(known)});
    }
    const SymbolicExprId node = compareWith(table_, swapped ? operatorInfo(op).mirrored : op, use(unknown), 0);
    return truthOf(node, std::min(a.first, b.first), std::max(a.last, b.last));
}

} // namespace VT
