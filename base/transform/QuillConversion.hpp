// Conversion between the two shapes of one operation: the C operator and the call of a Quill function.
#pragma once

#include "base/transform/QuillCalls.hpp"
#include "base/transform/XForm.hpp"

#include <array>
#include <span>

namespace VT {

/// The base of both conversions: holds the identifiers of the function names, so that names are compared as
/// identifiers.  A node that lacks an operand is not converted.
class VTSYM_API QuillCallVisitor : public SymbolicExprXFormVisitor {
protected:
    /// Interns idivide, rem, bitand, bitor, bitxor, bitcmp and bitshift in this order.
    explicit QuillCallVisitor(SymbolicExprTable& target);

    /// The identifier of the name of the function that stands for an operator.
    [[nodiscard]] SymbolicExprId nameOf(SymbolicOp op) const;
    /// The operator whose function has this name and number of arguments, or None; ShiftLeft for both shifts.
    [[nodiscard]] SymbolicOp operatorOf(SymbolicExprId name, std::size_t arguments) const;
    /// Builds a shift's amount.
    SymbolicExprId make(const ShiftAmount& amount);

    using SymbolicExprXFormVisitor::visit;

private:
    std::array<SymbolicExprId, quillCalls.size()> names_{};
};

/// Quill calls become C operators: `idivide(a,b)` becomes a / b, `bitshift(a,-2)` becomes a >> 2.  A call is known by
/// its name and its number of arguments, whichever call class holds it; every other call stays.
class VTSYM_API SymbolicExprQ2CVisitor : public QuillCallVisitor {
public:
    explicit SymbolicExprQ2CVisitor(SymbolicExprTable& target) : QuillCallVisitor(target) {}

    using QuillCallVisitor::visit;
    void visit(const SymbolicFcnCall0UExpr& node) override;
    void visit(const SymbolicFcnCall1UExpr& node) override;
    void visit(const SymbolicFcnCall2UExpr& node) override;
    void visit(const SymbolicFcnCallExpr& node) override;

private:
    template <class Call>
    void convert(const Call& node);
    SymbolicExprId build(SymbolicOp op, std::span<const SymbolicExprId> arguments);
};

/// C operators become Quill calls: a % b becomes `rem(a,b)`, and every division `idivide(a,b)`, because a C division is
/// one of integers.
class VTSYM_API SymbolicExprC2QVisitor : public QuillCallVisitor {
public:
    explicit SymbolicExprC2QVisitor(SymbolicExprTable& target) : QuillCallVisitor(target) {}

    using QuillCallVisitor::visit;
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void visit(const Class& node) override {                                                                           \
        convert(node);                                                                                                 \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

private:
    template <class Node>
    void convert(const Node& node) {
        if constexpr (quillCallOps.contains(Node::code))
            if (!lacksOperand(node))
                return callFor(Node::code);
        SymbolicExprXFormVisitor::visit(node);
    }

    void callFor(SymbolicOp op);
};

/// Converts expressions of one table to C shape, in that table.
class VTSYM_API SymbolicExprQ2C {
public:
    explicit SymbolicExprQ2C(SymbolicExprTable& table) : table_(table) {}

    /// The C shape of an expression: the expression itself where nothing is converted.  An identifier that is not of
    /// the table yields the invalid one.  Linear in the number of distinct nodes.
    SymbolicExprId operator()(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

/// Converts expressions of one table to Quill shape, in that table.
class VTSYM_API SymbolicExprC2Q {
public:
    explicit SymbolicExprC2Q(SymbolicExprTable& table) : table_(table) {}

    /// The Quill shape of an expression: the expression itself where nothing is converted.  An identifier that is not
    /// of the table yields the invalid one.  Linear in the number of distinct nodes.
    SymbolicExprId operator()(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

} // namespace VT
