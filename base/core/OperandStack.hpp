// The stack of a visitor that rebuilds.  A visit operation receives its node and nothing else, so operands that were
// rebuilt, and the identifier under which the node is visited, reach it through this base, which the walkers know.
#pragma once

#include "base/core/Table.hpp"

#include <algorithm>
#include <cstddef>
#include <vector>

namespace VT {

namespace detail {
template <class Path>
class OccurrenceWalk;
}

/// A base beside SymbolicExprVisitor for visitors that keep the results of operands on a stack, one identifier for each
/// operand.  accept() and execute() find it in a visitor: for an operand that is missing, which they cannot visit, they
/// push the invalid identifier, so that a visit pops as many results as its node has operands whatever these are.
class VTSYM_API OperandStack {
    struct Visited {
        const SymbolicExprTable* table = nullptr;
        SymbolicExprId id = invalidId;
        const SymbolicExpr* node = nullptr;
    };

public:
    OperandStack(const OperandStack&) = delete;
    OperandStack& operator=(const OperandStack&) = delete;

protected:
    OperandStack() = default;
    ~OperandStack() = default;

    void push(SymbolicExprId id) { stack_.push_back(id); }

    /// Takes the last result; the invalid identifier from an empty stack.
    SymbolicExprId pop() {
        lowest_ = std::min(lowest_, static_cast<std::ptrdiff_t>(stack_.size()) - 1);
        const SymbolicExprId id = top();
        if (!stack_.empty())
            stack_.pop_back();
        return id;
    }

    /// The last result; the invalid identifier for an empty stack.
    [[nodiscard]] SymbolicExprId top() const noexcept { return stack_.empty() ? invalidId : stack_.back(); }

    [[nodiscard]] std::size_t depth() const noexcept { return stack_.size(); }

    /// Whether `visit`, a visit of a node with `operands` operands, takes these, nothing below them, and leaves one
    /// result.
    template <class Visit>
    bool keepsDiscipline(std::size_t operands, Visit visit) {
        const auto bottom = static_cast<std::ptrdiff_t>(stack_.size()) - static_cast<std::ptrdiff_t>(operands);
        lowest_ = static_cast<std::ptrdiff_t>(stack_.size());
        visit();
        return lowest_ >= bottom && static_cast<std::ptrdiff_t>(stack_.size()) == bottom + 1;
    }

    /// Whether the invalid identifier is among the topmost results.
    [[nodiscard]] bool holdsInvalid(std::size_t results) const noexcept {
        const auto from = stack_.end() - static_cast<std::ptrdiff_t>(std::min(results, stack_.size()));
        return results > stack_.size() || std::find(from, stack_.end(), invalidId) != stack_.end();
    }

    /// Takes away what a run that threw left on the stack.
    void unwind(std::size_t depth) noexcept {
        if (depth < stack_.size())
            stack_.resize(depth);
    }

    /// The node that a walk visits at this moment, or nullptr.
    [[nodiscard]] const SymbolicExpr* visitedNode() const noexcept { return visited_.node; }

    /// The identifier under which a walk over `table` visits `node` at this moment; the invalid one for another node.
    [[nodiscard]] SymbolicExprId visitedId(const SymbolicExprTable& table, const SymbolicExpr* node) const noexcept {
        return node == visited_.node && &table == visited_.table ? visited_.id : invalidId;
    }

    /// Marks the node that a walk visits as long as it lives.
    class Visiting {
    public:
        Visiting(OperandStack& stack, const SymbolicExprTable& table, SymbolicExprId id, const SymbolicExpr& node)
            : stack_(stack),
              before_(stack.visited_) {
            stack.visited_ = {&table, id, &node};
        }

        Visiting(const Visiting&) = delete;
        Visiting& operator=(const Visiting&) = delete;

        ~Visiting() { stack_.visited_ = before_; }

    private:
        OperandStack& stack_;
        Visited before_;
    };

    /// An empty stack for a run of its own; the results that were there come back afterwards.
    class OwnRun {
    public:
        explicit OwnRun(OperandStack& stack) : stack_(stack), lowest_(stack.lowest_) { before_.swap(stack.stack_); }

        OwnRun(const OwnRun&) = delete;
        OwnRun& operator=(const OwnRun&) = delete;

        ~OwnRun() {
            before_.swap(stack_.stack_);
            stack_.lowest_ = lowest_;
        }

    private:
        OperandStack& stack_;
        std::vector<SymbolicExprId> before_;
        std::ptrdiff_t lowest_;
    };

private:
    template <class Path>
    friend class detail::OccurrenceWalk;

    std::vector<SymbolicExprId> stack_;
    std::ptrdiff_t lowest_ = 0; ///< how deep the stack was at the least since a visit began; -1 where it was too short
    Visited visited_;
};

} // namespace VT
