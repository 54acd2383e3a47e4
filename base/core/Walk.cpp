#include "base/core/Walk.hpp"

namespace VT {

namespace {

/// Identifiers below this bound may be followed from a node.  A temporary that is no node of the table may name any of
/// them.
struct Frame {
    const SymbolicExpr* node;
    SymbolicExprId bound;
    std::size_t next;
    std::size_t count;
    bool visitAtEnd;
};

template <class BottomUp>
void walkOccurrences(const SymbolicExprTable& table, const SymbolicExpr& root, SymbolicExprId bound,
                     SymbolicExprVisitor& visitor, BottomUp bottomUp) {
    std::vector<Frame> stack;
    const auto enter = [&](const SymbolicExpr& node, SymbolicExprId below) {
        const std::size_t count = node.getNumInputs();
        if (count == 0) {
            node.invoke(visitor);
            return;
        }
        const bool operandsFirst = bottomUp();
        if (!operandsFirst)
            node.invoke(visitor);
        stack.push_back({&node, below, 0, count, operandsFirst});
    };
    enter(root, bound);
    while (!stack.empty()) {
        Frame& top = stack.back();
        if (top.next < top.count) {
            const SymbolicExprId operand = top.node->getInput(top.next++);
            if (operand < top.bound)
                enter(*table.get(operand), operand);
            continue;
        }
        const Frame done = top;
        stack.pop_back();
        if (done.visitAtEnd)
            done.node->invoke(visitor);
    }
}

} // namespace

void visitEveryOccurrence(const SymbolicExprTable& table, const SymbolicExpr& root, SymbolicExprVisitor& visitor) {
    walkOccurrences(table, root, table.size(), visitor, [&] { return visitor.isBottomUpVistor(); });
}

void SymbolicExprVisitor::execute(const SymbolicExprTable& table, SymbolicExprId id) {
    if (table.has(id))
        walkOccurrences(table, *table.get(id), id, *this, [] { return true; });
}

} // namespace VT
