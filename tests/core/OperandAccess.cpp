// getInput out of range: who ends the program with which words, and who answers while assertions are off.
#include "base/core/Nodes.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/AnyNode.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

class Assertions {
public:
    explicit Assertions(bool enabled) { vtsvSetAssertionsEnabled(enabled); }

    Assertions(const Assertions&) = delete;
    Assertions& operator=(const Assertions&) = delete;

    ~Assertions() { vtsvSetAssertionsEnabled(before_); }

private:
    bool before_ = vtsvAssertionsEnabled();
};

/// A regular expression for a text taken literally.
std::string literally(const std::string& text) {
    std::string expression;
    for (const char c : text)
        expression +=
            std::string("()[].*+?{}|\\^$").find(c) == std::string::npos ? std::string(1, c) : std::string("\\") + c;
    return expression;
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
                const Assertions assertions(enabled);
                if (enabled || !checkedOnly) {
                    EXPECT_DEATH(static_cast<void>(node.getInput(index)), literally(message));
                    EXPECT_DEATH(static_cast<void>(node.getInput(index)), literally(function));
                } else {
                    EXPECT_EQ(node.getInput(index), answer);
                }
            }
        }
    }
}

} // namespace
} // namespace VT::Testing
