// Reads arithmetic inside conditions: as linear forms where it is linear, otherwise as one unknown for each node.
//
// A sum or a product by a constant combines forms, guarded case by guarded case. A quotient by a constant, cut toward
// zero, is a floor on each side of 0, and a remainder is what the quotient leaves. Of any integer, the bits from i
// to j are 2^i * floor(value / 2^i) - 2^j * floor(value / 2^j) in two's complement, whatever the sign (Warren,
// "Hacker's Delight", 2012); a mask is the sum of its runs of ones, and | and ^ follow from &. Any other operator on
// constants is computed. What remains becomes an unknown with what its operands say about 0.
//
// Floors are reduced, so that one floor has one unknown: whole multiples of the divisor are taken out of it, common
// divisors cancel, of its opposite directions one is used, and a floor of one floor is one floor.
#include "base/core/Limits.hpp"
#include "base/decide/ConditionReader.hpp"
#include "base/integer/ExactArithmetic.hpp"
#include "base/integer/IntegerSet.hpp"

#include <algorithm>
#include <cmath>

namespace VT {

namespace {

constexpr OperatorSet bitOps{SymbolicOp::BitAnd, SymbolicOp::BitOr, SymbolicOp::BitXOr};

/// A constant as a mask or a distance.
std::optional<std::int64_t> bitsOf(const RationalForm& form) {
    const LinearForm* small = form.small();
    const bool fits = small != nullptr && small->isConstant() && fitsInt(small->constant);
    return fits ? std::optional(small->constant) : std::nullopt;
}

} // namespace

ConditionReader::Value ConditionReader::arithmetic(const Frame& frame) {
    const std::size_t count = operands_.size() - frame.firstOperand;
    if (count == 0 || count > 2) {
        for (std::size_t i = 0; i < count; ++i)
            if (operand(frame, i).kind == Value::Kind::RealTerm)
                return {Value::Kind::RealTerm};
        return opaque(frame);
    }
    auto value = joined(frame.node->op(), operand(frame, 0), count == 2 ? &operand(frame, 1) : nullptr);
    return value ? *std::move(value) : opaque(frame);
}

/// What an operator makes of one or two values; nothing where that is an unknown of its own.
std::optional<ConditionReader::Value> ConditionReader::joined(SymbolicOp op, const Value& a, const Value* b) {
    using Kind = Value::Kind;
    const auto any = [&](auto is) { return is(a) || (b != nullptr && is(*b)); };
    if (any([](const Value& value) { return value.kind == Kind::RealTerm; }))
        return Value{Kind::RealTerm};
    const bool isReal = any([](const Value& value) { return value.isReal || value.kind == Kind::Real; });
    if (op == SymbolicOp::UnaryMinus && a.kind == Kind::Real)
        return ofReal(-a.real);
    if (b != nullptr && isReal)
        if (auto folded = ofLiterals(op, a, *b))
            return folded;
    if (any([](const Value& value) { return !std::isfinite(value.real); }))
        return Value{Kind::RealTerm};
    Value value{Kind::Number};
    value.isReal = isReal;
    value.isLiteral = a.isLiteral && (b != nullptr ? b->isLiteral : op == SymbolicOp::UnaryMinus);
    const Cases left = casesOf(a);
    const Cases right = b != nullptr ? casesOf(*b) : Cases{};
    bool isLinear = b != nullptr || op == SymbolicOp::UnaryMinus || !isReal;
    for (const Case& x : left) {
        if (b == nullptr)
            isLinear = isLinear && addUnary(value.cases, op, x);
        for (const Case& y : right) {
            steps_.take(1 + (x.form.size() + y.form.size()) / partsPerStep);
            isLinear = isLinear && value.cases.size() < limits::termCases &&
                       addBinary(value.cases, op, circuit_.both(x.guard, y.guard), x.form, y.form, isReal);
        }
        if (!isLinear)
            return isReal ? std::optional(Value{Kind::RealTerm}) : std::nullopt;
    }
    return value;
}

/// A long sum; what cannot be added up at once is joined from left to right.
ConditionReader::Value ConditionReader::sum(const Frame& frame) {
    std::vector<SymbolicOp> ops(operands_.size() - frame.firstOperand);
    const SymbolicExpr* node = frame.node;
    for (std::size_t i = ops.size(); i-- > 1; node = table_.get(node->getInput(0)))
        ops[i] = node->op();
    if (auto whole = addedUp(frame, ops))
        return *std::move(whole);
    std::optional<Value> value = operand(frame, 0);
    for (std::size_t i = 1; i < ops.size() && value; ++i)
        value = joined(ops[i], *value, &operand(frame, i));
    return value ? *std::move(value) : term(frame.id);
}

/// The sum of small forms without cases; nothing where there are others.
std::optional<ConditionReader::Value> ConditionReader::addedUp(const Frame& frame,
                                                               std::span<const SymbolicOp> ops) const {
    if (ops.size() > limits::systemUnknowns)
        return std::nullopt;
    std::vector<LinearPart> parts;
    LinearForm all;
    bool isLiteral = true;
    for (std::size_t i = 0; i < ops.size(); ++i) {
        const Value& value = operand(frame, i);
        isLiteral = isLiteral && value.isLiteral;
        const bool isPlain = value.kind == Value::Kind::Number && !value.isReal && value.cases.size() == 1;
        const LinearForm* form = isPlain ? value.cases.front().form.small() : nullptr;
        if (form == nullptr || value.cases.front().guard != always)
            return std::nullopt;
        steps_.take(1 + form->parts.size() / partsPerStep);
        const int sign = i > 0 && ops[i] == SymbolicOp::Minus ? -1 : 1;
        all.constant += sign * form->constant;
        for (const LinearPart& part : form->parts)
            parts.push_back({part.unknown, sign * part.factor});
    }
    if (parts.size() > limits::systemUnknowns)
        return std::nullopt;
    std::ranges::sort(parts, {}, &LinearPart::unknown);
    bool isSmall = isWithinBound(all.constant);
    for (auto part = parts.begin(); part != parts.end();) {
        LinearPart joined{part->unknown, 0};
        for (; part != parts.end() && part->unknown == joined.unknown; ++part)
            joined.factor += part->factor;
        isSmall = isSmall && isWithinBound(joined.factor);
        if (joined.factor != 0)
            all.parts.push_back(joined);
    }
    if (!isSmall)
        return std::nullopt;
    Value value{Value::Kind::Number};
    value.cases.push_back({always, std::move(all)});
    value.isLiteral = isLiteral;
    return value;
}

/// Two literals, one of them a real number, rounded as they are folded.  What is constant otherwise, like A-A+3, is not
/// a literal.
std::optional<ConditionReader::Value> ConditionReader::ofLiterals(SymbolicOp op, const Value& a, const Value& b) const {
    const auto literal = [&](const Value& value) -> std::optional<double> {
        if (value.kind == Value::Kind::Real)
            return value.real;
        const auto constant = value.isLiteral ? constantOf(value) : std::nullopt;
        const LinearForm* small = constant ? constant->small() : nullptr;
        return small != nullptr ? std::optional(static_cast<double>(small->constant)) : std::nullopt;
    };
    const auto left = literal(a);
    const auto right = literal(b);
    const auto folded = left && right ? foldedReals(op, *left, *right) : std::nullopt;
    return folded ? std::optional(ofReal(*folded)) : std::nullopt;
}

bool ConditionReader::addUnary(Cases& cases, SymbolicOp op, const Case& a) {
    std::optional<RationalForm> form;
    if (op == SymbolicOp::UnaryMinus)
        form = combine(a.form, -1, {}, 0);
    if (op == SymbolicOp::BitCompl && (!a.form.isConstant() || bitsOf(a.form))) { // -a - 1
        form = combine(a.form, -1, LinearForm{{}, -1}, 1);
    }
    if (form)
        addCase(cases, a.guard, *form);
    return form.has_value();
}

/// Adds `a op b` where the guard holds; false where that is not linear.
bool ConditionReader::addBinary(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& a, const RationalForm& b,
                                bool isReal) {
    if (guard == never)
        return true;
    const bool isQuotient = op == SymbolicOp::Divide || op == SymbolicOp::Modulo;
    const bool isShift = op == SymbolicOp::ShiftLeft || op == SymbolicOp::ShiftRight;
    std::optional<RationalForm> form;
    if (a.isConstant() && b.isConstant())
        form = exactResult(op, a, b, isReal);
    else if (op == SymbolicOp::Plus || op == SymbolicOp::Minus)
        form = combine(a, 1, b, op == SymbolicOp::Plus ? 1 : -1);
    else if (op == SymbolicOp::Multiply && (a.isConstant() || b.isConstant()))
        form = a.isConstant() ? multiply(b, a) : multiply(a, b);
    else if (isReal)
        form = op == SymbolicOp::Divide && b.isConstant() && b.sign() != 0 ? divide(a, b) : std::nullopt;
    else if (isQuotient && b.isConstant() && b.sign() != 0)
        return addQuotient(cases, op, guard, a, b);
    else if ((bitOps.contains(op) || isShift) && bitsOf(b))
        return addBits(cases, op, guard, a, *bitsOf(b));
    else if (bitOps.contains(op) && bitsOf(a))
        return addBits(cases, op, guard, b, *bitsOf(a));
    if (form)
        addCase(cases, guard, *form);
    return form.has_value();
}

/// A quotient is cut toward zero: a floor of what is not negative, the opposite of a floor elsewhere.
bool ConditionReader::addQuotient(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& a,
                                  const RationalForm& b) {
    const BigInteger divisor = b.integer().value();
    const BigInteger magnitude = abs(divisor);
    // Of 0 both sides are right, so that a quotient of a quotient is on the side of that.
    const Gate below = circuit_.both(guard, compare(SymbolicOp::LessThan, a));
    const bool isNeverAbove = below != never && circuit_.both(guard, compare(SymbolicOp::GreaterThan, a)) == never;
    const Gate above = isNeverAbove ? never : circuit_.both(guard, compare(SymbolicOp::GreaterThanEqual, a));
    for (const int sign : {1, -1}) {
        const Gate side = sign > 0 ? above : isNeverAbove ? guard : below;
        if (side == never)
            continue;
        const auto positive = combine(a, sign, {}, 0);
        const auto whole = positive ? floor(*positive, magnitude) : std::nullopt;
        auto form = whole ? scale(*whole, op == SymbolicOp::Modulo ? magnitude : BigInteger(divisor.sign()),
                                  sign) // of Modulo: what is taken from a
                          : std::nullopt;
        if (form && op == SymbolicOp::Modulo)
            form = combine(a, 1, *form, -1);
        if (!form)
            return false;
        addCase(cases, side, *form);
    }
    return true;
}

/// A mask or a shift by a constant; a shift to the left is a product of any size.
bool ConditionReader::addBits(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& form,
                              std::int64_t constant) {
    std::optional<RationalForm> bits;
    if (bitOps.contains(op)) {
        bits = masked(form, constant);
        const RationalForm mask(LinearForm{{}, constant});
        if (bits && op != SymbolicOp::BitAnd) { // a | m is a + m - (a & m), a ^ m is a + m - 2 * (a & m)
            const auto sum = combine(form, 1, mask, 1);
            bits = sum ? combine(*sum, 1, *bits, op == SymbolicOp::BitOr ? -1 : -2) : std::nullopt;
        }
    } else {
        const std::int64_t distance = op == SymbolicOp::ShiftLeft ? constant : -constant;
        const std::int64_t places = std::abs(distance); // of a literal
        if (places > static_cast<std::int64_t>(limits::formBits))
            return false;
        const BigInteger factor = BigInteger(1) << static_cast<unsigned>(places);
        bits = distance < 0 ? floor(form, factor) : scale(form, factor, 1);
    }
    if (bits)
        addCase(cases, guard, *bits);
    return bits.has_value();
}

// NOLINTNEXTLINE(misc-no-recursion): once
std::optional<RationalForm> ConditionReader::masked(const RationalForm& form, std::int64_t mask) {
    if (mask < 0) { // all but the other bits
        const auto others = masked(form, ~mask);
        return others ? combine(form, 1, *others, -1) : std::nullopt;
    }
    std::optional<RationalForm> sum = RationalForm();
    bool inside = false;
    for (unsigned bit = 0; sum && bit < 32; ++bit) { // bit 31 of a mask is 0 and ends its last run
        const bool next = (static_cast<std::uint64_t>(mask) >> bit & 1U) != 0;
        if (next != inside) {
            const BigInteger power = BigInteger(1) << bit;
            const auto above = floor(form, power);
            const auto part = above ? scale(*above, next ? power : BigInteger(-power), 1) : std::nullopt;
            sum = part ? combine(*sum, 1, *part, 1) : std::nullopt;
        }
        inside = next;
    }
    return sum;
}

/// Whether a sum is replaced by its opposite, so that one of the two is in use: factors add up to more than 0, or else
/// the first that is met is positive.  Neither names nor what was read before have a say in it.
bool ConditionReader::isOpposed(std::span<const WidePart> parts) {
    BigInteger total = 0;
    for (const WidePart& part : parts)
        total += part.factor;
    if (total != 0 || parts.empty())
        return total < 0;
    for (const Unknown unknown : met_) {
        steps_.take();
        const auto part = std::ranges::lower_bound(parts, unknown, {}, &WidePart::unknown);
        if (part != parts.end() && part->unknown == unknown)
            return part->factor < 0;
    }
    return false;
}

/// The whole part of a form of integers divided by a positive constant.
std::optional<RationalForm> ConditionReader::floor(const RationalForm& form, const BigInteger& divisor) {
    if (divisor == 1)
        return form;
    const WideForm wide = form.widened();
    charge(wide);
    WideForm whole;
    FloorOf rest{{}, divisor};
    BigInteger common = divisor;
    for (const WidePart& part : wide.parts) {
        BigInteger quotient = VT::floorDivide(BigInteger(2 * part.factor + divisor - 1), BigInteger(2 * divisor));
        BigInteger remainder = part.factor - quotient * divisor; // at most half the divisor, up or down
        if (wide.parts.size() == 1 && part.factor < 0 && 2 * remainder == divisor) { // -X / 2 is like X / 2
            remainder -= divisor;
            ++quotient;
        }
        if (quotient != 0)
            whole.parts.push_back({part.unknown, std::move(quotient)});
        if (remainder == 0)
            continue;
        rest.form.parts.push_back({part.unknown, remainder});
        common = gcd(common, remainder);
    }
    // floor((c * r + k) / (c * d)) = floor((r + floor(k / c)) / d)
    rest.form.constant = VT::floorDivide(wide.constant, common);
    rest.divisor /= common;
    for (WidePart& part : rest.form.parts)
        part.factor /= common;
    const bool opposed = isOpposed(rest.form.parts);
    if (opposed) { // floor(f / d) = -floor((-f + d - 1) / d)
        for (WidePart& part : rest.form.parts)
            part.factor = -part.factor;
        rest.form.constant = rest.divisor - 1 - rest.form.constant;
    }
    const int sign = opposed ? -1 : 1;
    const BigInteger shift = VT::floorDivide(rest.form.constant, rest.divisor);
    rest.form.constant -= shift * rest.divisor;
    whole.constant = shift * sign;
    if (rest.form.parts.empty())
        return scale(RationalForm(std::move(whole)), 1, 1);
    if (rest.form.parts.size() == 1 && rest.form.parts.front().factor == 1 &&
        isFloor(rest.form.parts.front().unknown)) { // floor((floor(f / d) + k) / e) = floor((f + k * d) / (d * e))
        const FloorOf& inner = *unknowns_[rest.form.parts.front().unknown].floor;
        BigInteger product = inner.divisor * rest.divisor;
        if (msb(product) < limits::formBits) {
            BigInteger constant = inner.form.constant + rest.form.constant * inner.divisor;
            rest = {inner.form, std::move(product)};
            rest.form.constant = std::move(constant);
            charge(rest.form);
        }
    }
    const Unknown unknown = unknowns_.floor(std::move(rest));
    met_.push_back(unknown);
    return combine(RationalForm(std::move(whole)), 1, LinearForm{{{unknown, 1}}, 0}, sign);
}

std::optional<RationalForm> ConditionReader::constantOf(const Value& value) const {
    const bool one = value.kind == Value::Kind::Number && value.cases.size() == 1;
    return one && value.cases[0].form.isConstant() ? std::optional(value.cases[0].form) : std::nullopt;
}

/// An unknown of its own for a node. A product is 0 where a factor is, bits joined by | where all are, bits joined by &
/// at least where an operand is.
ConditionReader::Value ConditionReader::opaque(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    Value value = term(frame.id);
    if (op != SymbolicOp::Multiply && op != SymbolicOp::BitOr && op != SymbolicOp::BitAnd)
        return value;
    const Gate a = truthOf(operands_[frame.firstOperand]);
    const Gate b = truthOf(operands_[frame.firstOperand + 1]);
    if (op == SymbolicOp::BitOr) {
        value.nonZero = circuit_.either(a, b);
        return value;
    }
    const Gate both = circuit_.both(a, b);
    if (op == SymbolicOp::Multiply) {
        value.nonZero = both;
        return value;
    }
    Value cases{Value::Kind::Number};
    addCase(cases.cases, both, value.cases.front().form);
    addCase(cases.cases, opposite(both), {});
    return cases;
}

ConditionReader::Value ConditionReader::term(SymbolicExprId node) {
    Value value{Value::Kind::Number};
    const Unknown unknown = unknowns_.term(node, minusInfinite, plusInfinite);
    met_.push_back(unknown);
    value.cases.push_back({always, LinearForm{{{unknown, 1}}, 0}});
    return value;
}

} // namespace VT
