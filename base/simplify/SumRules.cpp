// Rules for sums: chains of +, - and unary minus.
//
// Method: a chain is read as integer multiples of terms and a constant, from the outside in, so that a shared node
// costs one visit; it is written in the order in which terms first occur.
// Cost: linear in the distinct nodes of the chain.
// Relies on: 64-bit arithmetic that refuses to overflow; a sum with a real literal is folded pair by pair only,
// because rounding does not commute.
#include "base/core/Walk.hpp"
#include "base/integer/IntegerSet.hpp"
#include "base/simplify/Literals.hpp"
#include "base/util/IdMap.hpp"

#include <algorithm>

namespace VT {

namespace {

/// x+0, 0+x and x-0 with an integer zero.
SymbolicExprId neutralTerm(RuleContext& context, const RuleOperands& x) {
    if (context.integer(x.valueB) == 0)
        return x.a;
    return x.op == SymbolicOp::Plus && context.integer(x.valueA) == 0 ? x.b : invalidId;
}

/// -(-x)
SymbolicExprId doubleMinus(RuleContext& context, const RuleOperands& x) {
    const SymbolicExpr& operand = context.node(x.a);
    return operand.op() == SymbolicOp::UnaryMinus ? static_cast<const SymbolicUnaryExpr&>(operand).operand()
                                                  : invalidId;
}

constexpr OperatorSet plusMinus{SymbolicOp::Plus, SymbolicOp::Minus};

constexpr NodeRule sumTable[] = {
    {{plusMinus, "folded sum", "1.5 + 2.5", "4"}, foldedNumbers},
    {{plusMinus, "neutral term", "N + 0", "N"}, neutralTerm},
    {{{SymbolicOp::UnaryMinus}, "double minus", "-(-N)", "N"}, doubleMinus},
};

constexpr RuleInfo gatheredSum{sumOps, "gathered sum", "1 + N - 3", "N - 2"};
constexpr RuleInfo collectedTerms{sumOps, "collected terms", "2*N + 3*N", "5*N"};
constexpr RuleInfo cancelledTerms{sumOps, "cancelled terms", "N + 1 - N", "1"};

/// A sum as integer multiples of terms, in the order in which they first occur, and a constant.
class LinearSum {
public:
    /// Reads a chain of +, - and unary minus; false where it holds a real literal or a multiple does not fit.
    bool read(const RuleContext& context, SymbolicExprId root);
    /// The sum, constant last; the invalid identifier where a multiple or the constant does not fit.
    SymbolicExprId write(RuleContext& context) const;
    /// What reading the sum achieved, for explanations.
    [[nodiscard]] const RuleInfo& rule() const;

private:
    struct Term {
        SymbolicExprId operand;
        std::int64_t factor;
        SymbolicExprId asWritten; ///< the one occurrence, or the invalid identifier where there were several
        int sign;                 ///< of that occurrence
    };

    bool add(const RuleContext& context, SymbolicExprId operand, std::int64_t multiple);
    SymbolicExprId write(RuleContext& context, const Term& term, bool negate) const;

