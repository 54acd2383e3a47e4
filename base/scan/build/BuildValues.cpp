// Computes expressions of directives from the macros of a build.
//
// Method: operator precedence on two stacks over tokens that are expanded on the way; a macro is not expanded within
// itself, as in C.  An operand without a known value makes the result unknown, but for && and || with a side that
// decides.
// Cost: linear in the tokens that the macros become, at most limits::expandedTokens.
#include "base/core/Limits.hpp"
#include "base/scan/DirectiveOperators.hpp"
#include "base/scan/build/BuildMacros.hpp"

#include <algorithm>
#include <unordered_set>

namespace VT {

namespace {

using Value = std::optional<DirectiveConstant>;

/// The tokens of an expression, with macros that stand for tokens expanded.
class Expansion {
public:
    Expansion(std::span<const DirectiveToken> tokens, const BuildMacros::Lookup& lookup, BuildMacros::Budget& budget)
        : lookup_(lookup),
          frames_{{tokens, {}}},
          budget_(budget),
          left_(std::min<std::uint64_t>(limits::expandedTokens, budget.left)) {}

    /// The next token; nullptr at the end and beyond the bound.
    const DirectiveToken* peek() {
        while (!frames_.empty() && frames_.back().tokens.empty())
            frames_.pop_back();
        return frames_.empty() || left_ == 0 ? nullptr : &frames_.back().tokens.front();
    }

    void skip() {
        frames_.back().tokens = frames_.back().tokens.subspan(1);
        --left_;
        --budget_.left;
    }

    /// Whether the end was reached rather than the bound.
    [[nodiscard]] bool isComplete() const { return left_ > 0; }

    /// Whether the next token is this one.  The macro of the token before counts as open still.
    [[nodiscard]] bool isNext(std::string_view text) const {
        const auto frame =
            std::find_if(frames_.rbegin(), frames_.rend(), [](const Frame& each) { return !each.tokens.empty(); });
        return frame != frames_.rend() && frame->tokens.front().text == text;
    }

    /// Replaces a name, which was skipped, by the tokens of its macro; false within itself.
    bool expand(std::string_view name, const BuildMacros::Macro& macro) {
        if (std::ranges::find(frames_, name, &Frame::macro) != frames_.end())
            return false;
        if (frames_.size() > limits::macrosFollowed)
            left_ = 0;
        else
            frames_.push_back({macro.body, name});
        return true;
    }

    const BuildMacros::Macro* find(std::string_view name) { return lookup_(name); }

private:
    struct Frame {
        std::span<const DirectiveToken> tokens;
        std::string_view macro;
    };

    const BuildMacros::Lookup& lookup_;
    std::vector<Frame> frames_;
    BuildMacros::Budget& budget_;
    std::uint64_t left_;
};

class Evaluation {
public:
    Evaluation(std::span<const DirectiveToken> tokens, const BuildMacros::Lookup& lookup, bool isCpp,
               BuildMacros::Budget& budget, std::vector<std::string_view>* used)
        : tokens_(tokens, lookup, budget),
          isCpp_(isCpp),
          used_(used) {}

    Value run();

private:
    struct Operation {
        SymbolicOp op; ///< None for an open parenthesis
        bool prefix;
        std::uint8_t precedence;
    };

    bool readOperand();
    bool readName(std::string_view name);
    bool readDefined();
    bool skipCall();
    bool takes(std::string_view text);
    void reduceTo(std::uint8_t precedence);

    const BuildMacros::Macro* find(std::string_view name) {
        if (used_ != nullptr && found_.insert(name).second)
            used_->push_back(name);
        return tokens_.find(name);
    }

    static Value joined(SymbolicOp op, const Value& a, const Value& b);

