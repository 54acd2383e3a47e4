// The only walkers over expression graphs.  Their stacks are explicit, so depth costs memory, never the thread's stack.
//
// A node is interned after its operands, so an operand's identifier is below its node's own.  The walkers follow no
// other operand: a node built on identifiers that were not there yet cannot lead them in a circle or out of the table.
#pragma once

#include "base/core/IdMap.hpp"
#include "base/core/Nodes.hpp"

#include <vector>

namespace VT {

/// Visits every occurrence of a node below and including `root`, in the order that the visitor's isBottomUpVistor()
/// asks for.
VTSYM_API void visitEveryOccurrence(const SymbolicExprTable& table, const SymbolicExpr& root,
                                    SymbolicExprVisitor& visitor);

/// A node whose operands are being walked.
struct WalkFrame {
    const SymbolicExpr* node;
    SymbolicExprId id;
    std::size_t next;
    std::size_t count;
};

/// Post-order walk for a caller that remembers the nodes itself, operands from left to right.
///
/// `known(id, parent)` tells whether the node was visited before, in this walk or an earlier one, and takes note of a
/// further occurrence if so; `visit(id, node, parent)` is called for every other node, and `missing(id, parent)` for an
/// operand that no node stands for.  `parent` is the node on whose behalf, nullptr for the root.  `stack` is room that
/// a caller of many small walks may keep.  Linear in the number of edges.
template <class Known, class Visit, class Missing>
void walkUnknown(const SymbolicExprTable& table, SymbolicExprId root, std::vector<WalkFrame>& stack, Known&& known,
                 Visit&& visit, Missing&& missing) {
    stack.clear();
    const auto enter = [&](SymbolicExprId id, const SymbolicExpr* parent) {
        const SymbolicExpr* node = table.get(id);
        const std::size_t count = node->getNumInputs();
        if (count == 0)
            visit(id, *node, parent);
        else
            stack.push_back({node, id, 0, count});
    };
    if (!table.has(root))
        missing(root, nullptr);
    else if (!known(root, nullptr))
        enter(root, nullptr);
    while (!stack.empty()) {
        WalkFrame& top = stack.back();
        if (top.next == top.count) {
            const WalkFrame done = top;
            stack.pop_back();
            visit(done.id, *done.node, stack.empty() ? nullptr : stack.back().node);
            continue;
        }
        const SymbolicExprId operand = top.node->getInput(top.next++);
        const SymbolicExpr* const parent = top.node;
        if (operand >= top.id)
            missing(operand, parent);
        else if (!known(operand, parent))
            enter(operand, parent);
    }
}

/// Post-order walk over the distinct nodes below and including `root`, operands from left to right.
///
/// `visit(id, node, parent)` is called once for each distinct node, `again(id, parent)` for each of its further
/// occurrences as an operand, and for an operand that no node stands for.  `parent` is the node on whose behalf,
/// nullptr for the root.  Linear in the number of edges.
template <class Visit, class Again>
void walkDistinctWithParents(const SymbolicExprTable& table, SymbolicExprId root, Visit&& visit, Again&& again) {
    IdMap<bool> seen;
    std::vector<WalkFrame> stack;
    walkUnknown(
        table, root, stack,
        [&](SymbolicExprId id, const SymbolicExpr* parent) {
            if (seen.find(id) == nullptr)
                return false;
            again(id, parent);
            return true;
        },
        [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr* parent) {
            seen.insert(id, true);
            visit(id, node, parent);
        },
        again);
}

/// The same where parents do not matter: `visit(id, node)` and `again(id)`.
template <class Visit, class Again>
void walkDistinct(const SymbolicExprTable& table, SymbolicExprId root, Visit&& visit, Again&& again) {
    walkDistinctWithParents(
        table, root, [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr*) { visit(id, node); },
        [&](SymbolicExprId id, const SymbolicExpr*) { again(id); });
}

} // namespace VT
