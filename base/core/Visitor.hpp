// The visitor interface over node classes.
#pragma once

#include "base/core/Node.hpp"

namespace VT {

#define VTSYM_OPERATOR(Code, Name, Class, ...) class Class;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

/// One visit operation for each node class, in the order of the operator codes: the slot of a class is its code plus 3.
class VTSYM_API SymbolicExprVisitor {
public:
    virtual ~SymbolicExprVisitor() = default;

    /// Whether accept() visits operands before their node; execute() always does.
    [[nodiscard]] virtual bool isBottomUpVistor() const;

#define VTSYM_OPERATOR(Code, Name, Class, ...) virtual void visit(const Class& node) = 0;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// Visits every occurrence of a node below and including `id`, operands from left to right and then their node.  A
    /// shared operand is visited once for every path to it, one that is missing (SymbolicExprTable::hasOperand) not at
    /// all, nor a node as its own operand's operand.  The stack does not grow with depth; an identifier that is not of
    /// the table is not visited.
    void execute(const SymbolicExprTable& table, SymbolicExprId id);

protected:
    SymbolicExprVisitor() = default;
    SymbolicExprVisitor(const SymbolicExprVisitor&) = default;
    SymbolicExprVisitor& operator=(const SymbolicExprVisitor&) = default;
};

/// Routes the 48 visits to overloads `on(const X&)` of `Derived`, so that a visitor writes one function for a shape and
/// one for each class that differs.  A class without any fitting overload does not compile.
template <class Derived, class Base = SymbolicExprVisitor>
class RoutedVisitor : public Base {
public:
    using Base::Base;
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void visit(const Class& node) override {                                                                           \
        static_cast<Derived&>(*this).on(node);                                                                         \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
};

} // namespace VT
