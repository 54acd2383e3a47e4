// The linear constraints of one path through a diagram.
//
// A path bounds quantities; each is a linear form of unknowns, and a floor among these is an integer that its form and
// divisor bound.  So a path is possible exactly where its constraints have a solution in the integers, but for terms
// that are not understood, which are unknowns like any other.
#pragma once

#include "base/decide/diagram/Unknowns.hpp"
#include "base/decide/solver/LinearSolver.hpp"

#include <optional>
#include <utility>
#include <vector>

namespace VT {

class PathSystem {
public:
    PathSystem(const Unknowns& unknowns, Steps& steps) : unknowns_(unknowns), steps_(steps) {}

    /// No constraints.
    void begin();
    /// low <= plus - minus <= high, where either may be noUnknown and the infinities bound nothing.
    void restrict(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high);

    using Values = std::vector<std::pair<Unknown, BigInteger>>;

    /// Values of the unknowns that are constrained, floors included; nothing where there are none.  If asked for, those
    /// that do not follow from others are the smallest, one after the other in the order of their numbers; those that
    /// do have higher numbers.  Throws StepsUsedUp.
    [[nodiscard]] std::optional<Values> solve(const IdMap<std::uint32_t>& numbers, bool smallest);

private:
    using Variable = std::size_t;

    struct Row { ///< parts + constant >= 0, or == 0
        std::vector<std::pair<Variable, BigInteger>> parts;
        BigInteger constant;
        bool isEquality = false;
    };

    Variable variableOf(Unknown unknown);
    void append(Row& row, const WideForm& form, const BigInteger& factor);
    void append(Row& row, Unknown unknown, const BigInteger& factor);
    void add(Row row);
    void sortVariables(const IdMap<std::uint32_t>& numbers);
    void defineVariables();
    [[nodiscard]] FloorOf nearestFloor(Variable variable) const;
    std::vector<Variable> groups() const;

    const Unknowns& unknowns_;
    Steps& steps_;
    std::vector<Unknown> variables_;
    IdMap<Variable> numbers_;
    std::vector<Row> rows_;
    std::vector<Variable> floors_;
};

} // namespace VT
