// Codes, classes, operands and slots of virtual functions: what hosts rely on in binary form.  The data stand here
// again on purpose.
#include "base/core/Nodes.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gmock/gmock.h>
#include <sstream>

namespace VT::Testing {
namespace {

using Visitor = SymbolicExprVisitor;

/// The classes in the order of their codes and of the visitors' slots, with their operands; * is any number.
constexpr const char* classes =
    "String0 IntValue0 DoubleValue0 PlusExpr2 MinusExpr2 UnaryMinusExpr1 MultiplyExpr2 DivideExpr2 ModuloExpr2 "
    "EqualExpr2 NotEqualExpr2 LessThanExpr2 LessThanEqualExpr2 GreaterThanExpr2 GreaterThanEqualExpr2 AndExpr2 OrExpr2 "
    "NotExpr1 BitAndExpr2 BitOrExpr2 BitXOrExpr2 BitComplExpr1 ShiftLeftExpr2 ShiftRightExpr2 2DExpr2 3DExpr3 NDExpr* "
    "FcnCall0UExpr1 FcnCall1UExpr2 FcnCall2UExpr3 FcnCallExpr* MemberValue1 QColonExpr2 QColon3Expr3 RowExpr* "
    "CellArrayExpr* MatrixExpr* PowerExpr2 DotPowerExpr2 DotMulExpr2 DotDivExpr2 LDivExpr2 DotLDivExpr2 TransposeExpr1 "
    "DotTransposeExpr1 SingleAndExpr2 SingleOrExpr2 AnonymousFuncExpr2";

struct Row {
    std::string className;
    std::ptrdiff_t visitSlot;
};

const Row rows[] = {
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    {#Class, slotOf(static_cast<void (Visitor::*)(const Class&)>(&Visitor::visit))},
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
};

TEST(Operators, EachClassHasItsCodeItsOperandsAndItsSlot) {
    std::istringstream words(classes);
    int code = 0;
    for (std::string word; words >> word; ++code) {
        SCOPED_TRACE(word);
        const bool any = word.back() == '*';
        const std::size_t count = any ? 4 : static_cast<std::size_t>(word.back() - '0');
        word.pop_back();
        const auto op = static_cast<SymbolicOp>(code);
        EXPECT_EQ(operatorInfo(op).className, "Symbolic" + word);
        EXPECT_EQ(rows[code].className, "Symbolic" + word);
        EXPECT_EQ(rows[code].visitSlot, code + 3);
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
    EXPECT_EQ(operatorTable().size(), static_cast<std::size_t>(code));
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
    using Op = SymbolicOp;

    const struct {
        Op op;
        std::size_t operands;
        std::string message;
        std::string function;
        bool checkedOnly; ///< answered while assertions are off
        SymbolicExprId answer;
    } cases[] = {
        {Op::String, 0, "VT::SymbolicExpr::getInput() should not be called", "VT::SymbolicExpr::getInput(", false, 0},
        {Op::Not, 1, "VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is greater than 0", "VT::SymbolicUnaryExpr::getInput(",
         true, 0},
        {Op::Plus, 2, "VT::SymbolicBinaryExpr::getInput(aIdx) aIdx is out of bounds",
         "virtual VT::SymbolicExprId VT::SymbolicBinaryExpr::getInput(std::size_t) const", false, 0},
        {Op::QColon3, 3, "VT::SymbolicTernaryExpr::getInput(aIdx) aIdx is out of bounds",
         "VT::SymbolicTernaryExpr::getInput(", false, 0},
        {Op::Row, 2, "VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is out of bounds", "VT::SymbolicMultiExpr::getInput(",
         true, invalidId},
    };

    for (const auto& [op, operands, message, function, checkedOnly, answer] : cases) {
        SCOPED_TRACE(operatorInfo(op).className);
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
                    EXPECT_EQ(node.getInput(index), answer);
                }
            }
        }
    }
    vtsvSetAssertionsEnabled(true);
}

} // namespace
} // namespace VT::Testing
