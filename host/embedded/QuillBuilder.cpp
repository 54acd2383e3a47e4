// Builds parse trees: an operator takes its operands from their stack as soon as one that binds no tighter follows.
// Each step is O(children); the stacks and a small tree are kept from text to text.
#include "host/embedded/QuillBuilder.hpp"

#include <array>

namespace VT::Embedded {

namespace {

QuillNode nonTerminal(QuillRule rule, std::size_t start, const QuillNode* children, std::size_t count) {
    return {.kind = QuillNode::nonTerminal,
            .code = static_cast<std::int32_t>(rule),
            .start = static_cast<std::uint32_t>(start),
            .childCount = static_cast<std::int32_t>(count),
            .children = children};
}

template <class Element>
void releaseMuch(std::vector<Element>& stack) {
    constexpr std::size_t kept = 4096;
    stack.clear();
    if (stack.capacity() > kept)
        std::vector<Element>().swap(stack);
}

} // namespace

void QuillBuilder::start() {
    operands_.clear();
    waiting_.clear();
    group_ = 0;
    if (!tree_)
        tree_ = spare_ ? std::move(spare_) : std::make_unique<QuillTree>();
    tree_->reuse();
}

QuillTree* QuillBuilder::finish() {
    static_cast<QuillNode&>(*tree_) = nonTerminal(QuillRule::Root, operands_.back().start, tree_->store(operands_), 1);
    return tree_.release();
}

void QuillBuilder::release() {
    releaseMuch(operands_);
    releaseMuch(waiting_);
    if (tree_ && !tree_->isReusable())
        tree_.reset();
}

void QuillBuilder::recycle(std::unique_ptr<QuillTree> tree) noexcept {
    if (tree && tree->isReusable())
        spare_ = std::move(tree);
}

std::size_t QuillBuilder::reduceTo(QuillLevel level) {
    std::size_t functions = 0;
    while (waiting_.size() > group_ && waiting_.back().level >= level) {
        functions += waiting_.back().form == QuillForm::Function ? 1 : 0;
        reduce(waiting_.back());
        waiting_.pop_back();
    }
    return functions;
}

void QuillBuilder::reduce(const Waiting& waiting) {
    const std::size_t count = operands_.size();
    switch (waiting.form) {
    case QuillForm::Infix:
        replace(2, operands_[count - 2].start, waiting.rule,
                std::array{operands_[count - 2], waiting.token, operands_[count - 1]});
        break;
    case QuillForm::Prefix:
        replace(1, waiting.token.start, waiting.rule, std::array{waiting.token, operands_.back()});
        break;
    case QuillForm::Range:
        gather(count - 2, waiting.rule, operands_[count - 2].start);
        break;
    case QuillForm::SteppedRange:
        gather(count - 3, waiting.rule, operands_[count - 3].start);
        break;
    case QuillForm::Function:
        gather(count - 2, waiting.rule, waiting.token.start);
        break;
    }
}

void QuillBuilder::gather(std::size_t first, QuillRule rule, std::size_t start) {
    const std::span<const QuillNode> children = std::span(operands_).subspan(first);
    const QuillNode node = nonTerminal(rule, start, tree_->store(children), children.size());
    operands_.resize(first);
    operands_.push_back(node);
}

void QuillBuilder::replace(std::size_t operands, std::size_t start, QuillRule rule,
                           std::span<const QuillNode> children) {
    operands_.resize(operands_.size() - operands + 1);
    operands_.back() = nonTerminal(rule, start, tree_->store(children), children.size());
}

} // namespace VT::Embedded
