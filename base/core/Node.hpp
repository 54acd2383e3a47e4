// The immutable expression node: the interface of every node class.
#pragma once

#include "base/core/Operators.hpp"
#include "host/Export.hpp"

#include <concepts>
#include <cstddef>
#include <cstdint>

namespace VT {

/// Identifier of an interned node: its position in its table, dense from 0 in interning order.  Means nothing without
/// its table.
using SymbolicExprId = std::uint64_t;

/// The identifier of no node: all bits set.
inline constexpr SymbolicExprId invalidId = ~SymbolicExprId{0};

class SymbolicExprTable;
class SymbolicExprVisitor;

/// An immutable expression node.  A node names its operands by identifier, never by pointer, and has a meaning only
/// together with the table that holds them.  Two structurally equal nodes of one table share one identifier.
///
/// The order of the virtual functions is fixed: hosts call them by slot.
class VTSYM_API SymbolicExpr {
public:
    SymbolicExpr& operator=(const SymbolicExpr&) = delete;
    virtual ~SymbolicExpr() = default;

    /// The operator code of the node's class.
    [[nodiscard]] virtual SymbolicOp op() const = 0;
    /// Structural equality; decides which nodes are interned as one.  A dimension list or call of the generic class
    /// equals its twin of the class with a fixed number of operands.
    [[nodiscard]] virtual bool operator==(const SymbolicExpr& other) const = 0;
    /// The hash of the node; equal nodes have equal hashes, but for real literals that are equal only within the
    /// tolerance.
    [[nodiscard]] virtual std::uint64_t getHash() const = 0;
    /// Number of operands.
    [[nodiscard]] virtual std::size_t getNumInputs() const;
    /// Whether the node is an identifier or a literal.
    [[nodiscard]] virtual bool isTermExpr() const;
    /// Whether the node is a literal number.
    [[nodiscard]] virtual bool isNumValue() const;
    [[nodiscard]] virtual bool isUnaryExpr() const;
    [[nodiscard]] virtual bool isBinaryExpr() const;
    [[nodiscard]] virtual bool isTernaryExpr() const;
    [[nodiscard]] virtual bool isMultiExpr() const;
    /// Whether the node is a call of a class with a fixed number of arguments; false for the generic call class.
    [[nodiscard]] virtual bool isFcnCallExpr() const;
    /// The value of a literal number; 2^64 for every other node.
    [[nodiscard]] virtual double getNumValue() const;
    /// The operand at a position below getNumInputs().  A position out of range is a fatal diagnostic; the unary and
    /// the many-operand classes check it only while the host's assertion switch is on and otherwise return the only
    /// operand, or the invalid identifier.
    [[nodiscard]] virtual SymbolicExprId getInput(std::size_t aIdx) const;
    /// Number of entries of a dimension list, 0 for other nodes.
    [[nodiscard]] virtual std::size_t getNumDimensions() const;
    /// Number of arguments of a call, of operands after the head of a cell array; 0 for other nodes.
    [[nodiscard]] virtual std::size_t getNumArgs() const;
    /// Visits every occurrence of a node below and including this one: operands first, or the node first where the
    /// visitor's isBottomUpVistor() says so.  A shared operand is visited once for every path to it, one that is
    /// missing (SymbolicExprTable::hasOperand) not at all, nor a node as its own operand's operand.  The stack does not
    /// grow with depth.
    virtual void accept(const SymbolicExprTable& table, SymbolicExprVisitor& visitor) const = 0;
    /// Calls the visit operation for this node's class and nothing else.
    virtual void invoke(SymbolicExprVisitor& visitor) const = 0;

    /// The identifier of the interned node equal to this one, or the invalid identifier.
    [[nodiscard]] SymbolicExprId getId(const SymbolicExprTable& table) const;

protected:
    SymbolicExpr() = default;
    SymbolicExpr(const SymbolicExpr&) = default;
};

/// Structural equality of nodes of any two classes.  Fits both better than the virtual operation of either, which the
/// language would also try with the sides exchanged.
template <std::derived_from<SymbolicExpr> Left, std::derived_from<SymbolicExpr> Right>
[[nodiscard]] bool operator==(const Left& left, const Right& right) {
    return static_cast<const SymbolicExpr&>(left).operator==(static_cast<const SymbolicExpr&>(right));
}

} // namespace VT
