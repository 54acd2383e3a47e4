// The bases of visitors that rebuild an expression bottom-up into a table.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/core/OperandStack.hpp"
#include "base/util/IdMap.hpp"

#include <cmath>
#include <cstdint>

namespace VT {

/// Makes nodes in one table.
class VTSYM_API SymbolicExprFactory {
public:
    explicit SymbolicExprFactory(SymbolicExprTable& table) : table_(table) {}

    SymbolicExprFactory(const SymbolicExprFactory&) = delete;
    SymbolicExprFactory& operator=(const SymbolicExprFactory&) = delete;
    virtual ~SymbolicExprFactory();

    /// The identifier of the node of class Node with these parts, interned if it was not there.  A NaN is always a new
    /// node; a table that keeps its nodes elsewhere and does not find it has the invalid identifier for it.
    template <class Node, class... Parts>
    SymbolicExprId make(Parts&&... parts) {
        const Node node(table_, std::forward<Parts>(parts)...);
        const SymbolicExprId id = node.getId(table_);
        if constexpr (Node::equalWithinTolerance)
            return id == invalidId ? newestNaN() : id; // it equals nothing, not even the copy that was added just now
        return id;
    }

private:
    [[nodiscard]] SymbolicExprId newestNaN() const;

    SymbolicExprTable& table_;
};

/// Rebuilds every node as it is.  A subclass overrides the visits of the classes that it changes and keeps the
/// discipline of the stack: a visit pops its node's operands, the last one first, and pushes exactly one identifier.  A
/// visit of the base rebuilds the node that it is given, whichever node is visited.
///
/// For a missing operand the invalid identifier is on the stack, and the rebuilt node has that for its operand.
class VTSYM_API SymbolicExprXFormVisitor : public SymbolicExprVisitor, public OperandStack {
public:
    /// A visitor that builds in `target`.
    explicit SymbolicExprXFormVisitor(SymbolicExprTable& target);
    ~SymbolicExprXFormVisitor() override;

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// The result of a completed run, taken from the stack; the invalid identifier, and the stack as it was, unless
    /// exactly one result is there.
    SymbolicExprId get();

    /// Rebuilds the expression `id` of `source`: visits each distinct node once and hands its result to further
    /// occurrences, so the work is in the number of nodes, not of paths.  The results are those of execute() and get():
    /// the invalid identifier where `id` is not of the source, or where the run does not leave exactly one result.
    /// Where a visit does not keep the discipline, or nodes of a host's table lead in a circle, nodes are visited again
    /// as execute() does, up to limits::repeatedVisits.  Afterwards, also when a visit throws, the stack is as before
    /// the call; what was interned stays.
    SymbolicExprId rebuild(const SymbolicExprTable& source, SymbolicExprId id);

    /// Whether the variant keywords are in force: the feature flag "VariantKeywordsSimCodegen" is greater than 0 now.
    [[nodiscard]] bool isVariantKeywordsSimCodegenFeatureOn() const;
    /// The identifiers of the keywords in the target table; interned if they were not there.
    [[nodiscard]] SymbolicExprId getSimVariantKeywordId() const;
    [[nodiscard]] SymbolicExprId getCodegenVariantKeywordId() const;

protected:
    [[nodiscard]] SymbolicExprTable& table() const noexcept {
        return table_;
    }

    /// The same for a subclass that keeps the results of several runs, by the source's identifiers.
    SymbolicExprId rebuild(const SymbolicExprTable& source, SymbolicExprId id, IdMap<SymbolicExprId>& results);

    /// Visits one node of the source, for drivers of a subclass's own.  `id` is the
    /// invalid one unless source and target are one table.
    void visitAs(SymbolicExprId id, const SymbolicExpr& node);

    /// Whether one of the topmost results, the operands of the node that is visited, is missing.
    [[nodiscard]] bool lacksOperand(const SymbolicExpr& node) const noexcept {
        return holdsInvalid(node.getNumInputs());
    }

    /// The identifier of a real literal; a NaN that is visited in place is the literal itself.
    SymbolicExprId makeReal(double value);

    /// Whether the keyword feature was on when the visitor was made.  A subclass may switch it off for itself.
    bool keywordsOn;
    std::uint64_t operandLimit; ///< operands that a subclass flattens from one chain
    /// Whether a subclass has met a chain of more than operandLimit operands, or has given up for another reason: the
    /// result of the run is not to be used.
    bool gaveUp = false;
    SymbolicExprFactory factory_;

private:
    template <class Node>
    SymbolicExprId identity(const Node& node);

