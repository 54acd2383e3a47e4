// Conditions as And and Or of constraints: one number for each formula, whatever the order of its operands.
//
// A formula is FALSE, TRUE, a constraint, or a chain of at least two operands.  Chains are flat, hold no operand twice
// and at most one constraint of each atom; an operand that another one of the chain makes redundant outright is gone.
// Operands keep the order in which they were first met.  Negation is pushed into the constraints.
#pragma once

#include "base/cover/Cover.hpp"

#include <boost/container/small_vector.hpp>
#include <boost/unordered_map.hpp>

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <vector>

namespace VT {

using Formula = std::uint32_t;

class Formulas {
public:
    static constexpr Formula no = 0;
    static constexpr Formula yes = 1;

    enum class Kind : std::uint8_t { Constant, Leaf, And, Or };

    using Operands = boost::container::small_vector<Formula, 4>;
    /// Comparisons that a constraint takes.
    using Comparisons = std::function<std::size_t(const Constraint&)>;

    explicit Formulas(Comparisons comparisons);

    static Kind opposite(Kind chain) { return chain == Kind::And ? Kind::Or : Kind::And; }

    /// A constraint; a constant where its set is empty or all integers.
    Formula leaf(const Constraint& constraint);
    /// The chain of operands in any shape.  Linear in them.
    Formula chain(Kind kind, std::span<const Formula> operands);

    Formula chain(Kind kind, const Operands& operands) {
        return chain(kind, std::span<const Formula>(operands.data(), operands.size()));
    }

    /// Linear in the formulas below that were not negated before.
    Formula negated(Formula formula);

    [[nodiscard]] Kind kind(Formula formula) const { return nodes_[formula].kind; }

    [[nodiscard]] const Constraint& constraint(Formula leaf) const { return constraints_[nodes_[leaf].at]; }

    [[nodiscard]] const Operands& operands(Formula chain) const { return chains_[nodes_[chain].at]; }

    /// Comparisons that it takes to write a formula; bounded by the largest number.
    [[nodiscard]] std::uint32_t comparisons(Formula formula) const { return nodes_[formula].comparisons; }

    /// Longest path to a constraint.
    [[nodiscard]] std::uint32_t height(Formula formula) const { return nodes_[formula].height; }

    /// The distinct formulas below and including one, operands before what they are of.
    [[nodiscard]] std::vector<Formula> below(Formula formula) const;

    [[nodiscard]] std::size_t size() const noexcept { return nodes_.size(); }

private:
    static constexpr Formula unknown = ~Formula{0};

    struct Node {
        Kind kind;
        std::uint32_t at = 0; ///< in constraints_ or chains_
        std::uint32_t comparisons = 0;
        std::uint32_t height = 0;
        Formula negation = unknown;
    };

    Formula add(Node node);
    bool merge(Kind kind, Formula operand);
    [[nodiscard]] bool isRedundant(Kind kind, Formula operand) const;

    Comparisons comparisonsOf_;
    std::vector<Node> nodes_;
    std::vector<Constraint> constraints_;
    std::vector<Operands> chains_;
    boost::unordered_map<Constraint, Formula> leafIndex_;
    boost::unordered_multimap<std::size_t, Formula> chainIndex_; ///< by kind and operands in any order

    // Of the chain that is being made.
    std::vector<Formula> gathered_;
    std::vector<std::pair<std::uint32_t, std::uint32_t>> placeOfAtom_; ///< round and place in gathered_
    std::vector<std::uint32_t> member_;                                ///< round in which a formula was an operand
    std::uint32_t round_ = 0;
};

} // namespace VT
