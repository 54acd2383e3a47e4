// Reads conditions bottom-up with an explicit stack and builds their diagrams.
//
// Every node is read once; a chain of one operator is read as a whole and its operands are joined pairwise. Strict and
// unequal comparisons are read as the opposite of the comparison that they negate, so that only three operators build
// diagrams. One step for each operand, plus those of the diagrams.
#include "base/decide/ConditionReader.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Walk.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <tuple>

namespace VT {

namespace {

constexpr OperatorSet chainOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};

} // namespace

ConditionReader::ConditionReader(const LeafReader& leaves, Unknowns& unknowns, Diagrams& diagrams, Steps& steps)
    : leafReader_(leaves),
      table_(leaves.table()),
      unknowns_(unknowns),
      diagrams_(diagrams),
      steps_(steps) {}

bool comesBefore(const Unknowns& unknowns, const UnknownLeaf& a, const UnknownLeaf& b) {
    if (a.unknown != b.unknown)
        return unknowns.before(a.unknown, b.unknown);
    return a.opposite != b.opposite ? a.opposite : a.node < b.node;
}

// The walk.

ReadCondition ConditionReader::read(SymbolicExprId condition) {
    read_.clear();
    values_.clear();
    frames_.clear();
    operands_.clear();
    leaves_.clear();
    whole_.clear();
    missing_ = !table_.isPlain() && !isWhole(condition); // elsewhere nodes may lead in circles
    if (!missing_ && !enter(condition)) {
        while (!frames_.empty() && !missing_) {
            Frame& top = frames_.back();
            if (top.next < operands_.size()) {
                enter(operands_[top.next++]);
                continue;
            }
            const Frame done = top;
            store(done.id, compute(done));
            operands_.resize(done.firstOperand);
            frames_.pop_back();
        }
    }
    ReadCondition result;
    if (missing_) {
        result.bound = DecisionBound::NoCondition;
        return result;
    }
    result.truth = truthOf(condition);
    std::ranges::sort(leaves_,
                      [&](const UnknownLeaf& x, const UnknownLeaf& y) { return comesBefore(unknowns_, x, y); });
    result.leaves.assign(leaves_.begin(), std::unique(leaves_.begin(), leaves_.end()));
    return result;
}

/// Whether the node needs no frame: it was read before, is a leaf or is missing.
bool ConditionReader::enter(SymbolicExprId id) {
    steps_.take();
    if (!table_.has(id)) {
        missing_ = true;
        return true;
    }
    if (read_.find(id) != nullptr)
        return true;
    if (const LeafMeaning meaning = leafReader_(id); meaning.kind != LeafMeaning::Kind::Compound) {
        // A call or a member is known by its text, which needs all of its operands.
        missing_ = !isWhole(meaning.kind == LeafMeaning::Kind::Free ? meaning.node : id);
        if (missing_)
            return true;
        store(id, leaf(id, meaning));
        return true;
    }
    const SymbolicExpr* node = table_.get(id);
    const std::size_t first = operands_.size();
    if (chainOps.contains(node->op())) {
        collectChain(node->op(), id);
    } else {
        for (std::size_t i = 0; i < node->getNumInputs(); ++i) {
            operands_.push_back(node->getInput(i));
            missing_ = missing_ || !table_.hasOperand(id, operands_.back());
        }
    }
    frames_.push_back({id, node, first, first});
    return false;
}

/// Whether no operand is missing in a node and below it.
bool ConditionReader::isWhole(SymbolicExprId id) {
    if (table_.get(id)->getNumInputs() == 0)
        return true;
    bool whole = true;
    std::vector<WalkFrame> stack;
    walkUnknown(
        table_, id, stack,
        [&](SymbolicExprId met, const SymbolicExpr*) {
            steps_.take();
            return whole_.find(met) != nullptr;
        },
        [&](SymbolicExprId visited, const SymbolicExpr&, const SymbolicExpr*) { whole_.insert(visited, true); },
        [&](SymbolicExprId, const SymbolicExpr*) { whole = false; });
    return whole;
}

/// Appends the operands of a chain, each once, in the order of the tree.
void ConditionReader::collectChain(SymbolicOp op, SymbolicExprId root) {
    walkDistinctChain(
        table_, root, anyNumber,
        [&](SymbolicExprId id, const SymbolicExpr& node) {
            steps_.take();
            return node.op() == op && (id == root || read_.find(id) == nullptr);
        },
        [&](SymbolicExprId id, const SymbolicExpr* node) {
            missing_ = node == nullptr;
            operands_.push_back(id);
            return !missing_;
        },
        [](SymbolicExprId) {});
}

