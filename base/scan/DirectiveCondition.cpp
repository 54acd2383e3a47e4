// Reads conditions of directives as nodes.
//
// Method: operator precedence on two stacks.  An operand is a constant, a truth value, a value of a macro or another
// term; operators (DirectiveOperators.cpp) compute constants, compare, join, or make a term.  Terms become nodes only
// where they are compared or used as a truth value.  A condition that cannot be read is one unknown.
// Cost: linear in the tokens but for the texts of nested terms, which limits::conditionTexts bounds.
// Relies on: MacroUnknowns for the unknowns, MacroStates for the states in which macros are read.
#include "base/scan/DirectiveCondition.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/shorten/ImpliedCondition.hpp"
#include "base/scan/DirectiveOperators.hpp"

#include <algorithm>
#include <limits>
#include <utility>

namespace VT {

namespace {

/// Whether the file does not determine the meaning of a token: #machine(x), a name that may be spelled in another way.
bool isUncertain(const DirectiveToken& token) {
    return token.text == "#" || isOddName(token);
}

bool isWord(const DirectiveToken& token) {
    return token.kind != DirectiveTokenKind::Operator;
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
    if (tokens_.empty() || tokens_.size() > limits::conditionTokens || std::ranges::any_of(tokens_, isUncertain)) {
        condition_.understood = false;
        condition_.node = use(unknowns_.unique("?"));
    } else if (isExpression) {
        if (!parse())
            readAsWhole();
    } else if (tokens_[0].kind != DirectiveTokenKind::Name) {
        readAsWhole();
    } else {
        const MacroUnknownId defined = unknowns_.defined(states_.nameOf(tokens_[0].text));
        noteDefined(defined, tokens_[0].text);
        condition_.node = use(defined);
        if (directive.kind == DirectiveKind::Ifndef || directive.kind == DirectiveKind::Elifndef)
            condition_.node = SymbolicNotExpr(table_, condition_.node).getId(table_);
    }
    std::ranges::sort(condition_.unknowns);
    auto& unknowns = condition_.unknowns;
    unknowns.erase(std::unique(unknowns.begin(), unknowns.end()), unknowns.end());
    return std::move(condition_);
}

/// Reads the condition as one unknown: equal texts are still equal.
void DirectiveConditionReader::readAsWhole() {
    condition_ = {};
    condition_.understood = false;
    const auto last = static_cast<std::uint32_t>(tokens_.size() - 1);
    const MacroUnknownId whole = unknowns_.term(text(0, last, true), text(0, last, false), macros(0, last));
    noteValue(whole, 0, last);
    condition_.node = use(whole);
}

// Reading.

bool DirectiveConditionReader::parse() {
    operands_.clear();
    operations_.clear();
    spelled_ = 0;
    bool operandExpected = true;
    for (std::uint32_t i = 0; i < tokens_.size(); ++i) {
        const DirectiveToken& token = tokens_[i];
        if (spelled_ > limits::conditionTexts * tokens_.size())
            return false;
        if (operandExpected) {
            const SymbolicOp prefix = prefixOf(token);
            if (isWord(token) && prefix != SymbolicOp::None && isSign(i + 1)) // in C a name: not - 1
                return false;
            if (token.text == "(")
                operations_.push_back({SymbolicOp::None, true, loosestPrecedence, i});
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
    reduceTo(loosestPrecedence - 1);
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
        if (infixOf(read) != SymbolicOp::None || states_.isOpen(states_.nameOf(read.text)))
            return false;
        if (token + 1 < tokens_.size() && tokens_[token + 1].text == "(")
            return readCall(token);
        if (read.text == "true" || read.text == "false") { // with a value though not defined, or a macro
            if (truthConstants_)
                constant = DirectiveConstant{read.text == "true" ? 1U : 0U, false};
        } else {
            operand.kind = Operand::Kind::Value;
        }
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

/// Whether a token begins an operand or follows one.
bool DirectiveConditionReader::isSign(std::uint32_t token) const {
    return token < tokens_.size() && (tokens_[token].text == "-" || tokens_[token].text == "+");
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
    noteDefined(defined, tokens_[token].text);
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
    reduceTo(loosestPrecedence - 1);
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
    SymbolicExprId node = invalidId;
    if (operand.kind == Operand::Kind::Constant) {
        const MacroUnknownId constant = unknowns_.unique(text(operand.innerFirst, operand.innerLast, false));
        condition_.constants.emplace_back(constant, operand.constant.bits != 0);
        node = use(constant);
    } else {
        node = symbol(operand);
    }
    condition_.spellings.push_back({node, operand.innerFirst, operand.innerLast});
    return node;
}

/// Returns the symbol of a value or a term.
SymbolicExprId DirectiveConditionReader::symbol(const Operand& operand) {
    const auto unknownOf = [&] {
        if (operand.kind == Operand::Kind::Value)
            return unknowns_.value(states_.nameOf(tokens_[operand.innerFirst].text));
        const std::string shown = text(operand.innerFirst, operand.innerLast, false);
        return unknowns_.term(text(operand.innerFirst, operand.innerLast, true),
                              operand.compound ? "(" + shown + ")" : shown,
                              macros(operand.innerFirst, operand.innerLast));
    };
    const MacroUnknownId unknown = unknownOf();
    noteValue(unknown, operand.innerFirst, operand.innerLast);
    return use(unknown);
}

SymbolicExprId DirectiveConditionReader::use(MacroUnknownId unknown) {
    condition_.unknowns.push_back(unknown);
    return unknowns_[unknown].node;
}

// Values under the macros of a build.

/// What the build says about a macro where a condition is read.
const BuildMacros::Macro* DirectiveConditionReader::macroOf(std::string_view name) {
    const BuildMacros::Macro* const macro = build_->find(name);
    if (macro == nullptr)
        return nullptr;
    const MacroStates::State state = states_.stateOf(states_.nameOf(name));
    const bool isChanged = state.version != 0 || state.derived || state.varies;
    return isChanged || (!macro->isDefined && state.epoch != 0) ? nullptr : macro;
}

/// Returns the value of tokens, and the macros that it follows from.
std::optional<DirectiveConstant> DirectiveConditionReader::known(std::uint32_t first, std::uint32_t last,
                                                                 std::vector<std::string>& macros) {
    if (build_ == nullptr)
        return std::nullopt;
    std::vector<std::string_view> used;
    const auto value = BuildMacros::valueOf(
        tokens_.subspan(first, last - first + 1), [this](std::string_view name) { return macroOf(name); },
        truthConstants_, valueBudget_, &used);
    for (const std::string_view name : used)
        if (macroOf(name) != nullptr && std::ranges::find(macros, name) == macros.end())
            macros.emplace_back(name);
    return value;
}

void DirectiveConditionReader::noteValue(MacroUnknownId unknown, std::uint32_t first, std::uint32_t last) {
    std::vector<std::string> macros;
    const auto value = known(first, last, macros);
    if (!value)
        return;
    // Unknowns are compared with integers from 0 to the largest int alone.
    constexpr int most = std::numeric_limits<int>::max();
    const SymbolicExprId node = unknowns_[unknown].node;
    const SymbolicExprId fact = value->isNegative() ? compareWith(table_, SymbolicOp::LessThan, node, 0)
                                : value->bits > static_cast<std::uint64_t>(most)
                                    ? compareWith(table_, SymbolicOp::GreaterThan, node, most)
                                    : compareWith(table_, SymbolicOp::Equal, node, static_cast<int>(value->bits));
    condition_.known.push_back({unknown, fact, std::move(macros)});
}

void DirectiveConditionReader::noteDefined(MacroUnknownId unknown, std::string_view macro) {
    const BuildMacros::Macro* const known = build_ == nullptr ? nullptr : macroOf(macro);
    if (known == nullptr)
        return;
    const SymbolicExprId node = unknowns_[unknown].node;
    condition_.known.push_back(
        {unknown, known->isDefined ? node : SymbolicNotExpr(table_, node).getId(table_), {std::string(macro)}});
}

// Texts.

std::string DirectiveConditionReader::text(std::uint32_t first, std::uint32_t last, bool compact) {
    spelled_ += last - first + 1;
    return spelledTokens(tokens_.subspan(first, last - first + 1), compact);
}

/// Returns the macros that a text names.
std::vector<MacroStates::Name> DirectiveConditionReader::macros(std::uint32_t first, std::uint32_t last) {
    std::vector<MacroStates::Name> names;
    for (std::uint32_t i = first; i <= last; ++i)
        if (tokens_[i].kind == DirectiveTokenKind::Name)
            names.push_back(states_.nameOf(tokens_[i].text));
    return names;
}

} // namespace VT
