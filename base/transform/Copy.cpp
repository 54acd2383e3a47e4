#include "base/transform/Copy.hpp"

#include "base/core/Walk.hpp"

namespace VT {

SymbolicExprCopyVisitor::SymbolicExprCopyVisitor(const SymbolicExprTable& source, SymbolicExprTable& target)
    : SymbolicExprXFormVisitor(target),
      source_(source) {}

void SymbolicExprCopyVisitor::visit(const SymbolicString& node) {
    SymbolicExprXFormVisitor::visit(node);
    const SymbolicExprId value = source_.getValueId(node.getId(source_));
    if (!source_.has(value))
        return;
    bindings_.push_back({top(), value});
    if (bindings_.size() == 1) // otherwise a value is being copied, and this one waits for its turn
        bindValues();
}

/// Copies the values that wait, one after the other: a chain of values is as long as the input makes it.
void SymbolicExprCopyVisitor::bindValues() {
    std::size_t next = 0;
    while (next < bindings_.size()) {
        const auto [name, sourceValue] = bindings_[next++];
        table().registerValueId(name, copy(sourceValue));
    }
    bindings_.clear();
}

SymbolicExprId SymbolicExprCopyVisitor::copy(SymbolicExprId id) {
    const bool inPlace = &source_ == &table();
    std::vector<WalkFrame> stack;
    walkUnknown(
        source_, id, stack,
        [&](SymbolicExprId known, const SymbolicExpr*) {
            const SymbolicExprId* const copied = copies_.find(known);
            if (copied != nullptr)
                push(*copied);
            return copied != nullptr;
        },
        [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr*) {
            visitAs(inPlace ? visited : invalidId, node);
            copies_.insert(visited, top());
        },
        [&](SymbolicExprId, const SymbolicExpr*) { push(invalidId); });
    return pop();
}

SymbolicExprId SymbolicExprCopy::operator()(SymbolicExprId id) const {
    return SymbolicExprCopyVisitor(source_, target_).copy(id);
}

} // namespace VT