    Expansion tokens_;
    bool isCpp_;
    std::vector<std::string_view>* used_;
    std::unordered_set<std::string_view> found_; ///< in `used_`
    std::vector<Value> values_;
    std::vector<Operation> operations_;
    bool operandRead_ = false; ///< rather than replaced by tokens to read
};

bool Evaluation::takes(std::string_view text) {
    const DirectiveToken* const token = tokens_.peek();
    const bool is = token != nullptr && token->text == text;
    if (is)
        tokens_.skip();
    return is;
}

/// Skips the arguments of a call; false where they do not end.
bool Evaluation::skipCall() {
    std::size_t open = 0;
    while (const DirectiveToken* const token = tokens_.peek()) {
        open += token->text == "(" ? 1U : 0U;
        open -= token->text == ")" ? 1U : 0U;
        tokens_.skip();
        if (open == 0)
            return true;
    }
    return false;
}

bool Evaluation::readDefined() {
    const bool bracketed = takes("(");
    const DirectiveToken* const token = tokens_.peek();
    if (token == nullptr || token->kind != DirectiveTokenKind::Name)
        return false;
    const BuildMacros::Macro* const macro = find(token->text);
    tokens_.skip();
    if (bracketed && !takes(")"))
        return false;
    values_.push_back(macro == nullptr ? Value() : DirectiveConstant{macro->isDefined ? 1U : 0U, false});
    operandRead_ = true;
    return true;
}

/// Reads a name that was skipped.
bool Evaluation::readName(std::string_view name) {
    if (name == "defined")
        return readDefined();
    operandRead_ = true;
    if (isCpp_ && (name == "true" || name == "false")) {
        values_.emplace_back(DirectiveConstant{name == "true" ? 1U : 0U, false});
        return true;
    }
    const BuildMacros::Macro* const macro = find(name);
    if (tokens_.isNext("(") && (macro == nullptr || macro->isFunction)) {
        values_.emplace_back();
        return skipCall();
    }
    if (macro != nullptr && macro->isDefined && !macro->isFunction && tokens_.expand(name, *macro)) {
        operandRead_ = false;
        return true;
    }
    values_.push_back(macro == nullptr ? Value() : DirectiveConstant{});
    return true;
}

bool Evaluation::readOperand() {
    const DirectiveToken token = *tokens_.peek();
    tokens_.skip();
    operandRead_ = true;
    switch (token.kind) {
    case DirectiveTokenKind::Number:
        values_.push_back(readConstant(token.text));
        return true;
    case DirectiveTokenKind::Character:
        values_.push_back(readCharacter(token.text));
        return true;
    case DirectiveTokenKind::Name:
        return infixOf(token) == SymbolicOp::None && readName(token.text);
    default:
        return false;
    }
}

Value Evaluation::joined(SymbolicOp op, const Value& a, const Value& b) {
    if (op == SymbolicOp::And || op == SymbolicOp::Or) {
        const bool deciding = op == SymbolicOp::Or;
        const auto decides = [&](const Value& each) { return each && (each->bits != 0) == deciding; };
        if (decides(a) || decides(b))
            return DirectiveConstant{deciding ? 1U : 0U, false};
        return a && b ? DirectiveConstant{deciding ? 0U : 1U, false} : Value();
    }
    return a && b ? computeConstant(op, *a, *b) : Value();
}

/// Applies the operators that bind at least so tightly.
void Evaluation::reduceTo(std::uint8_t precedence) {
    while (!operations_.empty() && operations_.back().precedence <= precedence) {
        const Operation operation = operations_.back();
        operations_.pop_back();
        const Value b = values_.back();
        if (operation.prefix) {
            if (b && operation.op != SymbolicOp::Plus)
                values_.back() = computeConstant(operation.op, *b);
            continue;
        }
        values_.pop_back();
        values_.back() = joined(operation.op, values_.back(), b);
    }
}

Value Evaluation::run() {
    bool operandExpected = true;
    while (const DirectiveToken* const token = tokens_.peek()) {
        if (operandExpected) {
            const SymbolicOp prefix = prefixOf(*token);
            if (prefix != SymbolicOp::None && token->kind == DirectiveTokenKind::Name && !isCpp_) // a name in C
                return {};
            if (token->text == "(" || prefix != SymbolicOp::None) {
                operations_.push_back(
                    {prefix, true,
                     prefix == SymbolicOp::None ? loosestPrecedence : operatorInfo(SymbolicOp::Not).precedence});
                tokens_.skip();
            } else if (!readOperand()) {
                return {};
            } else {
                operandExpected = !operandRead_;
            }
        } else if (token->text == ")") {
            reduceTo(loosestPrecedence - 1);
            if (operations_.empty())
                return {};
            operations_.pop_back();
            tokens_.skip();
        } else {
            const SymbolicOp op = infixOf(*token);
            if (op == SymbolicOp::None)
                return {};
            reduceTo(operatorInfo(op).precedence);
            operations_.push_back({op, false, operatorInfo(op).precedence});
            tokens_.skip();
            operandExpected = true;
        }
    }
    if (operandExpected || !tokens_.isComplete())
        return {};
    reduceTo(loosestPrecedence - 1);
    return operations_.empty() ? values_.back() : Value();
}

} // namespace

std::optional<DirectiveConstant> BuildMacros::valueOf(std::span<const DirectiveToken> tokens, const Lookup& lookup,
                                                      bool isCpp, Budget& budget, std::vector<std::string_view>* used) {
    return Evaluation(tokens, lookup, isCpp, budget, used).run();
}

} // namespace VT
