#include "base/scan/DirectiveCondition.hpp"

#include <algorithm>
#include <array>
#include <limits>
#include <utility>

namespace VT {

namespace {

constexpr std::size_t mostTokens = 4096; ///< of a condition that is looked into
constexpr std::uint8_t loosest = 255;

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

SymbolicOp infixOf(const DirectiveToken& token) {
    const bool mayBe = token.kind == DirectiveTokenKind::Operator || token.kind == DirectiveTokenKind::Name;
    const auto* const known =
        std::ranges::find(infixOperators, token.text, [](const auto& each) -> std::string_view { return each.first; });
    return mayBe && known != infixOperators.end() ? known->second : SymbolicOp::None;
}

/// The operator of a prefix; Plus for a plus, None for none.
SymbolicOp prefixOf(std::string_view text) {
    return text == "!" || text == "not"     ? SymbolicOp::Not
           : text == "-"                    ? SymbolicOp::UnaryMinus
           : text == "~" || text == "compl" ? SymbolicOp::BitCompl
           : text == "+"                    ? SymbolicOp::Plus
                                            : SymbolicOp::None;
}

bool isWord(const DirectiveToken& token) {
    return token.kind != DirectiveTokenKind::Operator;
}

SymbolicExprId compareWith(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId symbol, int constant) {
    const SymbolicIntValue value(table, constant);
    switch (op) {
    case SymbolicOp::Equal:
        return SymbolicEqualExpr(table, symbol, value).getId(table);
    case SymbolicOp::NotEqual:
        return SymbolicNotEqualExpr(table, symbol, value).getId(table);
    case SymbolicOp::LessThan:
        return SymbolicLessThanExpr(table, symbol, value).getId(table);
    case SymbolicOp::LessThanEqual:
        return SymbolicLessThanEqualExpr(table, symbol, value).getId(table);
    case SymbolicOp::GreaterThan:
        return SymbolicGreaterThanExpr(table, symbol, value).getId(table);
    default:
        return SymbolicGreaterThanEqualExpr(table, symbol, value).getId(table);
    }
}

} // namespace

std::string spelledTokens(std::span<const DirectiveToken> tokens, bool compact) {
    std::string text;
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        const bool needed = i != 0 && isWord(tokens[i - 1]) && isWord(tokens[i]);
        if (i != 0 && (compact ? needed : tokens[i].afterBlank))
            text.push_back(' ');
        text.append(tokens[i].text);
    }
    return text;
}

DirectiveCondition DirectiveConditionReader::read(const Directive& directive) {
    tokens_ = directive.tokens;
    condition_ = {};
    const bool isExpression = directive.kind == DirectiveKind::If || directive.kind == DirectiveKind::Elif;
    if (isExpression) {
        if (tokens_.size() > mostTokens || !parse())
            readAsWhole();
    } else if (tokens_.empty() || tokens_[0].kind != DirectiveTokenKind::Name) {
        readAsWhole();
    } else {
        condition_.node = use(unknowns_.defined(states_.nameOf(tokens_[0].text)));
        if (directive.kind == DirectiveKind::Ifndef || directive.kind == DirectiveKind::Elifndef)
            condition_.node = SymbolicNotExpr(table_, condition_.node).getId(table_);
    }
    std::ranges::sort(condition_.unknowns);
    const auto repeated = std::ranges::unique(condition_.unknowns);
    condition_.unknowns.erase(repeated.begin(), repeated.end());
    return std::move(condition_);
}

/// An unknown as a whole: equal conditions are still equal, but for those beyond the bound.
void DirectiveConditionReader::readAsWhole() {
    condition_ = {};
    condition_.understood = false;
    bool unstable = tokens_.empty() || tokens_.size() > mostTokens;
    if (unstable) {
        condition_.node = use(unknowns_.unique("?"));
        return;
    }
    const auto last = static_cast<std::uint32_t>(tokens_.size() - 1);
    const auto names = macros(0, last, unstable);
    condition_.node =
        use(unstable ? unknowns_.unique("?") : unknowns_.term(text(0, last, true), text(0, last, false), names));
}

// Reading.

