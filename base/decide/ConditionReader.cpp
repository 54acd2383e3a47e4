// Reads conditions bottom-up with an explicit stack and builds their circuits.
//
// Every node is read once; a chain of one operator is read as a whole and its operands are joined pairwise. One step
// for each operand, plus those of the circuits.
#include "base/decide/ConditionReader.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/witness/CallCongruence.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr OperatorSet chainOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};
constexpr OperatorSet sumOps{SymbolicOp::Plus, SymbolicOp::Minus};

/// Operands of a sum that is read as a whole.  The parts of a shorter one are read one by one, and known afterwards.
constexpr std::size_t longSum = 16;

} // namespace

ConditionReader::ConditionReader(const LeafReader& leaves, Unknowns& unknowns, Circuit& circuit, Steps& steps)
    : leafReader_(leaves),
      table_(leaves.table()),
      unknowns_(unknowns),
      circuit_(circuit),
      steps_(steps) {}

bool comesBefore(const Unknowns& unknowns, const UnknownLeaf& a, const UnknownLeaf& b) {
    if (a.unknown != b.unknown)
        return unknowns.before(a.unknown, b.unknown);
    return a.opposite != b.opposite ? a.opposite : a.node < b.node;
}

// The walk.

void ConditionReader::begin() {
    read_.clear();
    values_.clear();
    frames_.clear();
    operands_.clear();
    leaves_.clear();
    met_.clear();
    calls_.clear();
    whole_.clear();
    missing_ = false;
}

/// Reads a node and what is below it, unless an operand is missing.
void ConditionReader::walk(SymbolicExprId root) {
    missing_ = missing_ || (!table_.isPlain() && !isWhole(root)); // elsewhere nodes may lead in circles
    if (missing_ || enter(root))
        return;
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

/// Adds what was met on the way.
void ConditionReader::finish(ReadCondition& result) {
    std::ranges::sort(leaves_,
                      [&](const UnknownLeaf& x, const UnknownLeaf& y) { return comesBefore(unknowns_, x, y); });
    result.leaves.assign(leaves_.begin(), std::unique(leaves_.begin(), leaves_.end()));
    result.met = met_;
    result.calls = calls_;
}

ReadCondition ConditionReader::read(SymbolicExprId condition) {
    ReadCondition result;
    begin();
    walk(condition);
    if (missing_) {
        result.bound = DecisionBound::NoCondition;
        return result;
    }
    result.truth = truthOf(condition);
    finish(result);
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
    bool isSum = false;
    if (chainOps.contains(node->op())) {
        collectChain(node->op(), id);
    } else if (sumOps.contains(node->op()) && collectSum(id)) {
        isSum = true;
    } else {
        for (std::size_t i = 0; i < node->getNumInputs(); ++i) {
            operands_.push_back(node->getInput(i));
            missing_ = missing_ || !table_.hasOperand(id, operands_.back());
        }
    }
    frames_.push_back({id, node, first, first, isSum});
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

/// Appends the operands of a long sum from left to right; false for a short one.
bool ConditionReader::collectSum(SymbolicExprId root) {
    added_.clear();
    SymbolicExprId id = root;
    for (;;) {
        const SymbolicExpr* node = table_.get(id);
        if (!sumOps.contains(node->op()) || node->getNumInputs() != 2 || (id != root && read_.find(id) != nullptr))
            break;
        const SymbolicExprId left = node->getInput(0);
        const SymbolicExprId right = node->getInput(1);
        missing_ = missing_ || !table_.hasOperand(id, left) || !table_.hasOperand(id, right);
        if (missing_)
            return false;
        added_.push_back(right);
        id = left;
        if (added_.size() > longSum)
            steps_.take();
    }
    if (added_.size() < longSum)
        return false;
    operands_.push_back(id);
    operands_.insert(operands_.end(), added_.rbegin(), added_.rend());
    return true;
}

void ConditionReader::store(SymbolicExprId id, Value value) {
    values_.push_back(std::move(value));
    read_.insert(id, static_cast<std::uint32_t>(values_.size() - 1));
}

// Leaves and operators.

ConditionReader::Value ConditionReader::ofNumber(std::int64_t number) {
    Value value{Value::Kind::Number};
    value.cases.push_back({always, LinearForm{{}, number}});
    value.isLiteral = true;
    return value;
}

ConditionReader::Value ConditionReader::leaf(SymbolicExprId id, const LeafMeaning& meaning) {
    using Kind = LeafMeaning::Kind;
    switch (meaning.kind) {
    case Kind::Integer:
        return ofNumber(meaning.integer);
    case Kind::Real:
        return ofReal(meaning.real);
    case Kind::Simulation:
    case Kind::CodeGeneration: {
        const Unknown simulation = unknowns_.simulation();
        const bool opposed = meaning.kind == Kind::CodeGeneration;
        leaves_.push_back({meaning.node, simulation, opposed});
        met_.push_back(simulation);
        const Gate holds = circuit_.between(unknowns_[simulation].quantity, 1, 1);
        return ofTruth(opposed ? opposite(holds) : holds);
    }
    case Kind::Free: {
        const Unknown unknown = unknowns_.free(meaning.node);
        leaves_.push_back({meaning.node, unknown, false});
        met_.push_back(unknown);
        if (isFunctionCall(table_, meaning.node))
            calls_.push_back(meaning.node);
        Value value{Value::Kind::Number};
        value.cases.push_back({always, LinearForm{{{unknown, 1}}, 0}});
        return value;
    }
    default:
        return term(id);
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
    return frame.isSum ? sum(frame) : arithmetic(frame);
}

ConditionReader::Value ConditionReader::chain(const Frame& frame) {
    folded_.clear();
    for (std::size_t i = frame.firstOperand; i < operands_.size(); ++i)
        folded_.push_back(truthOf(operands_[i]));
    const bool conjunction = frame.node->op() == SymbolicOp::And || frame.node->op() == SymbolicOp::SingleAnd;
    return ofTruth(conjunction ? circuit_.all(folded_) : circuit_.any(folded_));
}

Gate ConditionReader::truthOf(SymbolicExprId id) {
    const Value& value = valueOf(id);
    switch (value.kind) {
    case Value::Kind::Truth:
        return value.truth;
    case Value::Kind::Real:
        return value.real != 0 ? always : never; // NaN is no zero
    case Value::Kind::RealTerm:
        return ownTruth(id);
    default: {
        if (value.nonZero)
            return *value.nonZero;
        Gate truth = never;
        for (const Case& each : value.cases)
            truth = circuit_.either(truth, circuit_.both(each.guard, compare(SymbolicOp::NotEqual, each.form)));
        return truth;
    }
    }
}

} // namespace VT
