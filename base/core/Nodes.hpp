// The node classes, one for each row of the operator table, and their interning constructors.
//
//     const SymbolicExprId sum = SymbolicPlusExpr(table, a, SymbolicIntValue(table, 1)).getId(table);
//
// A constructor interns a copy unless the table holds an equal node; getId() then returns the identifier.  The object
// itself is a temporary.  Every operand is an identifier or a node that the table holds.  When memory runs out, the
// table is as before and std::bad_alloc passes.
#pragma once

#include "base/core/Shapes.hpp"
#include "base/core/Table.hpp"
#include "base/core/Visitor.hpp"

#include <concepts>
#include <string_view>
#include <utility>

namespace VT {

/// An operand of a constructor: an identifier or a node.
class Operand {
public:
    // NOLINTBEGIN(google-explicit-constructor): identifiers and nodes are written where an operand is meant
    Operand(SymbolicExprId id) : id_(id) {}

    Operand(const SymbolicExpr& node) : id_(invalidId), node_(&node) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] SymbolicExprId in(const SymbolicExprTable& table) const {
        return node_ != nullptr ? node_->getId(table) : id_;
    }

private:
    SymbolicExprId id_;
    const SymbolicExpr* node_ = nullptr;
};

/// The name of a called function: an operand, or a text that is interned as an identifier.
class VTSYM_API CallName {
public:
    // NOLINTBEGIN(google-explicit-constructor): as for operands
    CallName(SymbolicExprId id) : operand_(id) {}

    CallName(const SymbolicExpr& node) : operand_(node) {}

    /// A string or a literal; 0 is an identifier.
    template <std::convertible_to<std::string_view> Text>
    CallName(const Text& text) : operand_(invalidId),
                                 text_(text),
                                 isText_(true) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] SymbolicExprId in(SymbolicExprTable& table) const;

private:
    Operand operand_;
    std::string_view text_;
    bool isText_ = false;
};

namespace detail {

/// What every node class repeats: the operator code and the interning of a copy.
template <class Node, SymbolicOp Op, class Payload>
class InternedNode : public Payload {
public:
    static constexpr SymbolicOp code = Op;
    /// Real literals within a tolerance are equal though their hashes differ.
    static constexpr bool equalWithinTolerance = Op == SymbolicOp::DoubleValue;
    /// Most nodes are told apart by their keys.
    static constexpr bool hasExactKeys = exactKeyOps.contains(Op);

    [[nodiscard]] SymbolicOp op() const final { return Op; }

    [[nodiscard]] std::uint64_t getHash() const final { return Payload::hashOf(Op); }

    /// Returns what the base's getId() returns, without a probe right after the construction.
    [[nodiscard]] SymbolicExprId getId(const SymbolicExprTable& table) const {
        return table.template idOf<Node>(static_cast<const Payload&>(*this));
    }

protected:
    using Shape = Payload;

    /// The tag keeps it apart from the constructors of the shapes below, which inherit it.
    template <class... Parts>
    InternedNode(std::in_place_t, SymbolicExprTable& table, Parts&&... parts) : Payload(std::forward<Parts>(parts)...) {
        table.template intern<Node>(static_cast<const Payload&>(*this));
    }

    explicit InternedNode(const Payload& payload) : Payload(payload) {}
};

/// Returns input 0 followed by the others.
VTSYM_API std::vector<SymbolicExprId> headed(SymbolicExprId head, const std::vector<SymbolicExprId>& rest);

// One constructor for each shape of the operator table.
template <class Node, SymbolicOp Op>
struct StringNode : InternedNode<Node, Op, StringShape> {
    using Base = InternedNode<Node, Op, StringShape>;
    using Base::Base;

    StringNode(SymbolicExprTable& table, const std::string& name) : Base(std::in_place, table, name) {}
};

template <class Node, SymbolicOp Op>
struct IntNode : InternedNode<Node, Op, IntShape> {
    using Base = InternedNode<Node, Op, IntShape>;
    using Base::Base;

    IntNode(SymbolicExprTable& table, int value) : Base(std::in_place, table, value) {}
};

template <class Node, SymbolicOp Op>
struct DoubleNode : InternedNode<Node, Op, DoubleShape> {
    using Base = InternedNode<Node, Op, DoubleShape>;
    using Base::Base;

    DoubleNode(SymbolicExprTable& table, double value) : Base(std::in_place, table, value) {}
};

template <class Node, SymbolicOp Op>
struct UnaryNode : InternedNode<Node, Op, SymbolicUnaryExpr> {
    using Base = InternedNode<Node, Op, SymbolicUnaryExpr>;
    using Base::Base;

    UnaryNode(SymbolicExprTable& table, Operand operand) : Base(std::in_place, table, operand.in(table)) {}
};

template <class Node, SymbolicOp Op>
struct MemberNode : InternedNode<Node, Op, MemberShape> {
    using Base = InternedNode<Node, Op, MemberShape>;
    using Base::Base;

    MemberNode(SymbolicExprTable& table, Operand owner, const std::string& name)
        : Base(std::in_place, table, owner.in(table), name) {}
};

template <class Node, SymbolicOp Op, class Payload = SymbolicBinaryExpr>
struct BinaryNode : InternedNode<Node, Op, Payload> {
    using Base = InternedNode<Node, Op, Payload>;
    using Base::Base;

