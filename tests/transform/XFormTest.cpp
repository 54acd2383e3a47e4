// The rebuilding bases: identity, the stack, the construction hooks.
#include "base/transform/XForm.hpp"

#include "base/variants/Features.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "tests/support/HostTables.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <stdexcept>

namespace VT::Testing {
namespace {

/// Opens the stack.
class Rebuild : public SymbolicExprXFormVisitor {
public:
    using SymbolicExprXFormVisitor::depth;
    using SymbolicExprXFormVisitor::pop;
    using SymbolicExprXFormVisitor::push;
    using SymbolicExprXFormVisitor::SymbolicExprXFormVisitor;
};

TEST(XForm, TheResultIsTheOnlyOneOnTheStack) {
    SymbolicExprTable table;
    Rebuild visitor(table);
    EXPECT_EQ(visitor.get(), 0xffffffffffffffff);
    visitor.push(3);
    visitor.push(4);
    EXPECT_EQ(visitor.get(), invalidId);
    EXPECT_EQ(visitor.pop(), 4U) << "the stack is as it was";
    EXPECT_EQ(visitor.get(), 3U);
    EXPECT_EQ(visitor.get(), invalidId) << "taken";
}

TEST(XForm, WhatIsNotThereIsAnswered) {
    SymbolicExprTable source, target;
    Rebuild visitor(target);
    visitor.push(5);
    for (const SymbolicExprId id : {SymbolicExprId{0}, invalidId}) {
        EXPECT_EQ(visitor.rebuild(source, id), invalidId);
        visitor.execute(source, id);
    }
    EXPECT_EQ(visitor.get(), 5U) << "what was on the stack before a run is there after it";
    EXPECT_EQ(target.size(), 0U);
}

TEST(XForm, RepeatedVisitsAreBounded) {
    // A visitor that leaves two results for a name, over more paths than could be walked.
    class Doubling final : public Rebuild {
    public:
        using Rebuild::Rebuild;
        using Rebuild::visit;

        void visit(const SymbolicString& node) override {
            Rebuild::visit(node);
            push(top());
        }
    };

    SymbolicExprTable table;
    const Trees tree{table};
    const SymbolicExprId doubled = tree.doubled(SymbolicOp::Plus, tree.name("x"));
    EXPECT_EQ(Doubling(table).rebuild(table, doubled), invalidId);

    // Nodes of a host's table that all lead to each other.
    HostTable host;
    for (SymbolicExprId id = 0; id < 40; ++id)
        SymbolicRowExpr(host, {0U, (id + 1) % 40, (id + 7) % 40, (id + 13) % 40, id / 2, 39U - id});
    EXPECT_TRUE(table.has(Rebuild(table).rebuild(host, 0)));
}

TEST(XForm, ARunThatThrowsLeavesNothingBehind) {
    class Throwing final : public Rebuild {
    public:
        using Rebuild::Rebuild;
        using Rebuild::visit;

        void visit(const SymbolicIntValue& node) override {
            if (node.getValue() == 13)
                throw std::runtime_error("thirteen");
            Rebuild::visit(node);
        }
    };

    SymbolicExprTable source, target;
    Throwing visitor(target);
    EXPECT_THROW(visitor.rebuild(source, readTree(source, "Plus(Plus(x,12),13)")), std::runtime_error);
    EXPECT_EQ(visitor.depth(), 0U);
    EXPECT_EQ(treeText(target, visitor.rebuild(source, readTree(source, "Plus(x,12)"))), "Plus(x,12)");
}

TEST(XForm, KeywordsAreInternedInTheTarget) {
    SymbolicExprTable target;
    const Rebuild visitor(target);
    EXPECT_EQ(treeText(target, visitor.getSimVariantKeywordId()), VariantKeywords::getSimVariantKeyword());
    EXPECT_EQ(treeText(target, visitor.getCodegenVariantKeywordId()), VariantKeywords::getCodegenVariantKeyword());
    EXPECT_EQ(visitor.getSimVariantKeywordId(), 0U);
    EXPECT_EQ(visitor.isVariantKeywordsSimCodegenFeatureOn(), isVariantKeywordsSimCodegenFeatureOn());
}

/// Builds others than were visited.
class Hooks final : public SymbolicExprXFormVisitor2 {
public:
    using SymbolicExprXFormVisitor2::SymbolicExprXFormVisitor2;

    /// Slots of the hooks in the order of the operators; -1 for those with any number of operands.
    static std::vector<std::ptrdiff_t> slots() {
        return {
#define VTSYM_OPERATOR(Code, Name, Class, ...) slotOfHook<Class>(),
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
        };
    }

protected:
    using SymbolicExprXFormVisitor2::buildExpr;

    SymbolicExprId buildExpr(OpTag<SymbolicOp::DoubleValue>, double value) override {
        return SymbolicIntValue(table(), static_cast<int>(value)).getId(table());
    }

    SymbolicExprId buildExpr(OpTag<SymbolicOp::Minus>, SymbolicExprId left, SymbolicExprId right) override {
        return SymbolicPlusExpr(table(), right, left).getId(table());
    }

    SymbolicExprId buildExpr(OpTag<SymbolicOp::QColon3>, SymbolicExprId a, SymbolicExprId b,
                             SymbolicExprId c) override {
        return SymbolicFcnCallExpr(table(), std::string("range"), {a, b, c}).getId(table());
    }

    SymbolicExprId buildExpr(OpTag<SymbolicOp::MemberValue>, SymbolicExprId owner, const std::string& name) override {
        return SymbolicMemberValue(table(), owner, name + "_").getId(table());
    }

private:
    template <class Node>
    static std::ptrdiff_t slotOfHook() {
        using Id = SymbolicExprId;
        if constexpr (std::is_same_v<Node, SymbolicString>)
            return slot<Node, const std::string&>();
        else if constexpr (std::is_same_v<Node, SymbolicIntValue>)
            return slot<Node, int>();
        else if constexpr (std::is_same_v<Node, SymbolicDoubleValue>)
            return slot<Node, double>();
        else if constexpr (std::is_same_v<Node, SymbolicMemberValue>)
            return slot<Node, Id, const std::string&>();
        else if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>)
            return slot<Node, Id>();
        else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>)
            return slot<Node, Id, Id>();
        else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>)
            return slot<Node, Id, Id, Id>();
        else
            return -1;
    }

    template <class Node, class... Parts>
    static std::ptrdiff_t slot() {
        return slotOf(static_cast<SymbolicExprId (Hooks::*)(OpTag<Node::code>, Parts...)>(&Hooks::buildExpr));
    }
};

TEST(XForm, HooksDecideWhatIsBuilt) {
    SymbolicExprTable source, target;
    const SymbolicExprId row = readTree(source, "Row(QColon3(Minus(x,2.5r),MemberValue(x,m),x),Minus(x,2.5r))");
    Hooks visitor(target);
    EXPECT_EQ(treeText(target, visitor.rebuild(source, row)),
              "Row(FcnCall(range,Plus(2,x),MemberValue(x,m_),x),Plus(2,x))");
}

TEST(XForm, HooksFollowTheVisitsInTheOrderOfTheOperators) {
    std::vector<std::ptrdiff_t> slots = Hooks::slots();
    EXPECT_EQ(std::erase(slots, -1), 5U);
    ASSERT_EQ(slots.size(), 43U);
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], static_cast<std::ptrdiff_t>(51 + i));
}

} // namespace
} // namespace VT::Testing
