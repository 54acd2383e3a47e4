// Reads comparisons as constraints: linear terms restricted to sets of integers.
//
// Both sides are read as linear forms, their difference is divided by the greatest common divisor of its factors,
// and the bound is rounded to the integers that are left.  Forms are kept by node.
// Cost: linear in the nodes that were not read before.
// Relies on: exact 64-bit steps (ExactArithmetic); a form beyond the bound of linear forms becomes an unknown.
#include "base/decide/shorten/ComparedTerms.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <utility>

namespace VT {

namespace {

constexpr Atom noAtom = ~Atom{0};
constexpr SymbolicExprId simulation = invalidId - 1; ///< for both keywords

const IntegerSet zero = IntegerSet::point(0);
const IntegerSet nonZero = IntegerSet::allBut(0);

IntegerSet truth(bool holds) {
    return holds ? IntegerSet::all() : IntegerSet();
}

/// A form times a power of two.
std::optional<LinearForm> shiftedLeft(const LinearForm& form, std::int64_t places) {
    const auto power = places < 0 ? std::nullopt : integerResult(SymbolicOp::ShiftLeft, 1, places);
    return power && isWithinBound(*power) ? combine(form, *power, {}, 0) : std::nullopt;
}

} // namespace

ComparedTerms::ComparedTerms(SymbolicExprTable& table, const SymbolicExprPrinter& printer, bool keywordsInForce)
    : table_(table),
      printer_(printer),
      leafReader_(table, keywordsInForce) {}

// Numbers.

Unknown ComparedTerms::unknownOf(SymbolicExprId node, bool plain) {
    if (const Unknown* known = byNode_.find(node))
        return *known;
    unknowns_.push_back({node, plain, noAtom});
    return byNode_.insert(node, static_cast<Unknown>(unknowns_.size() - 1));
}

/// The number of what has no operands to look at; nothing for arithmetic.
std::optional<ComparedTerms::Number> ComparedTerms::leafNumber(SymbolicExprId id) {
    const LeafMeaning meaning = leafReader_(id);
    switch (meaning.kind) {
    case LeafMeaning::Kind::Integer:
        return Number{Number::Kind::Linear, {{}, meaning.integer}};
    case LeafMeaning::Kind::Real:
        return Number{Number::Kind::Real, {}, meaning.real};
    case LeafMeaning::Kind::Free:
        return Number{Number::Kind::Linear, {{{unknownOf(meaning.node, true), 1}}, 0}};
    case LeafMeaning::Kind::Compound:
        if (!booleanOps.contains(table_.get(id)->op()))
            return std::nullopt;
        break;
    default:
        break;
    }
    return Number{Number::Kind::Linear, {{{unknownOf(id, false), 1}}, 0}};
}

ComparedTerms::Number ComparedTerms::numberOf(SymbolicExprId root) {
    if (const Number* known = numbers_.find(root))
        return *known;
    if (!table_.has(root))
        return {Number::Kind::Missing};
    if (auto leaf = leafNumber(root))
        return *leaf;
    bool missing = false;
    std::vector<WalkFrame> stack;
    walkUnknown(
        table_, root, stack,
        [&](SymbolicExprId id, const SymbolicExpr*) {
            if (numbers_.find(id) != nullptr)
                return true;
            auto leaf = leafNumber(id);
            if (leaf)
                numbers_.insert(id, *std::move(leaf));
            return numbers_.find(id) != nullptr;
        },
        [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr*) {
            if (!missing)
                numbers_.insert(id, compute(id, node));
        },
        [&](SymbolicExprId, const SymbolicExpr*) { missing = true; });
    return missing ? Number{Number::Kind::Missing} : *numbers_.find(root);
}

ComparedTerms::Number ComparedTerms::compute(SymbolicExprId id, const SymbolicExpr& node) {
    const SymbolicOp op = node.op();
    Number opaque{Number::Kind::Linear, {{{unknownOf(id, false), 1}}, 0}};
    const std::size_t count = node.getNumInputs();
    for (std::size_t i = 0; i < count; ++i) {
        const Number& operand = *numbers_.find(node.getInput(i));
        if (operand.kind == Number::Kind::Real && op == SymbolicOp::UnaryMinus)
            return {Number::Kind::Real, {}, -operand.real};
        if (operand.kind != Number::Kind::Linear)
            return {Number::Kind::RealTerm};
    }
    if (count == 0 || count > 2)
        return opaque;
    const LinearForm& a = numbers_.find(node.getInput(0))->form;
    const LinearForm& b = numbers_.find(node.getInput(count - 1))->form;
    const std::size_t parts = a.parts.size() + b.parts.size();
    if (parts > partsLeft_)
        return opaque;
    partsLeft_ -= parts;
    std::optional<LinearForm> form;
    if (count == 1 && op == SymbolicOp::UnaryMinus)
        form = combine(a, -1, {}, 0);
    else if (count == 2 && (op == SymbolicOp::Plus || op == SymbolicOp::Minus))
        form = combine(a, 1, b, op == SymbolicOp::Plus ? 1 : -1);
    else if (op == SymbolicOp::Multiply && (a.isConstant() || b.isConstant()))
        form = a.isConstant() ? combine(b, a.constant, {}, 0) : combine(a, b.constant, {}, 0);
    else if (op == SymbolicOp::ShiftLeft && !a.isConstant() && b.isConstant())
        form = shiftedLeft(a, b.constant);
    else if (a.isConstant() && b.isConstant()) {
        if (const auto value = count == 1 ? integerResult(op, a.constant) : integerResult(op, a.constant, b.constant);
            value && isWithinBound(*value))
            form = LinearForm{{}, *value};
    }
    return form ? Number{Number::Kind::Linear, *std::move(form)} : opaque;
}

std::optional<double> ComparedTerms::constant(SymbolicExprId node) {
    const Number number = numberOf(node);
    if (number.kind == Number::Kind::Real)
        return number.real;
    const bool isInteger = number.kind == Number::Kind::Linear && number.form.isConstant();
    return isInteger ? std::optional(static_cast<double>(number.form.constant)) : std::nullopt;
}

// Constraints.

Atom ComparedTerms::atomOf(const LinearParts& parts) {
    const bool plain =
        std::ranges::all_of(parts, [&](const LinearPart& part) { return unknowns_[part.unknown].plain; });
    if (parts.size() == 1) {
        Atom& atom = unknowns_[parts.front().unknown].atom;
        if (atom == noAtom) {
            atom = static_cast<Atom>(entries_.size());
            entries_.push_back({parts, invalidId, plain});
        }
        return atom;
    }
    const auto same = std::ranges::find_if(sums_, [&](Atom atom) { return entries_[atom].parts == parts; });
    if (same != sums_.end())
        return *same;
    sums_.push_back(static_cast<Atom>(entries_.size()));
    entries_.push_back({parts, invalidId, plain});
    return sums_.back();
}

/// Remembers a leaf as a way to write its constraint.
Constraint ComparedTerms::enter(Atom atom, IntegerSet set, SymbolicExprId leaf) {
    Constraint constraint{atom, std::move(set)};
    SymbolicExprId& form = known_.try_emplace(constraint, leaf).first->second;
    if (form != leaf && printer_.textLength(leaf) < printer_.textLength(form))
        form = leaf;
    return constraint;
}

/// A truth value of its own.
Constraint ComparedTerms::truthOf(SymbolicExprId own, bool positive, SymbolicExprId leaf) {
    const Atom* known = truths_.find(own);
    if (known == nullptr) {
        entries_.push_back({{}, own, own == simulation});
        known = &truths_.insert(own, static_cast<Atom>(entries_.size() - 1));
    }
    return enter(*known, positive ? nonZero : zero, leaf);
}

std::optional<Constraint> ComparedTerms::read(SymbolicExprId leaf) {
    if (!table_.has(leaf))
        return std::nullopt;
    const LeafMeaning meaning = leafReader_(leaf);
    switch (meaning.kind) {
    case LeafMeaning::Kind::Integer:
        return Constraint{0, truth(meaning.integer != 0)};
    case LeafMeaning::Kind::Real:
        return Constraint{0, truth(meaning.real != 0)};
    case LeafMeaning::Kind::Simulation:
    case LeafMeaning::Kind::CodeGeneration:
        return truthOf(simulation, meaning.kind == LeafMeaning::Kind::Simulation, leaf);
    default:
        break;
    }
    const SymbolicOp op = table_.get(leaf)->op();
    if (meaning.kind == LeafMeaning::Kind::Compound && comparisonOps.contains(op))
        return readComparison(leaf, op);
    const Number number = numberOf(leaf);
    if (number.kind == Number::Kind::Missing)
        return std::nullopt;
    if (number.kind == Number::Kind::Real)
        return Constraint{0, truth(number.real != 0)};
    if (number.kind == Number::Kind::RealTerm)
        return truthOf(leaf, true, leaf);
    return restriction(leaf, SymbolicOp::NotEqual, number.form);
}

std::optional<Constraint> ComparedTerms::readComparison(SymbolicExprId leaf, SymbolicOp op) {
    using Kind = Number::Kind;
    Number a = numberOf(table_.get(leaf)->getInput(0));
    Number b = numberOf(table_.get(leaf)->getInput(1));
    if (a.kind == Kind::Missing || b.kind == Kind::Missing)
        return std::nullopt;
    if (a.kind == Kind::Real && b.kind == Kind::Real)
        return Constraint{0, truth(compareNumbers(op, a.real, b.real))};
    if (a.kind == Kind::Real) {
        std::swap(a, b);
        op = operatorInfo(op).mirrored;
    }
    if (a.kind == Kind::RealTerm || b.kind == Kind::RealTerm)
        return truthOf(leaf, true, leaf);
    if (b.kind == Kind::Linear) {
        const auto form = combine(a.form, 1, b.form, -1);
        return form ? restriction(leaf, op, *form) : truthOf(leaf, true, leaf);
    }
    if (a.form.isConstant())
        return Constraint{0, truth(compareExactly(op, a.form.constant, b.real))};
    if (!std::isfinite(b.real))
        return Constraint{0, truth(compareExactly(op, 0, b.real))};
    if (std::fabs(b.real) > static_cast<double>(limits::formNumber))
        return truthOf(leaf, true, leaf);
    // Between two integers: at most the lower one, or at least the upper one.
    const auto whole = static_cast<std::int64_t>(std::floor(b.real));
    if (static_cast<double>(whole) != b.real) {
        if (op == SymbolicOp::Equal || op == SymbolicOp::NotEqual)
            return Constraint{0, truth(op == SymbolicOp::NotEqual)};
        op = op == SymbolicOp::LessThan || op == SymbolicOp::LessThanEqual ? SymbolicOp::LessThanEqual
                                                                           : SymbolicOp::GreaterThan;
    }
    const auto form = combine(a.form, 1, {{}, whole}, -1);
    return form ? restriction(leaf, op, *form) : truthOf(leaf, true, leaf);
}

/// Where `form op 0` holds.
Constraint ComparedTerms::restriction(SymbolicExprId leaf, SymbolicOp op, const LinearForm& form) {
    if (form.isConstant())
        return {0, truth(compareNumbers(op, form.constant, std::int64_t{0}))};
    LinearParts parts(form.parts);
    std::int64_t factor = 0;
    for (const LinearPart& part : parts)
        factor = std::gcd(factor, part.factor);
    if (parts.front().factor < 0)
        factor = -factor;
    for (LinearPart& part : parts)
        part.factor /= factor;
    if (factor < 0)
        op = operatorInfo(op).mirrored;
    // |factor| * atom op right
    const std::int64_t right = factor < 0 ? form.constant : -form.constant;
    const std::int64_t divisor = std::abs(factor);
    IntegerSet set;
    switch (op) {
    case SymbolicOp::Equal:
    case SymbolicOp::NotEqual:
        if (right % divisor == 0)
            set = IntegerSet::point(right / divisor);
        if (op == SymbolicOp::NotEqual)
            set = set.complement();
        break;
    case SymbolicOp::LessThan:
    case SymbolicOp::LessThanEqual:
        set = {IntegerSet::minusInfinity, floorDivide(op == SymbolicOp::LessThan ? right - 1 : right, divisor)};
        break;
    default: {
        const std::int64_t below = op == SymbolicOp::GreaterThan ? right : right - 1;
        set = {floorDivide(below, divisor) + 1, IntegerSet::plusInfinity};
        break;
    }
    }
    if (set.empty() || set.isAll())
        return {0, set};
    const Atom atom = atomOf(parts);
    Constraint constraint = enter(atom, set, leaf);
    // The same with the atom alone on the left, where that is shorter.
    const SymbolicExpr& node = *table_.get(leaf);
    const SymbolicExprId single = parts.size() == 1 ? unknowns_[parts.front().unknown].node : invalidId;
    const bool isComparison = comparisonOps.contains(node.op());
    if (leaf == single ||
        (isComparison && node.getInput(0) == single && table_.get(node.getInput(1))->op() == SymbolicOp::IntValue))
        return constraint;
    const bool strict = op == SymbolicOp::LessThan || op == SymbolicOp::GreaterThan;
    if (const SymbolicExprId alone = compose(atom, set, strict); alone != invalidId)
        enter(atom, std::move(set), alone);
    return constraint;
}

} // namespace VT
