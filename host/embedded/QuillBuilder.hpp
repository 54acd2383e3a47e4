// Builds a parse tree from operands and operators.
#pragma once

#include "host/embedded/QuillTree.hpp"

namespace VT::Embedded {

/// How an operator takes its operands.
enum class QuillForm : std::uint8_t { Infix, Prefix, Range, SteppedRange, Function };

/// Operands lie on one stack and operators without their right operand on another.  An operator takes its operands as
/// soon as one that binds no tighter follows.  Operators outside the innermost group, which are those in front of an
/// open bracket, stay untouched.
class QuillBuilder {
public:
    /// An operator that waits for its right operand.
    struct Waiting {
        QuillForm form;
        QuillLevel level;
        QuillRule rule;
        QuillNode token;
    };

    void start();

    /// The tree of the only operand.
    QuillTree* finish();

    /// Frees the memory of stacks and of an unfinished tree that a long text made large.
    void release();

    /// Takes a tree back for another text.
    void recycle(std::unique_ptr<QuillTree> tree) noexcept;

    std::size_t operandCount() const { return operands_.size(); }

    const QuillNode& operand(std::size_t index) const { return operands_[index]; }

    const QuillNode& lastOperand() const { return operands_.back(); }

    void push(const QuillNode& operand) { operands_.push_back(operand); }

    /// The last operator that waits in the innermost group, or nullptr.
    Waiting* lastWaiting() { return waiting_.size() > group_ ? &waiting_.back() : nullptr; }

    void wait(const Waiting& waiting) { waiting_.push_back(waiting); }

    /// Begins a group.
    ///
    /// @return the argument for endGroup()
    std::size_t beginGroup() { return std::exchange(group_, waiting_.size()); }

    void endGroup(std::size_t outer) { group_ = outer; }

    /// Gives the operators of the group that bind as tightly as `level`, or tighter, their right operands.
    ///
    /// @return how many anonymous functions are complete now
    std::size_t reduceTo(QuillLevel level);

    /// Makes one operand of the operands from `first` on: they become its children.
    void gather(std::size_t first, QuillRule rule, std::size_t start);

    /// Replaces the last operands by one, whose children are given.
    void replace(std::size_t operands, std::size_t start, QuillRule rule, std::span<const QuillNode> children);

private:
    void reduce(const Waiting& waiting);

    std::vector<QuillNode> operands_;
    std::vector<Waiting> waiting_;
    std::size_t group_ = 0;            ///< waiting operators outside the innermost group
    std::unique_ptr<QuillTree> tree_;  ///< the tree that grows
    std::unique_ptr<QuillTree> spare_; ///< a tree to be used again
};

} // namespace VT::Embedded
