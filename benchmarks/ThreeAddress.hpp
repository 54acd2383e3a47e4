// The floor of evaluation: three-address code over one array of doubles, as one would write it for one formula.
#pragma once

#include "base/core/Walk.hpp"

#include <cstdint>
#include <map>
#include <stdexcept>
#include <string>
#include <vector>

namespace VT::Benchmarks {

/// Knows the operators that the measured formulas have, doubles alone, and neither errors nor rules for zero.
class ThreeAddress {
public:
    ThreeAddress(const SymbolicExprTable& table, SymbolicExprId root) {
        std::map<SymbolicExprId, std::uint32_t> cells;
        walkDistinct(
            table, root,
            [&](SymbolicExprId id, const SymbolicExpr& node) {
                cells.emplace(id, static_cast<std::uint32_t>(cells_.size()));
                cells_.push_back(node.isNumValue() ? node.getNumValue() : 0);
                if (node.op() == SymbolicOp::String)
                    variables_.push_back(cells.at(id));
                if (node.isBinaryExpr())
                    code_.push_back({node.op(), cells.at(id), cells.at(node.getInput(0)), cells.at(node.getInput(1))});
                else if (node.getNumInputs() > 0)
                    throw std::invalid_argument("the floor knows operators of two operands alone");
            },
            [](SymbolicExprId) {});
    }

    /// Sets the variable that occurs first, second ...
    void set(std::size_t variable, double value) { cells_[variables_[variable]] = value; }

    double run() {
        double* const cells = cells_.data();
        for (const Line& line : code_) {
            const double a = cells[line.left];
            const double b = cells[line.right];
            double& result = cells[line.result];
            switch (line.op) {
            case SymbolicOp::Plus:
                result = a + b;
                break;
            case SymbolicOp::Minus:
                result = a - b;
                break;
            case SymbolicOp::Multiply:
                result = a * b;
                break;
            case SymbolicOp::Divide:
                result = a / b;
                break;
            case SymbolicOp::LessThan:
                result = a < b ? 1 : 0;
                break;
            case SymbolicOp::GreaterThan:
                result = a > b ? 1 : 0;
                break;
            case SymbolicOp::And:
                result = a != 0 && b != 0 ? 1 : 0;
                break;
            case SymbolicOp::Or:
                result = a != 0 || b != 0 ? 1 : 0;
                break;
            default:
                result = 0;
            }
        }
        return cells_.back();
    }

    [[nodiscard]] std::size_t nodes() const { return cells_.size(); }

private:
    struct Line {
        SymbolicOp op;
        std::uint32_t result;
        std::uint32_t left;
        std::uint32_t right;
    };

    std::vector<double> cells_;
    std::vector<std::uint32_t> variables_;
    std::vector<Line> code_;
};

} // namespace VT::Benchmarks