void ConditionReader::store(SymbolicExprId id, Value value) {
    values_.push_back(std::move(value));
    read_.insert(id, static_cast<std::uint32_t>(values_.size() - 1));
}

// Leaves and operators.

ConditionReader::Value ConditionReader::ofNumber(std::int64_t number) {
    Value value{Value::Kind::Number, never, 0, {}, {}};
    value.cases.push_back({always, {{}, number}});
    return value;
}

ConditionReader::Value ConditionReader::leaf(SymbolicExprId id, const LeafMeaning& meaning) {
    using Kind = LeafMeaning::Kind;
    switch (meaning.kind) {
    case Kind::Integer:
        return ofNumber(meaning.integer);
    case Kind::Real:
        return {Value::Kind::Real, never, meaning.real, {}, {}};
    case Kind::Simulation:
    case Kind::CodeGeneration: {
        const Unknown simulation = unknowns_.simulation();
        const bool opposed = meaning.kind == Kind::CodeGeneration;
        leaves_.push_back({meaning.node, simulation, opposed});
        const Diagram holds = diagrams_.between(unknowns_[simulation].quantity, 1, 1);
        return ofTruth(opposed ? opposite(holds) : holds);
    }
    case Kind::Free: {
        const Unknown unknown = unknowns_.free(meaning.node);
        leaves_.push_back({meaning.node, unknown, false});
        Value value{Value::Kind::Number, never, 0, {}, {}};
        value.cases.push_back({always, {{{unknown, 1}}, 0}});
        return value;
    }
    default:
        return term(id, minusInfinite, plusInfinite);
    }
}

ConditionReader::Value ConditionReader::compute(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    if (chainOps.contains(op))
        return chain(frame);
    if (comparisonOps.contains(op))
        return comparison(frame);
    if (op == SymbolicOp::Not)
        return ofTruth(opposite(truthOf(operands_[frame.firstOperand])));
    return arithmetic(frame);
}

ConditionReader::Value ConditionReader::chain(const Frame& frame) {
    folded_.clear();
    for (std::size_t i = frame.firstOperand; i < operands_.size(); ++i)
        folded_.push_back(truthOf(operands_[i]));
    const bool conjunction = frame.node->op() == SymbolicOp::And || frame.node->op() == SymbolicOp::SingleAnd;
    return ofTruth(conjunction ? diagrams_.all(folded_) : diagrams_.any(folded_));
}

Diagram ConditionReader::truthOf(SymbolicExprId id) {
    const Value& value = valueOf(id);
    switch (value.kind) {
    case Value::Kind::Truth:
        return value.truth;
    case Value::Kind::Real:
        return value.real != 0 ? always : never; // NaN is no zero
    case Value::Kind::RealTerm:
        return diagrams_.between(unknowns_[unknowns_.term(id, 0, 1)].quantity, 1, 1);
    default: {
        if (value.nonZero)
            return *value.nonZero;
        Diagram truth = never;
        for (const Case& each : value.cases)
            truth = diagrams_.either(truth, diagrams_.both(each.guard, compare(SymbolicOp::NotEqual, each.form)));
        return truth;
    }
    }
}

ConditionReader::Cases ConditionReader::casesOf(const Value& value) const {
    if (value.kind != Value::Kind::Truth)
        return value.cases;
    Cases cases;
    if (value.truth != never)
        cases.push_back({value.truth, {{}, 1}});
    if (value.truth != always)
        cases.push_back({opposite(value.truth), {{}, 0}});
    return cases;
}

void ConditionReader::addCase(Cases& cases, Diagram guard, const LinearForm& form) {
    if (guard == never)
        return;
    const auto known = std::ranges::find(cases, form, &Case::form);
    if (known != cases.end()) {
        known->guard = diagrams_.either(known->guard, guard);
        return;
    }
    cases.push_back({guard, form});
}

// Comparisons.

