// The walk of accept() and execute(): every occurrence of every node, in the order that the visitor asks for.
//
// Method: depth first on an explicit stack.  Over a table of a host the nodes of the path are kept too, so that a node
// that leads back to itself is passed over as a missing operand.
// Cost: linear in the number of paths from the root, which may be exponential in the number of nodes; walkUnknown() and
// walkDistinct() are linear in the nodes.
#include "base/core/Walk.hpp"

#include "base/core/OperandStack.hpp"

namespace VT {

namespace detail {

/// Visits the nodes below and including one, each as often as it occurs.
template <class Path>
class OccurrenceWalk {
public:
    OccurrenceWalk(const SymbolicExprTable& table, SymbolicExprVisitor& visitor)
        : table_(table),
          visitor_(visitor),
          operands_(dynamic_cast<OperandStack*>(&visitor)),
          path_(table) {}

    /// `bottomUp()` is called at each node that has operands: whether they come first.
    template <class BottomUp>
    void run(SymbolicExprId id, const SymbolicExpr& root, BottomUp bottomUp) {
        enter(id, root, bottomUp);
        while (!stack_.empty()) {
            Frame& top = stack_.back();
            if (top.next < top.count) {
                const SymbolicExprId operand = top.node->getInput(top.next++);
                if (path_.hasOperand(top.id, operand) && path_.depthOf(operand) == 0)
                    enter(operand, *table_.get(operand), bottomUp);
                else if (operands_ != nullptr)
                    operands_->push(invalidId);
                continue;
            }
            const Frame done = top;
            stack_.pop_back();
            path_.leave(done.id);
            if (done.visitAtEnd)
                visit(done.id, *done.node);
        }
    }

private:
    struct Frame {
        const SymbolicExpr* node;
        SymbolicExprId id; ///< the invalid one for a root that is not interned
        std::size_t next;
        std::size_t count;
        bool visitAtEnd;
    };

    template <class BottomUp>
    void enter(SymbolicExprId id, const SymbolicExpr& node, const BottomUp& bottomUp) {
        const std::size_t count = node.getNumInputs();
        if (count == 0) {
            visit(id, node);
            return;
        }
        const bool operandsFirst = bottomUp();
        if (!operandsFirst)
            visit(id, node);
        stack_.push_back({&node, id, 0, count, operandsFirst});
        path_.enter(id);
    }

    void visit(SymbolicExprId id, const SymbolicExpr& node) {
        if (operands_ == nullptr) {
            node.invoke(visitor_);
            return;
        }
        const OperandStack::Visiting visiting(*operands_, table_, id, node);
        node.invoke(visitor_);
    }

    const SymbolicExprTable& table_;
    SymbolicExprVisitor& visitor_;
    OperandStack* operands_;
    Path path_;
    std::vector<Frame> stack_;
};

/// `id` is that of the root, or the invalid one.
template <class BottomUp>
void visitOccurrences(const SymbolicExprTable& table, SymbolicExprId id, const SymbolicExpr& root,
                      SymbolicExprVisitor& visitor, BottomUp bottomUp) {
    if (table.isPlain())
        OccurrenceWalk<PlainPath>(table, visitor).run(id, root, bottomUp);
    else
        OccurrenceWalk<WalkPath>(table, visitor).run(id, root, bottomUp);
}

} // namespace detail

void visitEveryOccurrence(const SymbolicExprTable& table, const SymbolicExpr& root, SymbolicExprVisitor& visitor) {
    detail::visitOccurrences(table, table.lookup(&root), root, visitor, [&] { return visitor.isBottomUpVistor(); });
}

void SymbolicExprVisitor::execute(const SymbolicExprTable& table, SymbolicExprId id) {
    if (table.has(id))
        detail::visitOccurrences(table, id, *table.get(id), *this, [] { return true; });
}

} // namespace VT
