// Codes, classes, counts of operands and slots of virtual functions: what hosts rely on in binary form.  The data stand
// here again on purpose.
#include "base/core/Nodes.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Slots.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using Visitor = SymbolicExprVisitor;

constexpr int leaf = 0;
constexpr int any = -1;

struct Row {
    int code;
    std::string className;
    int operands;
    std::ptrdiff_t visitSlot;
    bool unary, binary, ternary, multi;
};

template <class Node>
Row row(int code, std::string className, int operands) {
    return {code,
            std::move(className),
            operands,
            slotOf(static_cast<void (Visitor::*)(const Node&)>(&Visitor::visit)),
            std::is_base_of_v<SymbolicUnaryExpr, Node>,
            std::is_base_of_v<SymbolicBinaryExpr, Node>,
            std::is_base_of_v<SymbolicTernaryExpr, Node>,
            std::is_base_of_v<SymbolicMultiExpr, Node>};
}

#define ROW(Code, Class, Operands) row<Class>(Code, #Class, Operands)

std::vector<Row> rows() {
    return {
        ROW(0, SymbolicString, leaf),
        ROW(1, SymbolicIntValue, leaf),
        ROW(2, SymbolicDoubleValue, leaf),
        ROW(3, SymbolicPlusExpr, 2),
        ROW(4, SymbolicMinusExpr, 2),
        ROW(5, SymbolicUnaryMinusExpr, 1),
        ROW(6, SymbolicMultiplyExpr, 2),
        ROW(7, SymbolicDivideExpr, 2),
        ROW(8, SymbolicModuloExpr, 2),
        ROW(9, SymbolicEqualExpr, 2),
        ROW(10, SymbolicNotEqualExpr, 2),
        ROW(11, SymbolicLessThanExpr, 2),
        ROW(12, SymbolicLessThanEqualExpr, 2),
        ROW(13, SymbolicGreaterThanExpr, 2),
        ROW(14, SymbolicGreaterThanEqualExpr, 2),
        ROW(15, SymbolicAndExpr, 2),
        ROW(16, SymbolicOrExpr, 2),
        ROW(17, SymbolicNotExpr, 1),
        ROW(18, SymbolicBitAndExpr, 2),
        ROW(19, SymbolicBitOrExpr, 2),
        ROW(20, SymbolicBitXOrExpr, 2),
        ROW(21, SymbolicBitComplExpr, 1),
        ROW(22, SymbolicShiftLeftExpr, 2),
        ROW(23, SymbolicShiftRightExpr, 2),
        ROW(24, Symbolic2DExpr, 2),
        ROW(25, Symbolic3DExpr, 3),
        ROW(26, SymbolicNDExpr, any),
        ROW(27, SymbolicFcnCall0UExpr, 1),
        ROW(28, SymbolicFcnCall1UExpr, 2),
        ROW(29, SymbolicFcnCall2UExpr, 3),
        ROW(30, SymbolicFcnCallExpr, any),
        ROW(31, SymbolicMemberValue, 1),
        ROW(32, SymbolicQColonExpr, 2),
        ROW(33, SymbolicQColon3Expr, 3),
        ROW(34, SymbolicRowExpr, any),
        ROW(35, SymbolicCellArrayExpr, any),
        ROW(36, SymbolicMatrixExpr, any),
        ROW(37, SymbolicPowerExpr, 2),
        ROW(38, SymbolicDotPowerExpr, 2),
        ROW(39, SymbolicDotMulExpr, 2),
        ROW(40, SymbolicDotDivExpr, 2),
        ROW(41, SymbolicLDivExpr, 2),
        ROW(42, SymbolicDotLDivExpr, 2),
        ROW(43, SymbolicTransposeExpr, 1),
        ROW(44, SymbolicDotTransposeExpr, 1),
        ROW(45, SymbolicSingleAndExpr, 2),
        ROW(46, SymbolicSingleOrExpr, 2),
        ROW(47, SymbolicAnonymousFuncExpr, 2),
    };
}

