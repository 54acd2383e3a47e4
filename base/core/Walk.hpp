// The only walkers over expression graphs.  Their stacks are explicit, so depth costs memory, never the thread's stack.
//
// An operand is missing where the table has no node for it (SymbolicExprTable::hasOperand), and where the node is one
// that the walk is inside of: in a table of a host, nodes may lead in a circle.  A walk passes over missing operands.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/util/IdMap.hpp"

#include <algorithm>
#include <limits>
#include <type_traits>
#include <vector>

namespace VT {

/// Visits every occurrence of a node below and including `root`, in the order that the visitor's isBottomUpVistor()
/// asks for.
VTSYM_API void visitEveryOccurrence(const SymbolicExprTable& table, const SymbolicExpr& root,
                                    SymbolicExprVisitor& visitor);

/// The path of a walk over a plain table.  Its nodes lead in no circle, so nothing is kept.
class PlainPath {
public:
    explicit PlainPath(const SymbolicExprTable& table) : size_(table.size()) {}

    static void enter(SymbolicExprId) {}

    static void leave(SymbolicExprId) {}

    static constexpr std::size_t depthOf(SymbolicExprId) { return 0; }

    /// As SymbolicExprTable::hasOperand().
    [[nodiscard]] bool hasOperand(SymbolicExprId id, SymbolicExprId operand) const {
        return operand < id && operand < size_;
    }

private:
    std::size_t size_;
};

/// The path of a walk over any table: the nodes between the root and the current one.
class WalkPath {
public:
    explicit WalkPath(const SymbolicExprTable& table) : table_(table) {}

    /// Goes down into a node; the invalid identifier stands for one that is not interned.
    void enter(SymbolicExprId id) {
        ++depth_;
        if (id != invalidId)
            depths_.insert(id, depth_);
    }

    /// Goes up from the node that was entered last.
    void leave(SymbolicExprId id) {
        --depth_;
        if (id != invalidId)
            depths_.insert(id, 0);
    }

    /// How many nodes down the walk entered a node that it did not leave; 0 for another node.
    [[nodiscard]] std::size_t depthOf(SymbolicExprId id) const {
        const std::size_t* const depth = depths_.find(id);
        return depth != nullptr ? *depth : 0;
    }

    /// Whether there is a node for an operand of `id`, on the path or not.
    [[nodiscard]] bool hasOperand(SymbolicExprId id, SymbolicExprId operand) const {
        return table_.hasOperand(id, operand);
    }

private:
    const SymbolicExprTable& table_;
    std::size_t depth_ = 0;
    IdMap<std::size_t> depths_;
};

/// A node whose operands are being walked.
struct WalkFrame {
    static constexpr std::size_t noCircle = std::numeric_limits<std::size_t>::max();

    const SymbolicExpr* node;
    SymbolicExprId id;
    std::size_t next;
    std::size_t count;
    std::size_t circle = noCircle; ///< the least depth of a node on the path that was met again below this one
};

namespace detail {

template <class Path, class Known, class Visit, class Missing>
void walkUnknownBelow(const SymbolicExprTable& table, SymbolicExprId root, std::vector<WalkFrame>& stack, Known&& known,
                      Visit&& visit, Missing&& missing) {
    constexpr bool isPlain = std::is_same_v<Path, PlainPath>;
    stack.clear();
    Path path(table);
    const auto finish = [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr* parent,
                            [[maybe_unused]] bool isInCircle) {
        if constexpr (std::is_invocable_v<Visit&, SymbolicExprId, const SymbolicExpr&, const SymbolicExpr*, bool>)
            visit(id, node, parent, isInCircle);
        else
            visit(id, node, parent);
    };
    const auto enter = [&](SymbolicExprId id, const SymbolicExpr* parent) {
        const SymbolicExpr* node = isPlain ? table.SymbolicExprTable::get(id) : table.get(id);
        const std::size_t count = node->getNumInputs();
        if (count == 0) {
            finish(id, *node, parent, false);
        } else {
            stack.push_back({node, id, 0, count});
            path.enter(id);
        }
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
            path.leave(done.id);
            if (!isPlain && !stack.empty())
                stack.back().circle = std::min(stack.back().circle, done.circle);
            finish(done.id, *done.node, stack.empty() ? nullptr : stack.back().node,
                   !isPlain && done.circle <= stack.size() + 1);
            continue;
        }
        const SymbolicExprId operand = top.node->getInput(top.next++);
        const SymbolicExpr* const parent = top.node;
        if (!path.hasOperand(top.id, operand)) {
            missing(operand, parent);
        } else if (const std::size_t depth = path.depthOf(operand); depth != 0) {
            top.circle = std::min(top.circle, depth);
            missing(operand, parent);
        } else if (!known(operand, parent)) {
            enter(operand, parent);
        }
    }
}

} // namespace detail

/// Post-order walk for a caller that remembers the nodes itself, operands from left to right.
///
/// `known(id, parent)` returns whether the node was visited before, in this walk or an earlier one, and takes note of a
/// further occurrence if so; `visit(id, node, parent)` is called for every other node, and `missing(id, parent)` for an
/// operand without a node.  `parent` is the node whose operand it is, nullptr for the root.  The fourth parameter of a
/// `visit` that has one is whether the node is part of a circle, so that what is below it depends on the path to it.
/// `stack` is room that a caller of many small walks may keep.  Linear in the number of edges.
template <class Known, class Visit, class Missing>
void walkUnknown(const SymbolicExprTable& table, SymbolicExprId root, std::vector<WalkFrame>& stack, Known&& known,
                 Visit&& visit, Missing&& missing) {
    if (table.isPlain())
        detail::walkUnknownBelow<PlainPath>(table, root, stack, known, visit, missing);
    else
        detail::walkUnknownBelow<WalkPath>(table, root, stack, known, visit, missing);
}

/// Post-order walk over the distinct nodes below and including `root`, operands from left to right.
///
/// `visit(id, node, parent)` is called once for each distinct node, `again(id, parent)` for each of its further
/// occurrences as an operand, and with the invalid identifier for an operand without a node.  `parent` is the node
/// whose operand it is, nullptr for the root.  Linear in the number of edges.
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
        [&](SymbolicExprId, const SymbolicExpr* parent) { again(invalidId, parent); });
}

/// The same where parents do not matter: `visit(id, node)` and `again(id)`.
template <class Visit, class Again>
void walkDistinct(const SymbolicExprTable& table, SymbolicExprId root, Visit&& visit, Again&& again) {
    walkDistinctWithParents(
        table, root, [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr*) { visit(id, node); },
        [&](SymbolicExprId id, const SymbolicExpr*) { again(id); });
}

} // namespace VT
