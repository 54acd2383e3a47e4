// Prints a condition without what a known one contains or excludes.
//
// Facts are literals with a truth value, taken from the known condition's And and from Or below Not.  Each node of the
// condition is printed as a value, and next to it as what is left of it as a condition.
// Cost: linear in the distinct nodes of both.
#include "base/decide/shorten/StringifyImpliedCondition.hpp"

namespace VT {

StringifyImpliedCondition::StringifyImpliedCondition(const SymbolicExprTable& table, bool quillSyntax,
                                                     bool clarifyLogicalMix, SymbolicExprId known,
                                                     SymbolicExprPrinter::PredicateHandle predicate)
    : PreprocessorVCExpr(table, quillSyntax, clarifyLogicalMix, std::move(predicate)),
      table_(table) {
    learn(known);
}

// What is known.

/// One literal is used for all comparisons that say the same of two operands, and with false for those that deny it.
std::pair<StringifyImpliedCondition::Literal, bool> StringifyImpliedCondition::literalOf(SymbolicExprId id,
                                                                                         const SymbolicExpr& node) {
    SymbolicOp op = node.op();
    if (!comparisonOps.contains(op))
        return {{SymbolicOp::None, id, invalidId}, true};
    const bool holds = op == SymbolicOp::Equal || op == SymbolicOp::LessThan || op == SymbolicOp::GreaterThan;
    if (!holds)
        op = operatorInfo(op).negated;
    SymbolicExprId a = node.getInput(0);
    SymbolicExprId b = node.getInput(1);
    if (op == SymbolicOp::GreaterThan || (op == SymbolicOp::Equal && b < a)) {
        op = operatorInfo(op).mirrored;
        std::swap(a, b);
    }
    return {{op, a, b}, holds};
}

void StringifyImpliedCondition::learn(SymbolicExprId known) {
    struct Fact {
        SymbolicExprId id;
        bool holds;
    };

    std::vector<Fact> pending{{known, true}};
    IdMap<unsigned> learnt; // bit 0: denied, bit 1: held
    while (!pending.empty()) {
        const Fact fact = pending.back();
        pending.pop_back();
        if (!table_.has(fact.id))
            continue;
        const unsigned bit = fact.holds ? 2U : 1U;
        unsigned* const before = learnt.find(fact.id);
        unsigned& bits = before != nullptr ? *before : learnt.insert(fact.id, 0U);
        if ((bits & bit) != 0)
            continue;
        bits |= bit;
        const SymbolicExpr& node = *table_.get(fact.id);
        const auto [literal, positive] = literalOf(fact.id, node);
        facts_.emplace(literal, positive == fact.holds);
        const bool isNot = node.op() == SymbolicOp::Not;
        if (isNot || node.op() == (fact.holds ? SymbolicOp::And : SymbolicOp::Or)) {
            for (std::size_t i = node.getNumInputs(); i-- > 0;)
                if (table_.hasOperand(fact.id, node.getInput(i)))
                    pending.push_back({node.getInput(i), fact.holds != isNot});
        }
    }
}

StringifyImpliedCondition::Verdict StringifyImpliedCondition::negated(Verdict verdict) {
    if (verdict == Verdict::Open)
        return verdict;
    return verdict == Verdict::Contained ? Verdict::Excluded : Verdict::Contained;
}

StringifyImpliedCondition::Verdict StringifyImpliedCondition::verdictOf(SymbolicExprId id,
                                                                        const SymbolicExpr& node) const {
    const auto [literal, positive] = literalOf(id, node);
    const auto fact = facts_.find(literal);
    if (fact == facts_.end())
        return Verdict::Open;
    return fact->second == positive ? Verdict::Contained : Verdict::Excluded;
}

// What is printed.  The stack holds each node as a value; conditions_ holds what is left of it as a condition.

/// What is left of an operand of And, Or or Not.
StringifyImpliedCondition::Condition StringifyImpliedCondition::operand(SymbolicExprId id,
                                                                        const Printed& asValue) const {
    const Condition* const met = conditions_.find(id);
    if (met == nullptr)
        return {Verdict::Open, asValue};
    return met->verdict == Verdict::Open ? *met : Condition{met->verdict, asValue};
}

void StringifyImpliedCondition::conclude(const SymbolicExpr& node, Condition condition) {
    const SymbolicExprId id = node.getId(table_);
    if (condition.verdict == Verdict::Open && id != invalidId)
        condition.verdict = verdictOf(id, node);
    if (id != invalidId)
        conditions_.insert(id, condition);
    last_ = condition;
}

template <class Node>
void StringifyImpliedCondition::append(const Node& node) {
    if constexpr (Node::code == SymbolicOp::And || Node::code == SymbolicOp::Or) {
        constexpr bool isAnd = Node::code == SymbolicOp::And;
        constexpr Verdict neutral = isAnd ? Verdict::Contained : Verdict::Excluded;
        const Printed rightValue = pop();
        const Printed leftValue = pop();
        const Condition left = operand(node.left(), leftValue);
        const Condition right = operand(node.right(), rightValue);
        push(left.text);
        push(right.text);
        PreprocessorVCExpr::visit(node);
        if (left.verdict == negated(neutral) || right.verdict == negated(neutral))
            conclude(node, {negated(neutral), top()});
        else if (left.verdict == neutral || right.verdict == neutral)
            conclude(node, left.verdict == neutral ? right : left);
        else
            conclude(node, {Verdict::Open, top()});
    } else if constexpr (Node::code == SymbolicOp::Not) {
        const Condition inner = operand(node.operand(), pop());
        push(inner.text);
        PreprocessorVCExpr::visit(node);
        conclude(node, {negated(inner.verdict), top()});
    } else {
        PreprocessorVCExpr::visit(node);
        conclude(node, {Verdict::Open, top()});
    }
}

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void StringifyImpliedCondition::visit(const Class& node) {                                                         \
        append(node);                                                                                                  \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

std::string StringifyImpliedCondition::text(const Condition& condition) const {
    const bool contained = condition.verdict == Verdict::Contained;
    if (condition.verdict == Verdict::Open)
        return textOf(condition.text);
    if (isQuillSyntax())
        return contained ? "true" : "false";
    return contained ? "1" : "0";
}

std::string StringifyImpliedCondition::get() const {
    static_cast<void>(top()); // throws where nothing was visited
    return text(last_);
}

std::string StringifyImpliedCondition::print(SymbolicExprId id) {
    const Printed asValue = printed(id);
    const Condition* const met = conditions_.find(id);
    return met != nullptr ? text(*met) : textOf(asValue);
}

void StringifyImpliedCondition::forget() {
    PreprocessorVCExpr::forget();
    conditions_.clear();
    last_ = {};
}

} // namespace VT
