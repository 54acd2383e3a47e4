// Interns syntax values.
//
// Method: post-order with two stacks: tasks, and the identifiers of operands whose operator waits.  Right operands come
// before left ones, because identifiers are handed out in the order of interning.
// Cost: linear in the size of the value.
#include "parser/SyntaxConverter.hpp"

#include "base/core/Check.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <string>
#include <vector>

namespace VT::Parser {

namespace {

/// Alternatives of a syntax value by index.
enum Alternative : std::size_t { Empty, Integer, Real, Text, Nested, List, Binary, Unary };

constexpr OperatorSet prefixOps{SymbolicOp::UnaryMinus, SymbolicOp::Not, SymbolicOp::BitCompl, SymbolicOp::FcnCall0U};

/// Converts bottom-up with two stacks: tasks, and the identifiers of operands whose operator waits.
class Converter {
public:
    Converter(SymbolicExprTable& table, bool cOperators) : table_(table), cOperators_(cOperators) {}

    SymbolicExprId convert(const expression_ast& root) {
        plan(root);
        while (!tasks_.empty()) {
            const Task task = tasks_.back();
            tasks_.pop_back();
            if (task.operandsDone)
                ids_.push_back(build(*task.value));
            else
                visit(*task.value);
        }
        VTSYM_CHECK(ids_.size() == 1);
        return ids_.back();
    }

private:
    struct Task {
        const expression_ast* value;
        bool operandsDone;
    };

    /// Plans a conversion; the last one planned is done first.
    void plan(const expression_ast& value) { tasks_.push_back({&value, false}); }

    void planElements(const expression_list& list) {
        const std::size_t first = tasks_.size();
        for (const list_item* item = list.first; item != nullptr; item = item->next)
            plan(item->value);
        std::reverse(tasks_.begin() + static_cast<std::ptrdiff_t>(first), tasks_.end());
    }

    /// Converts a leaf; plans a compound value after its operands.
    void visit(const expression_ast& value) {
        switch (value.index()) {
        case Integer:
            return leaf<SymbolicIntValue>(std::get<Integer>(value));
        case Real:
            return leaf<SymbolicDoubleValue>(std::get<Real>(value));
        case Text:
            return leaf<SymbolicString>(name_.assign(std::get<Text>(value)));
        case Nested:
            return plan(*std::get<Nested>(value));
        case List:
            tasks_.push_back({&value, true});
            return planElements(*std::get<List>(value));
        case Binary:
            tasks_.push_back({&value, true});
            return planOperands(*std::get<Binary>(value));
        case Unary:
            tasks_.push_back({&value, true});
            return plan(std::get<Unary>(value)->operand);
        default:
            ids_.push_back(invalidId);
        }
    }

    void planOperands(const binary_op& node) {
        switch (node.op) {
        case SymbolicOp::FcnCall2U:
            if (const auto* arguments = std::get_if<List>(&node.right); arguments != nullptr)
                planElements(**arguments);
            else
                plan(node.right);
            return plan(node.left);
        case SymbolicOp::MemberValue:
            plan(node.right);
            return plan(node.left);
        default:
            plan(node.left);
            return plan(node.right);
        }
    }

    template <class Node, class Payload>
    void leaf(const Payload& payload) {
        ids_.push_back(Node(table_, payload).getId(table_));
    }

    SymbolicExprId build(const expression_ast& value) {
        switch (value.index()) {
        case Binary:
            return build(*std::get<Binary>(value));
        case Unary:
            return build(*std::get<Unary>(value));
        default:
            return intern<SymbolicNDExpr>(takeLast(std::get<List>(value)->size));
        }
    }

    SymbolicExprId build(const unary_op& node) {
        const SymbolicExprId operand = takeLast();
        if (!prefixOps.contains(node.op))
            return invalidId;
        const bool isNot = node.op == SymbolicOp::BitCompl && !cOperators_;
        return makeUnary(table_, isNot ? SymbolicOp::Not : node.op, operand);
    }

    SymbolicExprId build(const binary_op& node) {
        if (node.op == SymbolicOp::FcnCall2U)
            return buildCall(node);
        const SymbolicExprId last = takeLast();
        const SymbolicExprId first = takeLast();
        if (node.op == SymbolicOp::MemberValue)
            return buildMember(first, last);
        if (!conditionInfixOps.contains(node.op))
            return invalidId;
        return makeBinary(table_, node.op, last, first); // the right operand was converted first
    }

    SymbolicExprId buildCall(const binary_op& node) {
        if (const auto* arguments = std::get_if<List>(&node.right); arguments != nullptr)
            return intern<SymbolicFcnCallExpr>(takeLast((*arguments)->size + 1));
        const SymbolicExprId argument = takeLast();
        return intern<SymbolicFcnCall1UExpr>(takeLast(), argument);
    }

    SymbolicExprId buildMember(SymbolicExprId owner, SymbolicExprId member) {
        const SymbolicExpr* name = table_.get(member);
        if (name == nullptr || name->op() != SymbolicOp::String)
            return invalidId;
        return intern<SymbolicMemberValue>(owner, static_cast<const SymbolicString&>(*name).getName());
    }

    template <class Node, class... Payload>
    SymbolicExprId intern(Payload&&... payload) {
        return Node(table_, std::forward<Payload>(payload)...).getId(table_);
    }

    SymbolicExprId takeLast() {
        const SymbolicExprId id = ids_.back();
        ids_.pop_back();
        return id;
    }

    std::vector<SymbolicExprId> takeLast(std::size_t count) {
        const auto first = ids_.end() - static_cast<std::ptrdiff_t>(count);
        std::vector<SymbolicExprId> taken(first, ids_.end());
        ids_.erase(first, ids_.end());
        return taken;
    }

    SymbolicExprTable& table_;
    bool cOperators_;
    boost::container::small_vector<Task, 64> tasks_;
    boost::container::small_vector<SymbolicExprId, 64> ids_;
    std::string name_;
};

} // namespace

SymbolicExprId convertSyntax(SymbolicExprTable& table, const expression_ast& value, bool cOperators) {
    return Converter(table, cOperators).convert(value);
}

} // namespace VT::Parser
