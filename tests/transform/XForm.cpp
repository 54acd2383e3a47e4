// The rebuilding bases: identity, the stack, the construction hooks.
#include "base/transform/XForm.hpp"

#include "base/variants/Features.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/TreeText.hpp"

#include <rapidcheck/gtest.h>

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

class HookedRebuild : public SymbolicExprXFormVisitor2 {
public:
    using SymbolicExprXFormVisitor2::SymbolicExprXFormVisitor2;
};

enum class Way { Execute, Accept, Rebuild };

template <class Visitor, Way way>
SymbolicExprId driven(const SymbolicExprTable& source, SymbolicExprId id, SymbolicExprTable& target) {
    Visitor visitor(target);
    if (way == Way::Rebuild) {
        const SymbolicExprId result = visitor.rebuild(source, id);
        EXPECT_EQ(visitor.get(), invalidId) << "nothing is left behind";
        return result;
    }
    way == Way::Execute ? visitor.execute(source, id) : source.get(id)->accept(source, visitor);
    return visitor.get();
}

constexpr std::array drivers{driven<Rebuild, Way::Execute>,      driven<Rebuild, Way::Accept>,
                             driven<Rebuild, Way::Rebuild>,      driven<HookedRebuild, Way::Execute>,
                             driven<HookedRebuild, Way::Accept>, driven<HookedRebuild, Way::Rebuild>};
constexpr auto executed = drivers[0], rebuilt = drivers[2];

/// A table of random nodes of all classes whose unfolded trees stay small, with truth about their size.
struct RandomTable {
    explicit RandomTable(std::uint64_t seed) {
        std::mt19937_64 random(seed);
        while (table.size() < 60) {
            const SymbolicExprId id = makeRandom(table, random);
            if (id < sizes.size())
                continue;
            double size = 1;
            for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
                size += sizes[table.get(id)->getInput(i)];
            sizes.push_back(size);
        }
    }

    SymbolicExprTable table;
    std::vector<double> sizes;
};

RC_GTEST_PROP(XForm, IsNothingNewInATableAndTheSameTreeInAnother, (std::uint64_t seed)) {
    RandomTable random(seed);
    for (const auto driver : drivers) {
        SymbolicExprTable target;
        SymbolicIntValue(target, 4711); // identifiers are others there
        for (SymbolicExprId id = 0; id < random.table.size(); ++id) {
            if (random.sizes[id] > 3000)
                continue;
            RC_ASSERT(driver(random.table, id, random.table) == id);
            RC_ASSERT(treeText(target, driver(random.table, id, target)) == treeText(random.table, id));
        }
        RC_ASSERT(random.table.size() == random.sizes.size());
        RC_ASSERT(target.size() <= 1 + random.table.size()); // what is shared stays shared
    }
}

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
    SymbolicExprTable source;
    const SymbolicExprId x = SymbolicString(source, "x").getId(source);
    const SymbolicExprId self = SymbolicPlusExpr(source, 1U, x).getId(source);
    const SymbolicExprId row = SymbolicRowExpr(source, {invalidId, x, 77U}).getId(source);
    SymbolicExprTable target;
    EXPECT_EQ(Rebuild(target).rebuild(source, 3), invalidId);
    EXPECT_EQ(Rebuild(target).rebuild(source, invalidId), invalidId);
    EXPECT_EQ(executed(source, invalidId, target), invalidId);
    EXPECT_EQ(target.size(), 0U);
    EXPECT_EQ(treeText(target, rebuilt(source, self, target)), "Plus(invalid,x)");
    EXPECT_EQ(treeText(target, rebuilt(source, row, target)), "Row(invalid,x,invalid)");
    for (const auto driver : drivers) // visits only what is there; whatever the answer is, it is one
        for (const SymbolicExprId id : {self, row})
            EXPECT_TRUE(target.has(driver(source, id, target)));
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

    SymbolicExprTable source;
    const SymbolicString x(source, "x");
    const SymbolicPlusExpr good(source, x, SymbolicIntValue(source, 12));
    const SymbolicExprId bad = SymbolicPlusExpr(source, good, SymbolicIntValue(source, 13)).getId(source);
    SymbolicExprTable target;
    Throwing visitor(target);
    EXPECT_THROW(visitor.rebuild(source, bad), std::runtime_error);
    EXPECT_EQ(visitor.depth(), 0U);
    EXPECT_EQ(treeText(target, visitor.rebuild(source, good.getId(source))), "Plus(x,12)");
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

    /// Slots of the hooks in the order of the operators.
    static std::vector<std::ptrdiff_t> slots() {
        std::vector<std::ptrdiff_t> all;
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    if (operandCount(SymbolicOp::Name))                                                                                \
        all.push_back(slotOfHook<Class>());
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
        return all;
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
        using Tag = OpTag<Node::code>;
        using Self = SymbolicExprXFormVisitor2;
        if constexpr (std::is_same_v<Node, SymbolicString>)
            return slotOf(static_cast<Id (Self::*)(Tag, const std::string&)>(&Hooks::buildExpr));
        else if constexpr (std::is_same_v<Node, SymbolicIntValue>)
            return slotOf(static_cast<Id (Self::*)(Tag, int)>(&Hooks::buildExpr));
        else if constexpr (std::is_same_v<Node, SymbolicDoubleValue>)
            return slotOf(static_cast<Id (Hooks::*)(Tag, double)>(&Hooks::buildExpr));
        else if constexpr (std::is_same_v<Node, SymbolicMemberValue>)
            return slotOf(static_cast<Id (Hooks::*)(Tag, Id, const std::string&)>(&Hooks::buildExpr));
        else if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>)
            return slotOf(static_cast<Id (Hooks::*)(Tag, Id)>(&Hooks::buildExpr));
        else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>)
            return slotOf(static_cast<Id (Hooks::*)(Tag, Id, Id)>(&Hooks::buildExpr));
        else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>)
            return slotOf(static_cast<Id (Hooks::*)(Tag, Id, Id, Id)>(&Hooks::buildExpr));
        else
            return -1;
    }
};

TEST(XForm, HooksDecideWhatIsBuilt) {
    SymbolicExprTable source;
    const SymbolicString x(source, "x");
    const SymbolicMinusExpr difference(source, x, SymbolicDoubleValue(source, 2.5));
    const SymbolicMemberValue member(source, x, "m");
    const SymbolicQColon3Expr range(source, difference, member, x);
    const SymbolicExprId row = SymbolicRowExpr(source, {range.getId(source), difference.getId(source)}).getId(source);
    SymbolicExprTable target;
    Hooks visitor(target);
    EXPECT_EQ(treeText(target, visitor.rebuild(source, row)),
              "Row(FcnCall(range,Plus(2,x),MemberValue(x,m_),x),Plus(2,x))");
}

TEST(XForm, HooksFollowTheVisitsInTheOrderOfTheOperators) {
    const std::vector<std::ptrdiff_t> slots = Hooks::slots();
    ASSERT_EQ(slots.size(), 43U);
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], static_cast<std::ptrdiff_t>(51 + i));
}

} // namespace
} // namespace VT::Testing