bool DirectiveConditionReader::parse() {
    operands_.clear();
    operations_.clear();
    bool operandExpected = true;
    for (std::uint32_t i = 0; i < tokens_.size(); ++i) {
        const DirectiveToken& token = tokens_[i];
        if (operandExpected) {
            const SymbolicOp prefix = prefixOf(token.text);
            if (token.text == "(")
                operations_.push_back({SymbolicOp::None, true, loosest, i});
            else if (prefix != SymbolicOp::None)
                operations_.push_back({prefix, true, operatorInfo(SymbolicOp::Not).precedence, i});
            else if (readOperand(i))
                operandExpected = false;
            else
                return false;
        } else if (token.text == ")") {
            if (!closeParenthesis(i))
                return false;
        } else {
            if (!readInfix(i))
                return false;
            operandExpected = true;
        }
    }
    if (operandExpected)
        return false;
    reduceTo(loosest - 1);
    if (!operations_.empty())
        return false;
    const Operand& whole = operands_.back();
    if (whole.kind == Operand::Kind::Constant)
        condition_.constant = whole.constant.bits != 0;
    condition_.node = truth(whole);
    return true;
}

bool DirectiveConditionReader::readOperand(std::uint32_t& token) {
    const DirectiveToken& read = tokens_[token];
    Operand operand{.first = token, .last = token, .innerFirst = token, .innerLast = token};
    std::optional<DirectiveConstant> constant;
    switch (read.kind) {
    case DirectiveTokenKind::Number:
        constant = readConstant(read.text);
        break;
    case DirectiveTokenKind::Character:
        constant = readCharacter(read.text);
        break;
    case DirectiveTokenKind::Name:
        if (read.text == "defined")
            return readDefined(token);
        if (infixOf(read) != SymbolicOp::None)
            return false;
        if (token + 1 < tokens_.size() && tokens_[token + 1].text == "(")
            return readCall(token);
        if (truthConstants_ && (read.text == "true" || read.text == "false"))
            constant = DirectiveConstant{read.text == "true" ? 1U : 0U, false};
        else if (read.text != "__LINE__" && read.text != "__COUNTER__")
            operand.kind = Operand::Kind::Value;
        break;
    default:
        return false;
    }
    if (constant) {
        operand.kind = Operand::Kind::Constant;
        operand.constant = *constant;
    }
    operands_.push_back(operand);
    return true;
}

bool DirectiveConditionReader::readDefined(std::uint32_t& token) {
    const std::uint32_t first = token;
    const auto is = [&](std::uint32_t at, std::string_view text) {
        return at < tokens_.size() && tokens_[at].text == text;
    };
    const bool bracketed = is(token + 1, "(");
    token += bracketed ? 2 : 1;
    if (token >= tokens_.size() || tokens_[token].kind != DirectiveTokenKind::Name ||
        (bracketed && !is(token + 1, ")")))
        return false;
    const MacroUnknownId defined = unknowns_.defined(states_.nameOf(tokens_[token].text));
    token += bracketed ? 1 : 0;
    operands_.push_back(truthOf(use(defined), first, token));
    return true;
}

bool DirectiveConditionReader::readCall(std::uint32_t& token) {
    const std::uint32_t first = token;
    std::size_t open = 0;
    for (++token; token < tokens_.size(); ++token) {
        open += tokens_[token].text == "(" ? 1U : 0U;
        open -= tokens_[token].text == ")" ? 1U : 0U;
        if (open == 0) {
            operands_.push_back({.first = first, .last = token, .innerFirst = first, .innerLast = token});
            return true;
        }
    }
    return false;
}

bool DirectiveConditionReader::readInfix(std::uint32_t token) {
    const SymbolicOp op = infixOf(tokens_[token]);
    if (op == SymbolicOp::None)
        return false;
    const std::uint8_t precedence = operatorInfo(op).precedence;
    reduceTo(precedence);
    operations_.push_back({op, false, precedence, token});
    return true;
}

bool DirectiveConditionReader::closeParenthesis(std::uint32_t token) {
    reduceTo(loosest - 1);
    if (operations_.empty())
        return false;
    operands_.back().first = operations_.back().token;
    operands_.back().last = token;
    operations_.pop_back();
    return true;
}

// Joining.

/// Applies the operators that bind at least so tightly.
void DirectiveConditionReader::reduceTo(std::uint8_t precedence) {
    while (!operations_.empty() && operations_.back().precedence <= precedence)
        reduce();
}

