// Reads comparisons as constraints and writes covers as sums of products.
//
// A literal that was read is written again wherever its constraint is; of several that mean the same the first by text.
// Other constraints are written as the fewest comparisons: bounds as <= and >=, missing integers as ~=.
// Cost: a search among a few literals, or a map look-up, for each; sorting operands by text for each product and sum.
// Relies on: RuleContext::resolve for bound members, mayBeReal for what is not an integer.
#include "base/simplify/Atoms.hpp"

#include "base/core/Chains.hpp"

#include <algorithm>

namespace VT {

namespace {

const IntegerSet zero = IntegerSet::point(0);
const IntegerSet nonZero = IntegerSet::allBut(0);

} // namespace

// From nodes to constraints.

Atom Atoms::atomOf(const Key& key, SymbolicExprId left, SymbolicExprId right) {
    const auto next = static_cast<Atom>(entries_.size());
    for (Atom atom = 0; atom < next && atom < few; ++atom)
        if (entries_[atom].key == key)
            return atom;
    const Atom atom = next < few ? next : byKey_.try_emplace(key, next).first->second;
    if (atom == next)
        entries_.push_back({key, left, right});
    return atom;
}

/// The literal that writes a constraint: the given one where there was none.
SymbolicExprId& Atoms::formOf(const Constraint& constraint, SymbolicExprId literal) {
    const auto at = std::ranges::find(forms_, constraint, &Form::constraint);
    if (at != forms_.end())
        return at->literal;
    if (forms_.size() < few)
        return forms_.emplace_back(Form{constraint, literal}).literal;
    return furtherForms_.try_emplace(constraint, literal).first->second;
}

Constraint Atoms::enter(const Key& key, SymbolicExprId left, SymbolicExprId right, IntegerSet set,
                        SymbolicExprId literal) {
    Constraint constraint{atomOf(key, left, right), std::move(set)};
    SymbolicExprId& form = formOf(constraint, literal);
    if (form != literal && context_.sortsBefore(literal, form))
        form = literal;
    return constraint;
}

Constraint Atoms::readComparison(SymbolicExprId literal, const SymbolicBinaryExpr& comparison) {
    const SymbolicOp op = comparison.op();
    const SymbolicExprId left = context_.resolve(comparison.left());
    const SymbolicExprId right = context_.resolve(comparison.right());
    const std::optional<int> constant = context_.integer(right);
    if (constant && !context_.mayBeReal(left))
        return enter({left, invalidId, SymbolicOp::None}, comparison.left(), invalidId,
                     IntegerSet::satisfying(op, *constant), literal);
    if (!context_.isNumber(right) && !context_.isNumber(left))
        return enter({left, right, SymbolicOp::None}, comparison.left(), comparison.right(),
                     IntegerSet::satisfying(op, 0), literal);
    const bool negative = op == SymbolicOp::NotEqual || op == SymbolicOp::LessThan || op == SymbolicOp::GreaterThan;
    const SymbolicOp positive = negative ? operatorInfo(op).negated : op;
    return enter({left, right, positive}, comparison.left(), comparison.right(), negative ? zero : nonZero, literal);
}

Constraint Atoms::read(SymbolicExprId literal) {
    SymbolicExprId value = literal;
    bool holds = true;
    while (context_.op(value) == SymbolicOp::Not) {
        value = static_cast<const SymbolicNotExpr&>(context_.node(value)).operand();
        holds = !holds;
    }
    if (comparisonOps.contains(context_.op(value)) && holds && value == literal)
        return readComparison(literal, static_cast<const SymbolicBinaryExpr&>(context_.node(value)));
    if (context_.isSimKeyword(value) || context_.isCodegenKeyword(value)) {
        // The two keywords are one truth value and its opposite.
        const bool simulation = context_.isSimKeyword(value) == holds;
        return enter({invalidId, invalidId, SymbolicOp::None}, value, invalidId, simulation ? nonZero : zero, literal);
    }
    const Key key{context_.resolve(value), invalidId, SymbolicOp::None};
    return enter(key, value, invalidId, holds ? nonZero : zero, literal);
}

bool Atoms::readProduct(SymbolicExprId product, Cube& cube) {
    if (context_.op(product) != SymbolicOp::And) {
        const Constraint constraint = read(product);
        return cube.restrict(constraint.atom, constraint.set);
    }
    bool repeated = false;
    bool possible = true;
    for (const SymbolicExprId factor : chainOperands(context_, SymbolicOp::And, product, repeated)) {
        const Constraint constraint = read(factor);
        possible = possible && cube.restrict(constraint.atom, constraint.set);
    }
    return possible;
}

// From constraints to nodes.

SymbolicExprId Atoms::known(const Constraint& constraint) const {
    const auto at = std::ranges::find(forms_, constraint, &Form::constraint);
    if (at != forms_.end())
        return at->literal;
    const auto further = furtherForms_.empty() ? furtherForms_.end() : furtherForms_.find(constraint);
    return further == furtherForms_.end() ? invalidId : further->second;
}

SymbolicExprId Atoms::compare(const Entry& entry, SymbolicOp op, std::int64_t constant) {
    if (entry.right != invalidId)
        return context_.makeBinary(op, entry.left, entry.right);
    const SymbolicExprId value = context_.make<SymbolicIntValue>(static_cast<int>(constant));
    return context_.makeBinary(op, entry.left, value);
}

/// A ray as one comparison.  Bounds of a difference are written against 0, others as <= and >= where the constant has
/// 32 bits.
SymbolicExprId Atoms::ray(const Entry& entry, const IntegerSet& set) {
    const bool upward = set.high() == IntegerSet::plusInfinity;
    const std::int64_t bound = upward ? set.low() : set.high();
    const std::int64_t beyond = upward ? bound - 1 : bound + 1;
    const bool strict = entry.right != invalidId ? bound != 0 : !fitsInt(bound);
    if (strict)
        return compare(entry, upward ? SymbolicOp::GreaterThan : SymbolicOp::LessThan, beyond);
    return compare(entry, upward ? SymbolicOp::GreaterThanEqual : SymbolicOp::LessThanEqual, bound);
}

/// A value that is no comparison, negated; Not(y) becomes y.
SymbolicExprId Atoms::negateTruth(SymbolicExprId value) {
    const SymbolicExpr& node = context_.node(value);
    if (node.op() == SymbolicOp::Not)
        return static_cast<const SymbolicNotExpr&>(node).operand();
    return context_.make<SymbolicNotExpr>(value);
}

/// A set that one comparison describes.
SymbolicExprId Atoms::single(const Constraint& constraint) {
    if (const SymbolicExprId literal = known(constraint); literal != invalidId)
        return literal;
    const Entry& entry = entries_[constraint.atom];
    const IntegerSet& set = constraint.set;
    if (set == zero || set == nonZero) {
        const SymbolicOp realComparison = std::get<SymbolicOp>(entry.key);
        if (realComparison != SymbolicOp::None)
            return compare(entry, set == nonZero ? realComparison : operatorInfo(realComparison).negated, 0);
        const SymbolicExprId opposite = known({constraint.atom, set.complement()});
        if (opposite != invalidId && !comparisonOps.contains(context_.op(opposite)))
            return negateTruth(opposite);
    }
    if (set.low() == set.high())
        return compare(entry, SymbolicOp::Equal, set.low());
    if (set.intervals().size() == 2)
        return compare(entry, SymbolicOp::NotEqual, set.intervals()[0].high + 1);
    return ray(entry, set);
}

void Atoms::write(const Constraint& constraint, Ids& out) {
    const auto& [atom, set] = constraint;
    if (set.comparisons() == 1) {
        out.push_back(single(constraint));
        return;
    }
    if (set.low() != IntegerSet::minusInfinity)
        out.push_back(single({atom, {set.low(), IntegerSet::plusInfinity}}));
    if (set.high() != IntegerSet::plusInfinity)
        out.push_back(single({atom, {IntegerSet::minusInfinity, set.high()}}));
    for (const std::int64_t hole : set.holes())
        out.push_back(single({atom, IntegerSet::allBut(hole)}));
}

SymbolicExprId Atoms::sortedChain(SymbolicOp op, Ids& operands) {
    const std::span<SymbolicExprId> all(operands.data(), operands.size());
    context_.sort(all);
    return foldLeft(context_, op, all);
}

SymbolicExprId Atoms::write(const Cover& cover) {
    Ids products;
    Ids factors;
    for (const Cube& cube : cover) {
        factors.clear();
        for (const Constraint& constraint : cube.constraints())
            write(constraint, factors);
        if (factors.empty())
            return context_.truth(true);
        products.push_back(sortedChain(SymbolicOp::And, factors));
    }
    if (products.empty())
        return context_.truth(false);
    return sortedChain(SymbolicOp::Or, products);
}

// Chains.

std::vector<SymbolicExprId> chainOperands(const RuleContext& context, SymbolicOp op, SymbolicExprId root,
                                          bool& repeated) {
    constexpr std::size_t usual = 8;
    std::vector<SymbolicExprId> operands;
    operands.reserve(usual);
    walkDistinctChain(
        context.table(), root, anyNumber, [op](SymbolicExprId, const SymbolicExpr& link) { return link.op() == op; },
        [&](SymbolicExprId id, const SymbolicExpr*) {
            operands.push_back(id);
            return true;
        },
        [&](SymbolicExprId) { repeated = true; });
    return operands;
}

SymbolicExprId foldLeft(RuleContext& context, SymbolicOp op, std::span<const SymbolicExprId> operands) {
    return makeChain(context.table(), op, operands);
}

} // namespace VT
