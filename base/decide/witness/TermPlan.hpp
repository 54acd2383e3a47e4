// The value of a term under an assignment.
#pragma once

#include "base/decide/LeafReader.hpp"
#include "base/decide/diagram/Unknowns.hpp"

#include <functional>
#include <optional>
#include <vector>

namespace VT {

/// The nodes of one term in an order in which they can be evaluated.  Linear in the distinct nodes.
class TermPlan {
public:
    TermPlan(const LeafReader& leaves, Unknowns& unknowns, SymbolicExprId term);

    /// The value, where every node has one that is exact; the truth of a real number.  `valueOf` gives the values of
    /// free unknowns.
    [[nodiscard]] std::optional<std::int64_t> value(const std::function<std::int64_t(Unknown)>& valueOf);

    /// Free unknowns that the value depends on.
    [[nodiscard]] const std::vector<Unknown>& unknowns() const noexcept { return unknowns_; }

    /// Integers in the term, and what its shifts multiply by.
    [[nodiscard]] const std::vector<std::int64_t>& constants() const noexcept { return constants_; }

    [[nodiscard]] std::size_t size() const noexcept { return nodes_.size(); }

private:
    struct Node {
        SymbolicOp op;
        LeafMeaning leaf;
        Unknown unknown;
        std::size_t a; ///< positions of the operands
        std::size_t b;
        std::size_t operands;
    };

    struct Result {
        bool isReal = false;
        std::int64_t integer = 0;
        double real = 0;

        [[nodiscard]] bool holds() const { return isReal ? real != 0 : integer != 0; }
    };

    void suggestPower(const LeafMeaning& distance);
    [[nodiscard]] std::optional<Result> compute(const Node& node) const;

    std::vector<Node> nodes_;
    std::vector<Result> results_;
    std::vector<Unknown> unknowns_;
    std::vector<std::int64_t> constants_;
};

} // namespace VT