void DirectiveConditionReader::reduce() {
    const Operation operation = operations_.back();
    operations_.pop_back();
    const Operand b = operands_.back();
    operands_.pop_back();
    if (operation.prefix) {
        operands_.push_back(prefixed(operation, b));
        return;
    }
    const Operand a = operands_.back();
    operands_.pop_back();
    operands_.push_back(joined(operation.op, a, b));
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
        for (const Operand* const each : {&a, &b})
            condition_.bracketed = condition_.bracketed || (op == SymbolicOp::Or && each->first != each->innerFirst &&
                                                            each->kind == Operand::Kind::Truth &&
                                                            table_.get(each->truth)->op() == SymbolicOp::And);
        const SymbolicExprId left = truth(a);
        const SymbolicExprId right = truth(b);
        const SymbolicExprId node = op == SymbolicOp::And ? SymbolicAndExpr(table_, left, right).getId(table_)
                                                          : SymbolicOrExpr(table_, left, right).getId(table_);
        return {.kind = Operand::Kind::Truth,
                .first = a.first,
                .last = b.last,
                .innerFirst = a.first,
                .innerLast = b.last,
                .truth = node};
    }
    Operand result{.compound = true, .first = a.first, .last = b.last, .innerFirst = a.first, .innerLast = b.last};
    if (a.kind == Operand::Kind::Constant && b.kind == Operand::Kind::Constant) {
        if (const auto value = computeConstant(op, a.constant, b.constant)) {
            result.kind = Operand::Kind::Constant;
            result.constant = *value;
        }
        return result;
    }
    return comparisonOps.contains(op) ? compared(op, a, b) : result;
}

DirectiveConditionReader::Operand DirectiveConditionReader::compared(SymbolicOp op, const Operand& a,
                                                                     const Operand& b) {
    using Kind = Operand::Kind;
    if (a.kind == Kind::Constant)
        return compared(operatorInfo(op).mirrored, b, a);
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
    bool unstable = false;
    std::vector<MacroStates::Name> names = macros(a.first, a.last, unstable);
    for (const MacroStates::Name name : macros(b.first, b.last, unstable))
        names.push_back(name);
    const MacroUnknownId unknown =
        unstable ? unknowns_.unique("?")
                 : unknowns_.comparison((swapped ? keyB : keyA) + "\n=\n" + (swapped ? keyA : keyB),
                                        shown(swapped ? b : a), shown(swapped ? a : b), names);
    const SymbolicExprId node = compareWith(table_, swapped ? operatorInfo(op).mirrored : op, use(unknown), 0);
    return truthOf(node, std::min(a.first, b.first), std::max(a.last, b.last));
}

DirectiveConditionReader::Operand DirectiveConditionReader::truthOf(SymbolicExprId node, std::uint32_t first,
                                                                    std::uint32_t last) {
    condition_.spellings.push_back({node, first, last});
    return {.kind = Operand::Kind::Truth,
            .first = first,
            .last = last,
            .innerFirst = first,
            .innerLast = last,
            .truth = node};
}

SymbolicExprId DirectiveConditionReader::truth(const Operand& operand) {
    if (operand.kind == Operand::Kind::Truth)
        return operand.truth;
    const SymbolicExprId node = operand.kind == Operand::Kind::Constant
                                    ? use(unknowns_.unique(text(operand.innerFirst, operand.innerLast, false)))
                                    : symbol(operand);
    condition_.spellings.push_back({node, operand.innerFirst, operand.innerLast});
    return node;
}

/// The symbol of a value or a term.
SymbolicExprId DirectiveConditionReader::symbol(const Operand& operand) {
    if (operand.kind == Operand::Kind::Value)
        return use(unknowns_.value(states_.nameOf(tokens_[operand.innerFirst].text)));
    bool unstable = false;
    const auto names = macros(operand.innerFirst, operand.innerLast, unstable);
    std::string shown = text(operand.innerFirst, operand.innerLast, false);
    if (unstable)
        return use(unknowns_.unique(std::move(shown)));
    return use(unknowns_.term(text(operand.innerFirst, operand.innerLast, true),
                              operand.compound ? "(" + shown + ")" : shown, names));
}

SymbolicExprId DirectiveConditionReader::use(MacroUnknownId unknown) {
    condition_.unknowns.push_back(unknown);
    return unknowns_[unknown].node;
}

// Texts.

std::string DirectiveConditionReader::text(std::uint32_t first, std::uint32_t last, bool compact) const {
    return spelledTokens(tokens_.subspan(first, last - first + 1), compact);
}

/// The macros that a text names; `unstable` where it may change between any two directives.
std::vector<MacroStates::Name> DirectiveConditionReader::macros(std::uint32_t first, std::uint32_t last,
                                                                bool& unstable) {
    std::vector<MacroStates::Name> names;
    for (std::uint32_t i = first; i <= last; ++i) {
        if (tokens_[i].kind != DirectiveTokenKind::Name)
            continue;
        names.push_back(states_.nameOf(tokens_[i].text));
        unstable = unstable || tokens_[i].text == "__LINE__" || tokens_[i].text == "__COUNTER__";
    }
    return names;
}

} // namespace VT