    SymbolicExprTable& table_;
};

/// Selects one of the construction hooks of SymbolicExprXFormVisitor2.
template <SymbolicOp Op>
struct OpTag {};

/// Rebuilds every node through a construction hook of its class, so that a subclass changes what is built without
/// repeating how operands are handled.  A hook takes the payload or the rebuilt operands in input order and returns
/// what was built; the base hooks build the same class.  The classes with a vector of operands have no hook.
class VTSYM_API SymbolicExprXFormVisitor2 : public SymbolicExprXFormVisitor {
public:
    using SymbolicExprXFormVisitor::SymbolicExprXFormVisitor;

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

protected:
// The parts of each shape: declared, and handed on.  A shape with a vector of operands has no hook.
#define VTSYM_HOOK(Class, ...) virtual SymbolicExprId buildExpr(OpTag<Class::code>, __VA_ARGS__)
#define VTSYM_HOOK_String(Class)                                                                                       \
    VTSYM_HOOK(Class, const std::string& name) {                                                                       \
        return factory_.make<Class>(name);                                                                             \
    }
#define VTSYM_HOOK_Int(Class)                                                                                          \
    VTSYM_HOOK(Class, int value) {                                                                                     \
        return factory_.make<Class>(value);                                                                            \
    }
#define VTSYM_HOOK_Double(Class)                                                                                       \
    VTSYM_HOOK(Class, double value) {                                                                                  \
        return makeReal(value);                                                                                        \
    }
#define VTSYM_HOOK_Unary(Class)                                                                                        \
    VTSYM_HOOK(Class, SymbolicExprId a) {                                                                              \
        return factory_.make<Class>(a);                                                                                \
    }
#define VTSYM_HOOK_Binary(Class)                                                                                       \
    VTSYM_HOOK(Class, SymbolicExprId a, SymbolicExprId b) {                                                            \
        return factory_.make<Class>(a, b);                                                                             \
    }
#define VTSYM_HOOK_Ternary(Class)                                                                                      \
    VTSYM_HOOK(Class, SymbolicExprId a, SymbolicExprId b, SymbolicExprId c) {                                          \
        return factory_.make<Class>(a, b, c);                                                                          \
    }
#define VTSYM_HOOK_Member(Class)                                                                                       \
    VTSYM_HOOK(Class, SymbolicExprId owner, const std::string& name) {                                                 \
        return factory_.make<Class>(owner, name);                                                                      \
    }
#define VTSYM_HOOK_Dims2(Class) VTSYM_HOOK_Binary(Class)
#define VTSYM_HOOK_Dims3(Class) VTSYM_HOOK_Ternary(Class)
#define VTSYM_HOOK_Call0(Class) VTSYM_HOOK_Unary(Class)
#define VTSYM_HOOK_Call1(Class) VTSYM_HOOK_Binary(Class)
#define VTSYM_HOOK_Call2(Class) VTSYM_HOOK_Ternary(Class)
#define VTSYM_HOOK_DimsN(Class)
#define VTSYM_HOOK_CallN(Class)
#define VTSYM_HOOK_Multi(Class)
#define VTSYM_HOOK_Cell(Class)
#define VTSYM_OPERATOR(Code, Name, Class, Shape, ...) VTSYM_HOOK_##Shape(Class)
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
#undef VTSYM_HOOK
#undef VTSYM_HOOK_String
#undef VTSYM_HOOK_Int
#undef VTSYM_HOOK_Double
#undef VTSYM_HOOK_Unary
#undef VTSYM_HOOK_Binary
#undef VTSYM_HOOK_Ternary
#undef VTSYM_HOOK_Member
#undef VTSYM_HOOK_Dims2
#undef VTSYM_HOOK_Dims3
#undef VTSYM_HOOK_Call0
#undef VTSYM_HOOK_Call1
#undef VTSYM_HOOK_Call2
#undef VTSYM_HOOK_DimsN
#undef VTSYM_HOOK_CallN
#undef VTSYM_HOOK_Multi
#undef VTSYM_HOOK_Cell

private:
    template <class Node>
    SymbolicExprId viaHook(const Node& node);
};

} // namespace VT
