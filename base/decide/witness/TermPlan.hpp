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

    /// The value, where every node has one of 64 bits; nothing where a real literal takes part.  `valueOf` gives the
    /// values of free unknowns.
    [[nodiscard]] std::optional<std::int64_t> value(const std::function<std::int64_t(Unknown)>& valueOf);

    /// The value, where every node has one, computed at any size and with fractions; the truth of a real number.
    [[nodiscard]] std::optional<RationalForm> exactValue(const std::function<BigInteger(Unknown)>& valueOf);

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

    /// A number; a literal is rounded with other literals only.
    struct Exact {
        RationalForm number = {};
        bool isReal = false;
        std::optional<double> literal = {};
    };

    void suggestPower(const LeafMeaning& distance);
    template <class Results, class Leaf, class Compute>
    [[nodiscard]] bool evaluate(Results& results, Leaf leaf, Compute compute) const;
    [[nodiscard]] static std::optional<std::int64_t> computeSmall(const Node& node, std::int64_t a, std::int64_t b);
    [[nodiscard]] static Exact ofReal(double real);
    [[nodiscard]] static std::optional<Exact> computeExact(const Node& node, const Exact& a, const Exact& b);

    std::vector<Node> nodes_;
    std::vector<std::int64_t> results_;
    std::vector<Unknown> unknowns_;
    std::vector<std::int64_t> constants_;
};

} // namespace VT
