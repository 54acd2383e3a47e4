// Visitors and tables as hosts write them: every driver against one model, which is a stack of texts and recursion.
#include "base/transform/Cast2Int.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"
#include "base/transform/XForm.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/HostTables.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <optional>

namespace VT::Testing {
namespace {

constexpr const char* missingText = "invalid";
constexpr const char* noResult = "none";

/// What a visitor of a host does with its stack, in terms of texts.
class Model {
public:
    using Stack = std::vector<std::string>;

    virtual ~Model() = default;

    virtual void visit(Stack& stack, const SymbolicExpr& node) const { rebuild(stack, node, node.op()); }

protected:
    static std::string pop(Stack& stack) {
        if (stack.empty())
            return missingText;
        std::string last = stack.back();
        stack.pop_back();
        return last;
    }

    static void rebuild(Stack& stack, const SymbolicExpr& node, SymbolicOp op) {
        std::string text;
        for (std::size_t i = node.getNumInputs(); i > 0; --i)
            text = (i > 1 ? "," : "") + pop(stack) + text;
        if (op == SymbolicOp::MemberValue)
            text += "," + static_cast<const SymbolicMemberValue&>(node).getMemberName();
        stack.push_back(node.isTermExpr() ? leaf(node) : nameOf(op, node.getNumInputs()) + "(" + text + ")");
    }

    static std::string leaf(const SymbolicExpr& node) {
        if (node.op() == SymbolicOp::String)
            return static_cast<const SymbolicString&>(node).getName();
        return node.op() == SymbolicOp::IntValue ? std::to_string(static_cast<int>(node.getNumValue()))
               : node.getNumValue() == 0         ? "0r" // the sign is not kept
                                                 : realText(node.getNumValue());
    }

private:
    /// One name for the classes that stand for each other.
    static std::string nameOf(SymbolicOp op, std::size_t inputs) {
        if (callOps.contains(op))
            return "Call" + std::to_string(inputs);
        return dimensionOps.contains(op) ? "Dims" + std::to_string(inputs) : std::string(operatorInfo(op).name);
    }
};

/// The text that a run leaves; nothing where there are many occurrences.
std::optional<std::string> run(NumberedTable& table, SymbolicExprId root, const Model& model, bool bottomUp = true) {
    Model::Stack stack;
    Recursion recursion(
        table, bottomUp, [&](const SymbolicExpr& node) { model.visit(stack, node); },
        [&] { stack.emplace_back(missingText); }, 600);
    if (!recursion(root))
        return std::nullopt;
    return stack.size() == 1 ? stack.back() : noResult;
}

std::string textOf(NumberedTable& table, SymbolicExprId id) {
    return table.table().has(id) ? run(table, id, Model()).value_or("large") : noResult;
}

using Rebuild = SymbolicExprXFormVisitor;
using HookedRebuild = SymbolicExprXFormVisitor2;

class TopDown final : public Rebuild {
public:
    using Rebuild::Rebuild;

    [[nodiscard]] bool isBottomUpVistor() const override { return false; }
};

/// Hands other nodes to the base than it was given.
template <class Base>
class Exchanging final : public Base {
public:
    using Base::Base;
    using Base::visit;

    void visit(const SymbolicPlusExpr&) override { Base::visit(SymbolicMinusExpr(scratch_, 0U, 0U)); }

    void visit(const SymbolicEqualExpr& node) override {
        Base::visit(SymbolicEqualExpr(scratch_, node.left(), node.right())); // the same again, elsewhere
    }

    void visit(const SymbolicString& node) override {
        node.getName() == "a" ? Base::visit(SymbolicString(scratch_, "b")) : Base::visit(SymbolicIntValue(scratch_, 7));
    }

    void visit(const SymbolicRowExpr& node) override {
        Base::visit(SymbolicMatrixExpr(scratch_, std::vector<SymbolicExprId>(node.inputs())));
    }

private:
    SymbolicExprTable scratch_;
};

class ExchangingModel final : public Model {
public:
    void visit(Stack& stack, const SymbolicExpr& node) const override {
        const SymbolicOp op = node.op();
        if (op == SymbolicOp::String)
            stack.emplace_back(leaf(node) == "a" ? "b" : "7");
        else
            rebuild(stack, node,
                    op == SymbolicOp::Plus  ? SymbolicOp::Minus
                    : op == SymbolicOp::Row ? SymbolicOp::Matrix
                                            : op);
    }
};

/// Pushes too much for some nodes, too little for others, and makes up for it in others again.
class Undisciplined final : public Rebuild {
public:
    using Rebuild::Rebuild;
    using Rebuild::visit;

    void visit(const SymbolicString& node) override {
        if (node.getName() == "c")
            return;
        Rebuild::visit(node);
        if (node.getName() == "a")
            push(top());
    }

    void visit(const SymbolicNotExpr&) override { pop(), pop(); }

    void visit(const SymbolicMinusExpr& node) override {
        Rebuild::visit(node);
        push(top());
    }