    std::vector<Term> terms_;
    IdMap<std::size_t> positions_;
    std::int64_t constant_ = 0;
};

bool LinearSum::add(const RuleContext& context, SymbolicExprId operand, std::int64_t multiple) {
    if (const std::optional<int> literal = context.integer(operand)) {
        std::int64_t value = 0;
        return !__builtin_mul_overflow(multiple, std::int64_t{*literal}, &value) &&
               !__builtin_add_overflow(constant_, value, &constant_);
    }
    SymbolicExprId base = operand;
    std::int64_t factor = multiple;
    if (const auto* product = binary(context, operand, SymbolicOp::Multiply)) {
        const std::optional<int> left = context.integer(product->left());
        const std::optional<int> right = context.integer(product->right());
        base = left ? product->right() : right ? product->left() : operand;
        if ((left || right) && __builtin_mul_overflow(multiple, std::int64_t{left ? *left : *right}, &factor))
            return false;
    }
    if (const std::size_t* known = positions_.find(base)) {
        Term& term = terms_[*known];
        term.asWritten = invalidId;
        return !__builtin_add_overflow(term.factor, factor, &term.factor);
    }
    const bool once = multiple == 1 || multiple == -1;
    positions_.insert(base, terms_.size());
    terms_.push_back({base, factor, once ? operand : invalidId, multiple < 0 ? -1 : 1});
    return true;
}

bool LinearSum::read(const RuleContext& context, SymbolicExprId root) {
    std::vector<SymbolicExprId> order; // operands before the nodes of the chain that they are operands of
    IdMap<std::int64_t> multiples;
    bool readable = true;
    const auto note = [&](SymbolicExprId id) {
        multiples.insert(id, 0);
        order.push_back(id);
        readable = readable && context.op(id) != SymbolicOp::DoubleValue;
    };
    std::vector<WalkFrame> stack;
    walkUnknown(
        context.table(), root, stack,
        [&](SymbolicExprId id, const SymbolicExpr*) {
            if (multiples.find(id) != nullptr)
                return true;
            const bool isTerm = !sumOps.contains(context.op(id));
            if (isTerm)
                note(id);
            return isTerm;
        },
        [&](SymbolicExprId id, const SymbolicExpr&, const SymbolicExpr*) { note(id); },
        [&](SymbolicExprId, const SymbolicExpr*) { readable = false; });
    if (!readable)
        return false;
    // How often a node occurs is known once everything above it has been counted.
    multiples.insert(root, 1);
    for (auto next = order.rbegin(); next != order.rend(); ++next) { // NOLINT(modernize-loop-convert): clang 14
        const SymbolicExprId id = *next;
        const SymbolicExpr& node = context.node(id);
        if (!sumOps.contains(node.op()))
            continue;
        const std::int64_t multiple = *multiples.find(id);
        for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
            const bool negated = node.op() == SymbolicOp::UnaryMinus || (node.op() == SymbolicOp::Minus && i == 1);
            std::int64_t& operand = *multiples.find(node.getInput(i));
            if (negated ? __builtin_sub_overflow(operand, multiple, &operand)
                        : __builtin_add_overflow(operand, multiple, &operand))
                return false;
        }
    }
    for (const SymbolicExprId id : order)
        if (!sumOps.contains(context.op(id)) && !add(context, id, *multiples.find(id)))
            return false;
    return true;
}

SymbolicExprId LinearSum::write(RuleContext& context, const Term& term, bool negate) const {
    if (term.asWritten != invalidId && (term.sign < 0) == negate)
        return term.asWritten;
    const std::int64_t factor = negate ? -term.factor : term.factor;
    if (factor == 1)
        return term.operand;
    const SymbolicExprId literal = integerIfFits(context, factor);
    return literal == invalidId ? invalidId : context.makeBinary(SymbolicOp::Multiply, literal, term.operand);
}

SymbolicExprId LinearSum::write(RuleContext& context) const {
    SymbolicExprId sum = invalidId;
    for (const Term& term : terms_) {
        if (term.factor == 0)
            continue;
        const bool negative = term.asWritten != invalidId ? term.sign < 0 : term.factor < 0;
        const bool leading = sum == invalidId;
        // A leading multiple carries its sign itself; a leading -N is a negation.
        const bool negation = leading && negative && (term.asWritten != invalidId || term.factor == -1);
        const SymbolicExprId operand = write(context, term, leading ? negation : negative);
        if (operand == invalidId)
            return invalidId;
        if (leading)
            sum = negation ? context.make<SymbolicUnaryMinusExpr>(operand) : operand;
        else
            sum = context.makeBinary(negative ? SymbolicOp::Minus : SymbolicOp::Plus, sum, operand);
    }
    if (sum == invalidId)
        return integerIfFits(context, constant_);
    if (constant_ == 0)
        return sum;
    const bool subtract = constant_ < 0 && fitsInt(-constant_);
    const SymbolicExprId literal = integerIfFits(context, subtract ? -constant_ : constant_);
    if (literal == invalidId)
        return invalidId;
    return context.makeBinary(subtract ? SymbolicOp::Minus : SymbolicOp::Plus, sum, literal);
}

const RuleInfo& LinearSum::rule() const {
    if (std::ranges::any_of(terms_, [](const Term& term) { return term.factor == 0; }))
        return cancelledTerms;
    const bool collected = std::ranges::any_of(terms_, [](const Term& term) { return term.asWritten == invalidId; });
    return collected ? collectedTerms : gatheredSum;
}

} // namespace

std::span<const NodeRule> sumRules() {
    return sumTable;
}

SymbolicExprId simplifySum(RuleContext& context, SymbolicExprId root) {
    const SymbolicExprId folded = applyRules(context, root);
    if (!sumOps.contains(context.op(folded)))
        return folded;
    LinearSum sum;
    const SymbolicExprId gathered = sum.read(context, folded) ? sum.write(context) : invalidId;
    if (gathered == invalidId)
        return folded;
    context.fired(sum.rule(), folded, gathered);
    return gathered;
}

void appendSumRules(std::vector<const RuleInfo*>& out) {
    for (const RuleInfo* rule : {&gatheredSum, &collectedTerms, &cancelledTerms})
        out.push_back(rule);
}

} // namespace VT
