// The bases of visitors that rebuild an expression bottom-up into a table.
//
// Method: rebuild() visits each distinct node once, operands first, and hands its result to further occurrences.  It
// does so only while visits keep the discipline of the stack: after one that does not, and inside circles of a host's
// table, nodes are visited for each occurrence, as execute() does.  Where nothing changed, the node's own identifier is
// returned without a probe of the table.
// Cost: linear in the distinct nodes and their operands; limits::repeatedVisits bounds the rest.
#include "base/transform/XForm.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <type_traits>

namespace VT {

SymbolicExprFactory::~SymbolicExprFactory() = default;

/// Returns the NaN that was added last, if it is the last node of the table's own storage.
SymbolicExprId SymbolicExprFactory::newestNaN() const {
    const SymbolicExprId last = table_.size() - 1;
    const SymbolicExpr* const node = table_.get(last);
    return node != nullptr && std::isnan(node->getNumValue()) ? last : invalidId;
}

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

SymbolicExprId SymbolicExprXFormVisitor::get() {
    if (depth() != 1)
        return invalidId;
    return pop();
}

SymbolicExprId SymbolicExprXFormVisitor::makeReal(double value) {
    const SymbolicExpr* const node = visitedNode();
    const bool isVisited = std::isnan(value) && node != nullptr && std::isnan(node->getNumValue());
    const SymbolicExprId own = isVisited ? visitedId(table_, node) : invalidId;
    return own != invalidId ? own : factory_.make<SymbolicDoubleValue>(value);
}

void SymbolicExprXFormVisitor::visitAs(SymbolicExprId id, const SymbolicExpr& node) {
    const Visiting visiting(*this, table_, id, node);
    node.invoke(*this);
}

SymbolicExprId SymbolicExprXFormVisitor::rebuild(const SymbolicExprTable& source, SymbolicExprId id) {
    IdMap<SymbolicExprId> results;
    return rebuild(source, id, results);
}

SymbolicExprId SymbolicExprXFormVisitor::rebuild(const SymbolicExprTable& source, SymbolicExprId id,
                                                 IdMap<SymbolicExprId>& results) {
    const OwnRun run(*this);
    const bool inPlace = &source == &table_;
    bool disciplined = true;
    std::size_t repeatable = limits::repeatedVisits;
    std::vector<WalkFrame> stack;
    walkUnknown(
        source, id, stack,
        [&](SymbolicExprId known, const SymbolicExpr*) {
            const SymbolicExprId* const result = results.find(known);
            if (result != nullptr)
                push(*result);
            return result != nullptr;
        },
        [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr*, bool isInCircle) {
            const auto visitNode = [&] { visitAs(inPlace ? visited : invalidId, node); };
            disciplined = keepsDiscipline(node.getNumInputs(), visitNode) && disciplined;
            if ((disciplined && !isInCircle) || repeatable == 0)
                results.insert(visited, top());
            else
                --repeatable;
        },
        [&](SymbolicExprId, const SymbolicExpr*) { push(invalidId); });
    const SymbolicExprId result = get();
    VTSYM_CHECK(!disciplined || depth() == 0);
    return result;
}

/// The node rebuilt from the operands on the stack; its own identifier, without a probe, where nothing changed.
template <class Node>
SymbolicExprId SymbolicExprXFormVisitor::identity(const Node& node) {
    const SymbolicExprId own = visitedId(table_, &node);
    const bool inPlace = own != invalidId;
    if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>) {
        const SymbolicExprId a = pop();
        if (inPlace && a == node.operand())
            return own;
        if constexpr (Node::code == SymbolicOp::MemberValue)
            return factory_.make<Node>(a, node.getMemberName());
        else
            return factory_.make<Node>(a);
    } else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>) {
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        return inPlace && a == node.left() && b == node.right() ? own : factory_.make<Node>(a, b);
    } else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>) {
        const SymbolicExprId c = pop();
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        const bool same = a == node.first() && b == node.second() && c == node.third();
        return inPlace && same ? own : factory_.make<Node>(a, b, c);
    } else if constexpr (std::is_base_of_v<SymbolicMultiExpr, Node>) {
        std::vector<SymbolicExprId> inputs(node.getNumInputs());
        for (std::size_t i = inputs.size(); i-- > 0;)
            inputs[i] = pop();
        return inPlace && inputs == node.inputs() ? own : factory_.make<Node>(std::move(inputs));
    } else if constexpr (Node::code == SymbolicOp::String) {
        return inPlace ? own : factory_.make<Node>(node.getName());
    } else {
        return inPlace ? own : factory_.make<Node>(node.getValue());
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
