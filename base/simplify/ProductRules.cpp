// Rules for products and quotients.
//
// Quotients are exact in dimensions, and rules move them there; those of a condition are truncated, and stay where they
// are.
#include "base/simplify/Literals.hpp"

namespace VT {

namespace {

// Products.

SymbolicExprId cancelledQuotient(RuleContext& context, const RuleOperands& x) {
    if (context.inCondition())
        return invalidId;
    if (const auto* quotient = binary(context, x.a, SymbolicOp::Divide);
        quotient != nullptr && quotient->right() == x.b)
        return quotient->left();
    if (const auto* quotient = binary(context, x.b, SymbolicOp::Divide);
        quotient != nullptr && quotient->right() == x.a)
        return quotient->left();
    return invalidId;
}

/// x*1 and 1*x.
SymbolicExprId neutralFactor(RuleContext& context, const RuleOperands& x) {
    if (context.integer(x.valueA) == 1)
        return x.b;
    return context.integer(x.valueB) == 1 ? x.a : invalidId;
}

/// x*0 and 0*x with an integer zero.
SymbolicExprId zeroFactor(RuleContext& context, const RuleOperands& x) {
    if (context.integer(x.valueA) == 0)
        return x.a;
    return context.integer(x.valueB) == 0 ? x.b : invalidId;
}

/// The product of two literals; the invalid identifier where it is too large, or so small that only zero is left of it.
SymbolicExprId productOfNumbers(RuleContext& context, SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId product = foldNumbers(context, SymbolicOp::Multiply, a, b);
    if (product == invalidId)
        return invalidId;
    const auto value = [&](SymbolicExprId id) { return context.node(id).getNumValue(); };
    return value(product) == 0 && value(a) != 0 && value(b) != 0 ? invalidId : product;
}

/// c*(r + d) and c*(r - d) as c*r + c*d, or unchanged where the rewrite is refused.
SymbolicExprId distributedFactor(RuleContext& context, const RuleOperands& x) {
    const SymbolicOp op = context.op(x.b);
    if (op != SymbolicOp::Plus && op != SymbolicOp::Minus)
        return invalidId;
    const auto& sum = static_cast<const SymbolicBinaryExpr&>(context.node(x.b));
    const SymbolicExprId constant = productOfNumbers(context, x.valueA, sum.right());
    if (constant == invalidId)
        return invalidId;
    const SymbolicExprId result =
        context.makeBinary(op, context.makeBinary(SymbolicOp::Multiply, x.a, sum.left()), constant);
    const SymbolicExprId expression = context.makeBinary(SymbolicOp::Multiply, x.a, x.b);
    return context.confirmRewrite(expression, result) ? result : expression;
}

SymbolicExprId gatheredFactor(RuleContext& context, const RuleOperands& x) {
    const auto* product = binary(context, x.b, SymbolicOp::Multiply);
    if (product == nullptr)
        return invalidId;
    const SymbolicExprId factor = productOfNumbers(context, x.valueA, product->left());
    return factor == invalidId ? invalidId : context.makeBinary(SymbolicOp::Multiply, factor, product->right());
}

/// c*(x/d) where d divides c.  A truncated quotient may be moved only where nothing is cut off.
SymbolicExprId reducedFraction(RuleContext& context, const RuleOperands& x) {
    const auto* quotient = binary(context, x.b, SymbolicOp::Divide);
    if (quotient == nullptr)
        return invalidId;
    const std::optional<int> factor = context.integer(x.valueA);
    const std::optional<int> divisor = context.integer(quotient->right());
    if (!factor || !divisor || *divisor == 0 || std::int64_t{*factor} % *divisor != 0)
        return invalidId;
    if (context.inCondition() && *divisor != 1 && *divisor != -1)
        return invalidId;
    const SymbolicExprId rest = integerIfFits(context, std::int64_t{*factor} / *divisor);
    return rest == invalidId ? invalidId : context.makeBinary(SymbolicOp::Multiply, rest, quotient->left());
}

// Quotients.

SymbolicExprId neutralDivisor(RuleContext& context, const RuleOperands& x) {
    return context.integer(x.valueB) == 1 ? x.a : invalidId;
}

constexpr OperatorSet multiplyOnly{SymbolicOp::Multiply};
constexpr OperatorSet divideOnly{SymbolicOp::Divide};

constexpr NodeRule productTable[] = {
    {{multiplyOnly, "folded product", "2*3", "6"}, foldedNumbers},
    {{multiplyOnly, "cancelled quotient", "N/M*M", "N"}, cancelledQuotient},
    {{multiplyOnly, "distributed factor", "2*(N + 3)", "2*N + 6"}, distributedFactor},
    {{multiplyOnly, "gathered factor", "2*(3*N)", "6*N"}, gatheredFactor},
    {{multiplyOnly, "reduced fraction", "4*(N/2)", "2*N"}, reducedFraction},
    {{multiplyOnly, "neutral factor", "1*N", "N"}, neutralFactor},
    {{multiplyOnly, "zero factor", "N*0", "0"}, zeroFactor},
    {{divideOnly, "folded quotient", "6/3", "2"}, foldedNumbers},
    {{divideOnly, "neutral divisor", "N/1", "N"}, neutralDivisor},
};

} // namespace

std::span<const NodeRule> productRules() {
    return productTable;
}

SymbolicExprId simplifyMultiply(RuleContext& context, SymbolicExprId a, SymbolicExprId b) {
    struct Addend {
        SymbolicOp op;
        SymbolicExprId constant;
    };

    // What is left after a rule may be a product to which a further one applies, or a distribution's sum with such a
    // product on its left.
    std::vector<Addend> addends;
    SymbolicExprId product = context.makeBinary(SymbolicOp::Multiply, a, b);
    for (;;) {
        const auto* factors = binary(context, product, SymbolicOp::Multiply);
        if (factors == nullptr)
            break;
        const SymbolicExprId result = applyRules(context, SymbolicOp::Multiply, factors->left(), factors->right());
        if (result == invalidId || result == product)
            break;
        product = result;
        const SymbolicOp op = context.op(result);
        if (op != SymbolicOp::Plus && op != SymbolicOp::Minus)
            continue;
        const auto& sum = static_cast<const SymbolicBinaryExpr&>(context.node(result));
        addends.push_back({op, sum.right()});
        product = sum.left();
    }
    if (addends.empty())
        return product;
    for (; !addends.empty(); addends.pop_back())
        product = context.makeBinary(addends.back().op, product, addends.back().constant);
    return simplifySum(context, product);
}

SymbolicExprId simplifyDivide(RuleContext& context, SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId result = applyRules(context, SymbolicOp::Divide, a, b);
    return result != invalidId ? result : context.makeBinary(SymbolicOp::Divide, a, b);
}

} // namespace VT
