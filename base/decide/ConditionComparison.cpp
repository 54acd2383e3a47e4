// Reads comparisons inside conditions: each restricts one quantity.
//
// Strict and unequal comparisons are read as the opposite of the comparison that they negate, so that only three
// operators build circuits. A form is divided by the common divisor of its factors. A floor by itself is compared by
// comparing what it is the floor of. A sum whose bound is too large for a circuit becomes an unknown of its own
// together with a round number near the bound, so that the circuit holds small bounds only.
//
// Cost: linear in the parts of the forms.
#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/ConditionReader.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <numeric>
#include <tuple>

namespace VT {

Gate ConditionReader::ownTruth(SymbolicExprId id) {
    const Unknown unknown = unknowns_.term(id, 0, 1);
    met_.push_back(unknown);
    return circuit_.between(unknowns_[unknown].quantity, 1, 1);
}

ConditionReader::Value ConditionReader::comparison(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    if (op == SymbolicOp::Equal || op == SymbolicOp::NotEqual)
        if (const auto equal = equalProducts(operands_[frame.firstOperand], operands_[frame.firstOperand + 1]))
            return ofTruth(op == SymbolicOp::Equal ? *equal : opposite(*equal));
    const auto truth = compared(op, operand(frame, 0), operand(frame, 1));
    return ofTruth(truth ? *truth : ownTruth(frame.id));
}

/// Where two products with common factors are equal: where one of those is 0, or where the rests are equal.  Nothing
/// where that is not understood, or a rest is a product, which would be an unknown of its own.
std::optional<Gate> ConditionReader::equalProducts(SymbolicExprId a, SymbolicExprId b) {
    if (table_.get(a)->op() != SymbolicOp::Multiply && table_.get(b)->op() != SymbolicOp::Multiply)
        return std::nullopt;
    using Factors = std::vector<SymbolicExprId>;
    bool areUnderstood = true;
    const auto factorsOf = [&](SymbolicExprId product) {
        Factors factors;
        walkChain(table_, product, anyNumber, LinksOf(SymbolicOp::Multiply),
                  [&](SymbolicExprId id, const SymbolicExpr*) {
                      steps_.take();
                      areUnderstood = areUnderstood && isLinear(valueOf(id));
                      factors.push_back(id);
                      return areUnderstood;
                  });
        std::ranges::sort(factors);
        return factors;
    };
    const Factors left = factorsOf(a);
    const Factors right = areUnderstood ? factorsOf(b) : Factors();
    Factors common;
    std::ranges::set_intersection(left, right, std::back_inserter(common));
    if (!areUnderstood || common.empty() || std::max(left.size(), right.size()) > common.size() + 1)
        return std::nullopt;
    const auto restOf = [&](const Factors& factors) {
        Factors rest;
        std::ranges::set_difference(factors, common, std::back_inserter(rest));
        return rest.empty() ? ofNumber(1) : valueOf(rest.front());
    };
    auto equal = compared(SymbolicOp::Equal, restOf(left), restOf(right));
    for (const SymbolicExprId factor : common) {
        if (const auto isZero = equal ? compared(SymbolicOp::Equal, valueOf(factor), ofNumber(0)) : std::nullopt)
            equal = circuit_.either(*equal, *isZero);
        else
            return std::nullopt;
    }
    return equal;
}

/// Whether a value is an integer that exists whatever the values of its unknowns are.
bool ConditionReader::isLinear(const Value& value) {
    if (value.kind == Value::Kind::Truth)
        return true;
    const auto isTerm = [&](const WidePart& part) { return unknowns_[part.unknown].kind == UnknownKind::Term; };
    return value.kind == Value::Kind::Number && !value.isReal &&
           std::ranges::none_of(value.cases, [&](const Case& each) {
               const WideForm form = each.form.widened();
               charge(form);
               return std::ranges::any_of(form.parts, isTerm);
           });
}

/// Where `a op b` holds; nothing where that is not understood.
std::optional<Gate> ConditionReader::compared(SymbolicOp op, const Value& a, const Value& b) {
    using Kind = Value::Kind;
    if (a.kind == Kind::RealTerm || b.kind == Kind::RealTerm)
        return std::nullopt;
    const bool finite = std::isfinite(a.real) && std::isfinite(b.real); // 0 in what is no literal
    if (!finite || (a.kind == Kind::Real && b.kind == Kind::Real))
        return compareNumbers(op, a.real, b.real) ? always : never;
    if (op == SymbolicOp::Equal || op == SymbolicOp::NotEqual) {
        for (const auto& [tested, other] : {std::pair(&a, &b), std::pair(&b, &a)}) {
            if (tested->nonZero && constantOf(*other) == RationalForm())
                return op == SymbolicOp::Equal ? opposite(*tested->nonZero) : *tested->nonZero;
        }
    }
    const Cases left = casesOf(a);
    const Cases right = casesOf(b);
    Gate truth = never;
    for (const Case& x : left) {
        for (const Case& y : right) {
            steps_.take(1 + (x.form.size() + y.form.size()) / partsPerStep);
            const auto form = combine(x.form, 1, y.form, -1);
            if (!form)
                return std::nullopt;
            const Gate guard = circuit_.both(x.guard, y.guard);
            truth = circuit_.either(truth, circuit_.both(guard, compare(op, *form)));
        }
    }
    return truth;
}

/// Where two calls of one function have equal values or differ in an argument.
ReadCondition ConditionReader::readCongruence(SymbolicExprId a, SymbolicExprId b) {
    ReadCondition result;
    begin();
    const SymbolicExpr& left = *table_.get(a);
    const SymbolicExpr& right = *table_.get(b);
    for (std::size_t i = 0; i < left.getNumInputs(); ++i) { // the values of the calls in the place of their name
        const std::pair pair = i == 0 ? std::pair(a, b) : std::pair(left.getInput(i), right.getInput(i));
        if (pair.first == pair.second)
            continue;
        walk(pair.first);
        walk(pair.second);
        const auto differ =
            missing_ ? std::nullopt : compared(SymbolicOp::NotEqual, valueOf(pair.first), valueOf(pair.second));
        if (!differ) {
            result.bound = DecisionBound::Terms;
            return result;
        }
        result.truth = circuit_.either(result.truth, i == 0 ? opposite(*differ) : *differ);
    }
    finish(result);
    return result;
}

Gate ConditionReader::compare(SymbolicOp op, const RationalForm& form) {
    switch (op) {
    case SymbolicOp::NotEqual:
    case SymbolicOp::GreaterThan:
    case SymbolicOp::GreaterThanEqual:
        return opposite(compareDirectly(operatorInfo(op).negated, form));
    default:
        return compareDirectly(op, form);
    }
}

Gate ConditionReader::compareDirectly(SymbolicOp op, const RationalForm& form) {
    if (form.isConstant())
        return compareNumbers(op, form.sign(), 0) ? always : never;
    const LinearForm* small = form.small();
    if (small != nullptr && (small->parts.size() > 1 || !isFloor(small->parts.front().unknown)))
        return compareSmall(op, *small);
    WideForm wide = form.widened(); // its denominator changes no sign
    if (op != SymbolicOp::LessThan)
        return compareWide(op, std::move(wide));
    ++wide.constant;
    return compareWide(SymbolicOp::LessThanEqual, std::move(wide));
}

Gate ConditionReader::compareSmall(SymbolicOp op, const LinearForm& form) {
    std::int64_t factor = form.parts.front().factor;
    for (const LinearPart& part : form.parts)
        factor = std::gcd(factor, part.factor);
    Quantity quantity = unknowns_[form.parts.front().unknown].quantity;
    bool opposed = form.parts.front().factor < 0;
    if (form.parts.size() == 2 && form.parts[0].factor == -form.parts[1].factor) {
        bool swapped = false;
        std::tie(quantity, swapped) = unknowns_.difference(form.parts[0].unknown, form.parts[1].unknown);
        opposed = opposed != swapped;
    } else if (form.parts.size() > 1) {
        LinearParts parts(form.parts);
        for (LinearPart& part : parts)
            part.factor /= factor;
        Unknown sum = noUnknown;
        std::tie(sum, opposed) = unknowns_.sum(parts);
        quantity = unknowns_[sum].quantity;
    }
    // factor * quantity, or its opposite, op -constant
    const std::int64_t right = -form.constant;
    if (op == SymbolicOp::Equal) {
        const std::int64_t value = (opposed ? -right : right) / factor;
        return right % factor == 0 ? circuit_.between(quantity, value, value) : never;
    }
    const std::int64_t most = floorDivide(op == SymbolicOp::LessThan ? right - 1 : right, factor);
    return opposed ? circuit_.between(quantity, -most, plusInfinite) : circuit_.between(quantity, minusInfinite, most);
}

/// Where a sum, whose denominator does not count, equals 0 or is at most 0.
// NOLINTNEXTLINE(misc-no-recursion): once, for an equality
Gate ConditionReader::compareWide(SymbolicOp op, WideForm form) {
    constexpr unsigned longest = 2 * limits::formBits;
    while (form.parts.size() == 1 && isFloor(form.parts.front().unknown) && msb(abs(form.constant) + 1) < longest) {
        if (op == SymbolicOp::Equal) { // at most and at least
            WideForm opposed = form;
            opposed.constant = -opposed.constant;
            opposed.parts.front().factor = -opposed.parts.front().factor;
            return circuit_.both(compareWide(SymbolicOp::LessThanEqual, std::move(form)),
                                 compareWide(SymbolicOp::LessThanEqual, std::move(opposed)));
        }
        const WidePart part = form.parts.front();
        const BigInteger most = floorDivide(BigInteger(-form.constant), BigInteger(abs(part.factor)));
        const FloorOf& floor = *unknowns_[part.unknown].floor;
        form = floor.form;
        charge(form);
        if (part.factor > 0) {
            form.constant -= floor.divisor * most + floor.divisor - 1;
            continue;
        }
        for (WidePart& each : form.parts)
            each.factor = -each.factor;
        form.constant = -form.constant - floor.divisor * most;
    }
    charge(form);
    BigInteger divisor = 0;
    for (const WidePart& part : form.parts)
        divisor = gcd(divisor, part.factor);
    BigInteger right = -form.constant;
    if (op == SymbolicOp::Equal && BigInteger(right % divisor) != 0)
        return never;
    right = floorDivide(right, divisor);
    for (WidePart& part : form.parts)
        part.factor /= divisor;
    form.denominator = 1;
    form.constant = -right;
    const RationalForm reduced(form);
    if (reduced.small() != nullptr)
        return compareSmall(op, *reduced.small());
    const bool opposed = isOpposed(form.parts);
    if (opposed) {
        right = -right;
        for (WidePart& part : form.parts)
            part.factor = -part.factor;
    }
    const BigInteger near = floorDivide(right, BigInteger(limits::formNumber));
    form.constant = -near * limits::formNumber;
    const auto bound = static_cast<std::int64_t>(BigInteger(right + form.constant));
    const Unknown sum = unknowns_.floor({std::move(form), 1});
    met_.push_back(sum);
    const Quantity quantity = unknowns_[sum].quantity;
    if (op == SymbolicOp::Equal)
        return circuit_.between(quantity, bound, bound);
    return opposed ? circuit_.between(quantity, bound, plusInfinite) : circuit_.between(quantity, minusInfinite, bound);
}

} // namespace VT
