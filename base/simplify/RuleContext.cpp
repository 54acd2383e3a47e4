// Answers what rules ask about nodes: bound members, literals, keywords, and where reals take part.
//
// Whether an operand may be real is found by a walk with a stack that keeps its answers, so that each node is looked at
// once in a pass.
#include "base/simplify/RuleContext.hpp"

#include "base/variants/VariantKeywords.hpp"

namespace VT {

RuleListener::~RuleListener() = default;

RuleContext::RuleContext(SymbolicExprTable& table, bool keywordsOn)
    : table_(table),
      isPlain_(table.isPlain()),
      keywordsOn_(keywordsOn) {}

SymbolicExprId RuleContext::resolve(SymbolicExprId id) const {
    if (op(id) != SymbolicOp::MemberValue)
        return id;
    const SymbolicExprId value = table_.getValueId(id);
    return table_.has(value) ? value : id;
}

std::optional<int> RuleContext::integer(SymbolicExprId id) const {
    if (isPlain_) {
        const std::uint64_t key = table_.keyAt(id);
        return NodeKeys::isExact(key) && NodeKeys::opOf(key) == SymbolicOp::IntValue
                   ? std::optional(NodeKeys::integerOf(key))
                   : std::nullopt;
    }
    const SymbolicExpr& literal = node(id);
    if (literal.op() != SymbolicOp::IntValue)
        return std::nullopt;
    return static_cast<const SymbolicIntValue&>(literal).getValue();
}

bool RuleContext::mayBeReal(SymbolicExprId id) {
    static constexpr OperatorSet arithmetic{SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::UnaryMinus,
                                            SymbolicOp::Multiply, SymbolicOp::Divide};
    if (const SymbolicOp whole = op(resolve(id)); !arithmetic.contains(whole)) // mostly
        return whole == SymbolicOp::DoubleValue;
    std::vector<SymbolicExprId> pending{id};
    while (!pending.empty()) {
        const SymbolicExprId next = pending.back();
        const SymbolicExpr& value = node(resolve(next));
        const std::size_t before = pending.size();
        bool real = value.op() == SymbolicOp::DoubleValue;
        if (arithmetic.contains(value.op())) {
            real = real || resolve(next) != next; // a bound value need not be below the node, so it is not entered
            for (std::size_t i = 0; i < value.getNumInputs() && !real; ++i) {
                const bool* const known = real_.find(value.getInput(i));
                if (known == nullptr)
                    pending.push_back(value.getInput(i));
                real = known != nullptr && *known;
            }
        }
        if (real)
            pending.resize(before);
        if (pending.size() > before)
            continue;
        real_.insert(next, real);
        pending.pop_back();
    }
    return *real_.find(id);
}

bool RuleContext::isSimKeyword(SymbolicExprId id) const {
    return op(id) == SymbolicOp::String &&
           VariantKeywords::isSimVariantKeyword(static_cast<const SymbolicString&>(node(id)).getName(), keywordsOn_);
}

bool RuleContext::isCodegenKeyword(SymbolicExprId id) const {
    return op(id) == SymbolicOp::String && VariantKeywords::isCodegenVariantKeyword(
                                               static_cast<const SymbolicString&>(node(id)).getName(), keywordsOn_);
}

void RuleContext::fired(const RuleInfo& rule, SymbolicExprId before, SymbolicExprId after) {
    if (listener_ != nullptr && before != after)
        listener_->fired({pass_, &rule, before, after});
}

} // namespace VT