ConditionReader::Value ConditionReader::comparison(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    const Value& a = operand(frame, 0);
    const Value& b = operand(frame, 1);
    using Kind = Value::Kind;
    if (a.kind == Kind::RealTerm || b.kind == Kind::RealTerm)
        return ofTruth(diagrams_.between(unknowns_[unknowns_.term(frame.id, 0, 1)].quantity, 1, 1));
    if (a.kind == Kind::Real && b.kind == Kind::Real)
        return ofTruth(compareNumbers(op, a.real, b.real) ? always : never);
    Diagram truth = never;
    if (a.kind == Kind::Real || b.kind == Kind::Real) {
        const bool swapped = a.kind == Kind::Real;
        for (const Case& each : casesOf(swapped ? b : a)) {
            const auto holds =
                compareReal(swapped ? operatorInfo(op).mirrored : op, each.form, swapped ? a.real : b.real);
            if (!holds)
                return ofTruth(diagrams_.between(unknowns_[unknowns_.term(frame.id, 0, 1)].quantity, 1, 1));
            truth = diagrams_.either(truth, diagrams_.both(each.guard, *holds));
        }
        return ofTruth(truth);
    }
    if (op == SymbolicOp::Equal || op == SymbolicOp::NotEqual) {
        for (const auto& [tested, other] : {std::pair(&a, &b), std::pair(&b, &a)}) {
            if (tested->nonZero && constantOf(*other) == 0)
                return ofTruth(op == SymbolicOp::Equal ? opposite(*tested->nonZero) : *tested->nonZero);
        }
    }
    const Cases left = casesOf(a);
    const Cases right = casesOf(b);
    for (const Case& x : left) {
        for (const Case& y : right) {
            steps_.take();
            const auto form = combine(x.form, 1, y.form, -1);
            if (!form)
                return ofTruth(diagrams_.between(unknowns_[unknowns_.term(frame.id, 0, 1)].quantity, 1, 1));
            const Diagram guard = diagrams_.both(x.guard, y.guard);
            truth = diagrams_.either(truth, diagrams_.both(guard, compare(op, *form)));
        }
    }
    return ofTruth(truth);
}

Diagram ConditionReader::compare(SymbolicOp op, const LinearForm& form) {
    switch (op) {
    case SymbolicOp::NotEqual:
    case SymbolicOp::GreaterThan:
    case SymbolicOp::GreaterThanEqual:
        return opposite(compareDirectly(operatorInfo(op).negated, form));
    default:
        return compareDirectly(op, form);
    }
}

Diagram ConditionReader::compareDirectly(SymbolicOp op, const LinearForm& form) {
    if (form.isConstant())
        return compareNumbers(op, form.constant, std::int64_t{0}) ? always : never;
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
        const QuantityInfo& info = unknowns_.quantity(quantity);
        const std::int64_t mask = info.isDifference() ? 0 : unknowns_[info.plus].mask;
        const bool isPossible = right % factor == 0 && (mask == 0 || (value & ~mask) == 0);
        return isPossible ? diagrams_.between(quantity, value, value) : never;
    }
    const std::int64_t most = floorDivide(op == SymbolicOp::LessThan ? right - 1 : right, factor);
    return opposed ? diagrams_.between(quantity, -most, plusInfinite)
                   : diagrams_.between(quantity, minusInfinite, most);
}

/// Where `form op real` holds; nothing where the literal is beyond the bound of linear forms.
std::optional<Diagram> ConditionReader::compareReal(SymbolicOp op, const LinearForm& form, double real) {
    if (form.isConstant())
        return compareExactly(op, form.constant, real) ? always : never;
    if (std::isnan(real) || std::isinf(real))
        return compareExactly(op, 0, real) ? always : never;
    if (std::fabs(real) > static_cast<double>(largestNumber))
        return std::nullopt;
    const auto whole = static_cast<std::int64_t>(std::floor(real));
    const bool fraction = static_cast<double>(whole) != real;
    if (fraction && (op == SymbolicOp::Equal || op == SymbolicOp::NotEqual))
        return op == SymbolicOp::Equal ? never : always;
    // Behind the whole part: below the literal is at most its whole part.
    if (fraction && op == SymbolicOp::LessThan)
        op = SymbolicOp::LessThanEqual;
    if (fraction && op == SymbolicOp::GreaterThanEqual)
        op = SymbolicOp::GreaterThan;
    const auto difference = combine(form, 1, {{}, whole}, -1);
    if (!difference)
        return std::nullopt;
    return compare(op, *difference);
}

} // namespace VT