    void visit(const SymbolicPlusExpr& node) override {
        pop();
        Rebuild::visit(node);
    }
};

class UndisciplinedModel final : public Model {
public:
    void visit(Stack& stack, const SymbolicExpr& node) const override {
        const std::string name = node.op() == SymbolicOp::String ? leaf(node) : "";
        if (name == "c")
            return;
        if (node.op() == SymbolicOp::Not || node.op() == SymbolicOp::Plus)
            pop(stack);
        if (node.op() == SymbolicOp::Not)
            pop(stack);
        else
            rebuild(stack, node, node.op());
        if (name == "a" || node.op() == SymbolicOp::Minus)
            stack.push_back(stack.back());
    }
};

/// Runs a visitor by accept(), execute() and rebuild(), in place and into another table, over broken graphs of tables
/// of each kind; how many results there were.
template <class Visitor>
std::size_t compareDrivers(const Model& model, bool acceptsBottomUp = true) {
    std::size_t results = 0;
    forBrokenGraphs(11, 40, 25, [&](NumberedTable& source, const std::vector<SymbolicExprId>& ids) {
        const SymbolicExprTable& nodes = source.table();
        NumberedTable elsewhere(new SymbolicExprTable);
        SymbolicIntValue(elsewhere.table(), 4711); // identifiers are others there
        for (NumberedTable* const target : {&elsewhere, &source}) {
            for (const SymbolicExprId root : ids) {
                const auto after = run(source, root, model);
                const auto before = acceptsBottomUp ? after : run(source, root, model, false);
                if (!after || !before)
                    continue;
                Visitor visitor(target->table());
                visitor.execute(nodes, root);
                const SymbolicExprId executed = visitor.get();
                // A host's table that does not find a NaN cannot tell which node it has become.
                const bool isLost = !target->isOrdered() && after->find("nan") != std::string::npos &&
                                    textOf(*target, executed) != *after;
                if (isLost)
                    continue;
                ASSERT_EQ(textOf(*target, executed), *after);
                results += *after != noResult ? 1 : 0;
                const SymbolicExprId rebuilt = Visitor(target->table()).rebuild(nodes, root);
                ASSERT_EQ(textOf(*target, rebuilt), *after);
                Visitor accepting(target->table());
                nodes.get(root)->accept(nodes, accepting);
                ASSERT_EQ(textOf(*target, accepting.get()), *before);
            }
        }
    });
    return results;
}

TEST(HostVisitors, EveryDriverAgreesWithTheModel) {
    EXPECT_GT(compareDrivers<Rebuild>(Model()), 5000U);
    EXPECT_GT(compareDrivers<HookedRebuild>(Model()), 5000U);
    EXPECT_GT(compareDrivers<TopDown>(Model(), false), 5000U);
    EXPECT_GT(compareDrivers<Exchanging<Rebuild>>(ExchangingModel()), 5000U);
    EXPECT_GT(compareDrivers<Exchanging<HookedRebuild>>(ExchangingModel()), 5000U);
    EXPECT_GT(compareDrivers<Undisciplined>(UndisciplinedModel()), 500U);
}

/// Whether an operand is missing anywhere below a node.
bool isBroken(NumberedTable& table, SymbolicExprId root) {
    bool broken = false;
    Recursion recursion(
        table, true, [](const SymbolicExpr&) {}, [&] { broken = true; });
    return !recursion(root) || broken;
}

TEST(HostVisitors, WholeExpressionsAreThemselvesAndMissingOperandsStay) {
    std::size_t broken = 0, whole = 0;
    forBrokenGraphs(8, 100, 25, [&](NumberedTable& numbered, const std::vector<SymbolicExprId>& ids) {
        SymbolicExprTable& table = numbered.table();
        SymbolicExprTable copies;
        const Trees tree{table};
        const SymbolicExprReplacements replacements{{tree.name("x"), tree.name("y")}, {invalidId, tree.name("a")}};
        for (const SymbolicExprId id : ids) {
            const auto before = run(numbered, id, Model());
            if (!before)
                continue;
            if (!isBroken(numbered, id)) { // also what holds a NaN
                ++whole;
                const std::size_t nodes = numbered.count();
                Rebuild accepted(table), executed(table);
                table.get(id)->accept(table, accepted);
                executed.execute(table, id);
                for (const SymbolicExprId result :
                     {accepted.get(), executed.get(), Rebuild(table).rebuild(table, id),
                      HookedRebuild(table).rebuild(table, id), SymbolicExprCopy(table, table)(id)})
                    EXPECT_EQ(result, id);
                EXPECT_EQ(numbered.count(), nodes);
                continue;
            }
            ++broken;
            for (const SymbolicExprId result :
                 {SymbolicExprCast2Int(table).cast2Int(id), SymbolicExprReplacement(table, replacements)(id),
                  SymbolicExprQ2C(table)(id), SymbolicExprC2Q(table)(id),
                  SymbolicExprFactorDivision(table).factorDivision(id)}) {
                ASSERT_TRUE(table.has(result));
                EXPECT_TRUE(isBroken(numbered, result)) << *before;
            }
            EXPECT_TRUE(copies.has(SymbolicExprCopy(table, copies)(id)));
        }
    });
    EXPECT_GT(broken, 5000U);
    EXPECT_GT(whole, 5000U);
}

TEST(HostVisitors, WhatLacksAnOperandIsRebuiltAsItIs) {
    SymbolicExprTable table;
    ASSERT_EQ(SymbolicDoubleValue(table, std::nan("")).getId(table), invalidId);
    for (const CaseRow& row : casesOf("transform.txt", "missing operands", 4)) {
        SCOPED_TRACE(row[0]);
        const SymbolicExprId id = readTree(table, row[0]);
        const SymbolicExprId results[] = {SymbolicExprFactorDivision(table).factorDivision(id),
                                          SymbolicExprQ2C(table)(id), SymbolicExprC2Q(table)(id)};
        for (std::size_t i = 0; i < std::size(results); ++i)
            EXPECT_TRUE(row[1 + i].empty() ? results[i] == id : treeText(table, results[i]) == row[1 + i])
                << i << ": " << treeText(table, results[i]);
    }
}

} // namespace
} // namespace VT::Testing