    BinaryNode(SymbolicExprTable& table, Operand left, Operand right)
        : Base(std::in_place, table, left.in(table), right.in(table)) {}
};

template <class Node, SymbolicOp Op, class Payload = SymbolicTernaryExpr>
struct TernaryNode : InternedNode<Node, Op, Payload> {
    using Base = InternedNode<Node, Op, Payload>;
    using Base::Base;

    TernaryNode(SymbolicExprTable& table, Operand first, Operand second, Operand third)
        : Base(std::in_place, table, first.in(table), second.in(table), third.in(table)) {}
};

template <class Node, SymbolicOp Op, class Payload = SymbolicMultiExpr>
struct MultiNode : InternedNode<Node, Op, Payload> {
    using Base = InternedNode<Node, Op, Payload>;
    using Base::Base;

    MultiNode(SymbolicExprTable& table, std::vector<SymbolicExprId> inputs)
        : Base(std::in_place, table, std::move(inputs)) {}
};

template <class Node, SymbolicOp Op>
using Dims2Node = BinaryNode<Node, Op, FixedDimsShape<SymbolicBinaryExpr>>;
template <class Node, SymbolicOp Op>
using Dims3Node = TernaryNode<Node, Op, FixedDimsShape<SymbolicTernaryExpr>>;
template <class Node, SymbolicOp Op>
using DimsNNode = MultiNode<Node, Op, DimsNShape>;

template <class Node, SymbolicOp Op>
struct Call0Node : InternedNode<Node, Op, FixedCallShape<SymbolicUnaryExpr>> {
    using Base = InternedNode<Node, Op, FixedCallShape<SymbolicUnaryExpr>>;
    using Base::Base;

    Call0Node(SymbolicExprTable& table, const CallName& name) : Base(std::in_place, table, name.in(table)) {}
};

template <class Node, SymbolicOp Op>
struct Call1Node : InternedNode<Node, Op, FixedCallShape<SymbolicBinaryExpr>> {
    using Base = InternedNode<Node, Op, FixedCallShape<SymbolicBinaryExpr>>;
    using Base::Base;

    Call1Node(SymbolicExprTable& table, const CallName& name, Operand argument)
        : Base(std::in_place, table, name.in(table), argument.in(table)) {}
};

template <class Node, SymbolicOp Op>
struct Call2Node : InternedNode<Node, Op, FixedCallShape<SymbolicTernaryExpr>> {
    using Base = InternedNode<Node, Op, FixedCallShape<SymbolicTernaryExpr>>;
    using Base::Base;

    Call2Node(SymbolicExprTable& table, const CallName& name, Operand first, Operand second)
        : Base(std::in_place, table, name.in(table), first.in(table), second.in(table)) {}
};

template <class Node, SymbolicOp Op>
struct CallNNode : InternedNode<Node, Op, CallNShape> {
    using Base = InternedNode<Node, Op, CallNShape>;
    using Base::Base;

    CallNNode(SymbolicExprTable& table, const CallName& name, const std::vector<SymbolicExprId>& arguments)
        : Base(std::in_place, table, headed(name.in(table), arguments)) {}

    /// All inputs at once, the name first.
    CallNNode(SymbolicExprTable& table, std::vector<SymbolicExprId> inputs)
        : Base(std::in_place, table, std::move(inputs)) {}
};

template <class Node, SymbolicOp Op>
struct CellNode : InternedNode<Node, Op, CellShape> {
    using Base = InternedNode<Node, Op, CellShape>;
    using Base::Base;

    CellNode(SymbolicExprTable& table, Operand head, const std::vector<SymbolicExprId>& rest)
        : Base(std::in_place, table, headed(head.in(table), rest)) {}

    /// All inputs at once, the head first.
    CellNode(SymbolicExprTable& table, std::vector<SymbolicExprId> inputs)
        : Base(std::in_place, table, std::move(inputs)) {}
};

} // namespace detail

#define VTSYM_OPERATOR(Code, Name, Class, ShapeName, ...)                                                              \
    class VTSYM_API Class final : public detail::ShapeName##Node<Class, SymbolicOp::Name> {                            \
    public:                                                                                                            \
        using NodeBase = detail::ShapeName##Node<Class, SymbolicOp::Name>;                                             \
        using NodeBase::NodeBase;                                                                                      \
        Class(const Class&) = delete;                                                                                  \
        ~Class() override = default;                                                                                   \
        void accept(const SymbolicExprTable& table, SymbolicExprVisitor& visitor) const override;                      \
        void invoke(SymbolicExprVisitor& visitor) const override;                                                      \
                                                                                                                       \
    private:                                                                                                           \
        friend class SymbolicExprTable;                                                                                \
        explicit Class(const typename NodeBase::Shape& payload) : NodeBase(payload) {}                                 \
    };
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

// Instantiated in Nodes.cpp alone: every source that builds nodes would compile the table's probing again.
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    extern template void SymbolicExprTable::intern<Class>(const Class::NodeBase::Shape&);
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

} // namespace VT
