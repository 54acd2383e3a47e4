// Codes, classes, operands and slots of virtual functions: what hosts rely on in binary form.  The data stand in
// a file of cases again on purpose.
#include "base/core/Nodes.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <algorithm>
#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using Visitor = SymbolicExprVisitor;

const std::pair<std::string, std::ptrdiff_t> visitSlots[] = {
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    {#Class, slotOf(static_cast<void (Visitor::*)(const Class&)>(&Visitor::visit))},
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
};

TEST(Operators, EachClassHasItsCodeItsOperandsAndItsSlot) {
    const std::vector<CaseRow> rows = casesOf("operators.txt", "classes", 2);
    ASSERT_EQ(operatorTable().size(), rows.size());
    for (int code = 0; code < operatorCount; ++code) {
        const CaseRow& row = rows[static_cast<std::size_t>(code)];
        SCOPED_TRACE(row[0]);
        const bool any = row[1] == "any";
        const std::size_t count = any ? 4 : std::stoul(row[1]);
        const auto op = static_cast<SymbolicOp>(code);
        EXPECT_EQ(operatorInfo(op).className, row[0]);
        EXPECT_EQ(visitSlots[code], std::pair(row[0], std::ptrdiff_t{code + 3}));
        EXPECT_EQ(operandCount(op), any ? std::nullopt : std::optional(count)) << "its base class";

        SymbolicExprTable table;
        NodeParts parts{"N", 0, 0, {}};
        for (std::size_t i = 0; i < count; ++i)
            parts.inputs.push_back(SymbolicString(table, std::string(i + 1, 'x')).getId(table));
        const SymbolicExpr& node = *table.get(makeAny(table, op, parts));
        EXPECT_EQ(node.op(), op);
        ASSERT_EQ(node.getNumInputs(), count);
        for (std::size_t i = 0; i < count; ++i)
            EXPECT_EQ(node.getInput(i), i);
        const bool number = code == 1 || code == 2;
        EXPECT_EQ(node.isTermExpr(), count == 0);
        EXPECT_EQ(node.isNumValue(), number);
        EXPECT_EQ(node.isUnaryExpr(), count == 1);
        EXPECT_EQ(node.isBinaryExpr(), count == 2);
        EXPECT_EQ(node.isTernaryExpr(), count == 3);
        EXPECT_EQ(node.isMultiExpr(), any);
        EXPECT_EQ(node.isFcnCallExpr(), code >= 27 && code <= 29) << "not the generic call";
        EXPECT_EQ(node.getNumDimensions(), code >= 24 && code <= 26 ? count : 0);
        EXPECT_EQ(node.getNumArgs(), (code >= 27 && code <= 30) || code == 35 ? count - 1 : 0);
        EXPECT_EQ(node.getNumValue(), number ? 0.0 : 18446744073709551616.0);
    }
}

TEST(Operators, SlotsOfNodesTablesAndVisitors) {
    using Node = SymbolicExpr;
    using Table = SymbolicExprTable;
    const auto slots = [](auto... members) { return std::vector<std::ptrdiff_t>{slotOf(members)...}; };
    // In order; destructors take slots 0 and 1.
    for (const auto& each : {slots(&Node::op, &Node::operator==, &Node::getHash, &Node::getNumInputs, &Node::isTermExpr,
                                   &Node::isNumValue, &Node::isUnaryExpr, &Node::isBinaryExpr, &Node::isTernaryExpr,
                                   &Node::isMultiExpr, &Node::isFcnCallExpr, &Node::getNumValue, &Node::getInput,
                                   &Node::getNumDimensions, &Node::getNumArgs, &Node::accept, &Node::invoke),
                             slots(&Table::add, &Table::contains,
                                   static_cast<SymbolicExprId (Table::*)(const Node*) const>(&Table::lookup),
                                   &Table::get, &Table::CreateSymbolicExprTable),
                             slots(&Visitor::isBottomUpVistor)})
        for (std::size_t i = 0; i < each.size(); ++i)
            EXPECT_EQ(each[i], static_cast<std::ptrdiff_t>(i + 2));
}

TEST(OperandAccessDeathTest, OutOfRange) {
    for (const CaseRow& row : casesOf("operators.txt", "operands out of range", 4)) {
        SCOPED_TRACE(row[0]);
        const auto op = std::ranges::find(operatorTable(), row[0], &OperatorInfo::name)->op;
        const std::string &message = row[1], &function = row[2];
        const bool checkedOnly = !row[3].empty(); // answered while assertions are off
        const std::size_t operands = operandCount(op).value_or(2);
        SymbolicExprTable table;
        SymbolicString(table, "x");
        const NodeParts parts{"y", 0, 0, std::vector<SymbolicExprId>(operands, 0)};
        const SymbolicExpr& node = *table.get(makeAny(table, op, parts));
        for (const std::size_t index : {operands, ~std::size_t{0}}) {
            for (const bool enabled : {true, false}) {
                vtsvSetAssertionsEnabled(enabled);
                if (enabled || !checkedOnly) {
                    EXPECT_DEATH(static_cast<void>(node.getInput(index)),
                                 testing::AllOf(testing::HasSubstr(message), testing::HasSubstr(function)));
                } else {
                    EXPECT_EQ(node.getInput(index), std::stoull(row[3]));
                }
            }
        }
    }
    vtsvSetAssertionsEnabled(true);
}

} // namespace
} // namespace VT::Testing