TEST(Operators, EachClassHasItsCodeItsOperandsAndItsSlot) {
    const std::vector<Row> all = rows();
    ASSERT_EQ(operatorTable().size(), all.size());
    for (const Row& expected : all) {
        SCOPED_TRACE(expected.className);
        const auto op = static_cast<SymbolicOp>(expected.code);
        EXPECT_EQ(operatorInfo(op).className, expected.className);
        EXPECT_EQ(expected.visitSlot, expected.code + 3);

        SymbolicExprTable table;
        const std::size_t count = expected.operands == any ? 4 : static_cast<std::size_t>(expected.operands);
        NodeParts parts;
        parts.text = "N";
        for (std::size_t i = 0; i < count; ++i)
            parts.inputs.push_back(SymbolicString(table, std::string(i + 1, 'x')).getId(table));
        const SymbolicExpr& node = *table.get(makeAny(table, op, parts));

        EXPECT_EQ(node.op(), op);
        EXPECT_EQ(node.getNumInputs(), count);
        for (std::size_t i = 0; i < count; ++i)
            EXPECT_EQ(node.getInput(i), i);
        EXPECT_EQ(node.isTermExpr(), expected.operands == leaf);
        EXPECT_EQ(node.isNumValue(), expected.code == 1 || expected.code == 2);
        EXPECT_EQ(node.isUnaryExpr(), expected.operands == 1);
        EXPECT_EQ(node.isBinaryExpr(), expected.operands == 2);
        EXPECT_EQ(node.isTernaryExpr(), expected.operands == 3);
        EXPECT_EQ(node.isMultiExpr(), expected.operands == any);
        EXPECT_EQ(expected.unary, expected.operands == 1);
        EXPECT_EQ(expected.binary, expected.operands == 2);
        EXPECT_EQ(expected.ternary, expected.operands == 3);
        EXPECT_EQ(expected.multi, expected.operands == any);
        EXPECT_EQ(node.isFcnCallExpr(), expected.code >= 27 && expected.code <= 29) << "not the generic call";
        EXPECT_EQ(node.getNumDimensions(), expected.code >= 24 && expected.code <= 26 ? count : 0);
        const bool headed = (expected.code >= 27 && expected.code <= 30) || expected.code == 35;
        EXPECT_EQ(node.getNumArgs(), headed ? count - 1 : 0);
        EXPECT_EQ(node.getNumValue(), expected.code == 1 || expected.code == 2 ? 0.0 : 18446744073709551616.0);
    }
}

TEST(Operators, SlotsOfNodesTablesAndVisitors) {
    using Node = SymbolicExpr;
    using Table = SymbolicExprTable;

    const struct {
        const char* name;
        std::ptrdiff_t slot;
        std::ptrdiff_t expected; // destructors take slots 0 and 1
    } cases[] = {
        {"op", slotOf(&Node::op), 2},
        {"==", slotOf(&Node::operator==), 3},
        {"getHash", slotOf(&Node::getHash), 4},
        {"getNumInputs", slotOf(&Node::getNumInputs), 5},
        {"isTermExpr", slotOf(&Node::isTermExpr), 6},
        {"isNumValue", slotOf(&Node::isNumValue), 7},
        {"isUnaryExpr", slotOf(&Node::isUnaryExpr), 8},
        {"isBinaryExpr", slotOf(&Node::isBinaryExpr), 9},
        {"isTernaryExpr", slotOf(&Node::isTernaryExpr), 10},
        {"isMultiExpr", slotOf(&Node::isMultiExpr), 11},
        {"isFcnCallExpr", slotOf(&Node::isFcnCallExpr), 12},
        {"getNumValue", slotOf(&Node::getNumValue), 13},
        {"getInput", slotOf(&Node::getInput), 14},
        {"getNumDimensions", slotOf(&Node::getNumDimensions), 15},
        {"getNumArgs", slotOf(&Node::getNumArgs), 16},
        {"accept", slotOf(&Node::accept), 17},
        {"invoke", slotOf(&Node::invoke), 18},
        {"add", slotOf(&Table::add), 2},
        {"contains", slotOf(&Table::contains), 3},
        {"lookup", slotOf(static_cast<SymbolicExprId (Table::*)(const Node*) const>(&Table::lookup)), 4},
        {"get", slotOf(&Table::get), 5},
        {"CreateSymbolicExprTable", slotOf(&Table::CreateSymbolicExprTable), 6},
        {"isBottomUpVistor", slotOf(&Visitor::isBottomUpVistor), 2},
    };

    for (const auto& [name, slot, expected] : cases)
        EXPECT_EQ(slot, expected) << name;
}

} // namespace
} // namespace VT::Testing
