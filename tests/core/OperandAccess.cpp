// getInput out of range: who ends the program with which words, and who answers while assertions are off.
#include "base/core/Nodes.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/AnyNode.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

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
        {Op::MemberValue, 1, "VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is greater than 0",
         "VT::SymbolicUnaryExpr::getInput(", true, 0},
        {Op::Plus, 2, "VT::SymbolicBinaryExpr::getInput(aIdx) aIdx is out of bounds",
         "virtual VT::SymbolicExprId VT::SymbolicBinaryExpr::getInput(std::size_t) const", false, 0},
        {Op::QColon3, 3, "VT::SymbolicTernaryExpr::getInput(aIdx) aIdx is out of bounds",
         "VT::SymbolicTernaryExpr::getInput(", false, 0},
        {Op::Row, 2, "VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is out of bounds", "VT::SymbolicMultiExpr::getInput(",
         true, invalidId},
        {Op::DimsND, 0, "VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is out of bounds",
         "VT::SymbolicMultiExpr::getInput(", true, invalidId},
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
