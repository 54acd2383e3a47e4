#include "base/transform/XForm.hpp"

#include "base/core/Check.hpp"
#include "base/core/IdMap.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <type_traits>

namespace VT {

SymbolicExprFactory::~SymbolicExprFactory() = default;

SymbolicExprXFormVisitor::SymbolicExprXFormVisitor(SymbolicExprTable& target)
    : keywordsOn(VT::isVariantKeywordsSimCodegenFeatureOn()),
      operandLimit(limits::chainOperands),
      factory_(target),
      table_(target) {}

SymbolicExprXFormVisitor::~SymbolicExprXFormVisitor() = default;

bool SymbolicExprXFormVisitor::isVariantKeywordsSimCodegenFeatureOn() const {
    return VT::isVariantKeywordsSimCodegenFeatureOn();
}

SymbolicExprId SymbolicExprXFormVisitor::getSimVariantKeywordId() const {
    return SymbolicString(table_, VariantKeywords::getSimVariantKeyword()).getId(table_);
}

SymbolicExprId SymbolicExprXFormVisitor::getCodegenVariantKeywordId() const {
    return SymbolicString(table_, VariantKeywords::getCodegenVariantKeyword()).getId(table_);
}

SymbolicExprId SymbolicExprXFormVisitor::pop() {
    // An operand that no node stands for was not visited, so nothing was pushed for it.
    if (stack_.empty())
        return invalidId;
    const SymbolicExprId id = stack_.back();
    stack_.pop_back();
    return id;
}

SymbolicExprId SymbolicExprXFormVisitor::get() {
    if (stack_.size() != 1)
        return invalidId;
    return pop();
}

void SymbolicExprXFormVisitor::visitAs(SymbolicExprId id, const SymbolicExpr& node) {
    [[maybe_unused]] const std::size_t before = stack_.size();
    current_ = id;
    node.invoke(*this);
    current_ = invalidId;
    VTSYM_CHECK(stack_.size() + node.getNumInputs() == before + 1);
}

void SymbolicExprXFormVisitor::unwind(std::size_t depth) noexcept {
    if (depth < stack_.size())
        stack_.resize(depth);
    current_ = invalidId;
}

SymbolicExprId SymbolicExprXFormVisitor::rebuild(const SymbolicExprTable& source, SymbolicExprId id) {
    if (!source.has(id))
        return invalidId;
    const std::size_t before = depth();
    const bool inPlace = &source == &table_;
    IdMap<SymbolicExprId> rebuilt;
    try {
        walkDistinct(
            source, id,
            [&](SymbolicExprId visited, const SymbolicExpr& node) {
                visitAs(inPlace ? visited : invalidId, node);
                rebuilt.insert(visited, top());
            },
            [&](SymbolicExprId known) {
                const SymbolicExprId* result = rebuilt.find(known);
                push(result != nullptr ? *result : invalidId);
            });
    } catch (...) {
        unwind(before);
        throw;
    }
    return pop();
}

/// The node rebuilt from the operands on the stack; its own identifier, without a probe, where nothing changed.
template <class Node>
SymbolicExprId SymbolicExprXFormVisitor::identity(const Node& node) {
    const bool inPlace = current_ != invalidId;
    if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>) {
        const SymbolicExprId a = pop();
        if (inPlace && a == node.operand())
            return current_;
        if constexpr (Node::code == SymbolicOp::MemberValue)
            return factory_.make<Node>(a, node.getMemberName());
        else
            return factory_.make<Node>(a);
    } else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>) {
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        return inPlace && a == node.left() && b == node.right() ? current_ : factory_.make<Node>(a, b);
    } else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>) {
        const SymbolicExprId c = pop();
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        const bool same = a == node.first() && b == node.second() && c == node.third();
        return inPlace && same ? current_ : factory_.make<Node>(a, b, c);
    } else if constexpr (std::is_base_of_v<SymbolicMultiExpr, Node>) {
        std::vector<SymbolicExprId> inputs(node.getNumInputs());
        for (std::size_t i = inputs.size(); i-- > 0;)
            inputs[i] = pop();
        return inPlace && inputs == node.inputs() ? current_ : factory_.make<Node>(std::move(inputs));
    } else if constexpr (Node::code == SymbolicOp::String) {
        return inPlace ? current_ : factory_.make<Node>(node.getName());
    } else {
        return inPlace ? current_ : factory_.make<Node>(node.getValue());
    }
}

/// The node that its construction hook makes of the operands on the stack.
template <class Node>
SymbolicExprId SymbolicExprXFormVisitor2::viaHook(const Node& node) {
    constexpr OpTag<Node::code> tag;
    if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>) {
        const SymbolicExprId a = pop();
        if constexpr (Node::code == SymbolicOp::MemberValue)
            return buildExpr(tag, a, node.getMemberName());
        else
            return buildExpr(tag, a);
    } else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>) {
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        return buildExpr(tag, a, b);
    } else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>) {
        const SymbolicExprId c = pop();
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        return buildExpr(tag, a, b, c);
    } else if constexpr (std::is_base_of_v<SymbolicMultiExpr, Node>) {
        SymbolicExprXFormVisitor::visit(node);
        return pop();
    } else if constexpr (Node::code == SymbolicOp::String) {
        return buildExpr(tag, node.getName());
    } else {
        return buildExpr(tag, node.getValue());
    }
}

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void SymbolicExprXFormVisitor::visit(const Class& node) {                                                          \
        push(identity(node));                                                                                          \
    }                                                                                                                  \
    void SymbolicExprXFormVisitor2::visit(const Class& node) {                                                         \
        push(viaHook(node));                                                                                           \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

} // namespace VT
