// Copies expressions from one table into another, together with the values bound to their symbols.
//
// Method: one rebuilding run for the expression.  The values of the symbols that it meets wait in a queue and are
// copied one after the other, never from within a visit, so that chains of values may be of any length and lead in
// circles.
// Cost: linear in the distinct nodes of the expression and of the values.
#include "base/transform/Copy.hpp"

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
    try {
        for (std::size_t next = 0; next < bindings_.size(); ++next) { // NOLINT(modernize-loop-convert): it grows
            const auto [name, sourceValue] = bindings_[next];
            table().registerValueId(name, copy(sourceValue));
        }
    } catch (...) {
        bindings_.clear();
        throw;
    }
    bindings_.clear();
}

SymbolicExprId SymbolicExprCopyVisitor::copy(SymbolicExprId id) {
    return rebuild(source_, id, copies_);
}

SymbolicExprId SymbolicExprCopy::operator()(SymbolicExprId id) const {
    return SymbolicExprCopyVisitor(source_, target_).copy(id);
}

} // namespace VT
