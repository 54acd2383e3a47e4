// Writes the bounds of a path as linear constraints and solves each group of unknowns that they tie together.
//
// Method: sums are replaced by what they add up; a floor q of f / d is a variable with 0 <= f - d * q < d, and floors
// of one form are defined by each other. Variables that no constraint ties together are solved apart, which keeps the
// systems small: elimination is exponential in the number of variables at worst.
//
// Cost: linear in the constraints, plus what the solver takes.
#include "base/decide/witness/PathSystem.hpp"

#include <algorithm>
#include <numeric>

namespace VT {

void PathSystem::begin() {
    variables_.clear();
    numbers_.clear();
    rows_.clear();
    floors_.clear();
}

PathSystem::Variable PathSystem::variableOf(Unknown unknown) {
    if (const Variable* known = numbers_.find(unknown); known != nullptr)
        return *known;
    variables_.push_back(unknown);
    return numbers_.insert(unknown, variables_.size() - 1);
}

void PathSystem::append(Row& row, const WideForm& form, const BigInteger& factor) {
    for (const WidePart& part : form.parts)
        row.parts.emplace_back(variableOf(part.unknown), part.factor * factor);
    row.constant += form.constant * factor;
}

/// Adds a multiple of an unknown, or of what it adds up.
void PathSystem::append(Row& row, Unknown unknown, const BigInteger& factor) {
    const UnknownInfo& info = unknowns_[unknown];
    if (info.kind == UnknownKind::Floor && info.floor->divisor == 1) {
        append(row, info.floor->form, factor);
    } else if (info.kind == UnknownKind::Sum) {
        for (const LinearPart& part : info.sum)
            row.parts.emplace_back(variableOf(part.unknown), part.factor * factor);
    } else {
        row.parts.emplace_back(variableOf(unknown), factor);
    }
}

void PathSystem::add(Row row) {
    steps_.take(row.parts.size() + 1);
    std::ranges::sort(row.parts, {}, &std::pair<Variable, BigInteger>::first);
    std::vector<std::pair<Variable, BigInteger>> joined;
    for (auto& part : row.parts) {
        if (!joined.empty() && joined.back().first == part.first)
            joined.back().second += part.second;
        else
            joined.push_back(std::move(part));
    }
    row.parts = std::move(joined);
    rows_.push_back(std::move(row));
}

void PathSystem::restrict(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high) {
    const auto bound = [&](int sign, const BigInteger& constant, bool isEquality) {
        Row row{{}, constant, isEquality};
        if (plus != noUnknown)
            append(row, plus, sign);
        if (minus != noUnknown)
            append(row, minus, -sign);
        add(std::move(row));
    };
    if (low == high) {
        bound(1, -BigInteger(low), true);
        return;
    }
    if (low != minusInfinite)
        bound(1, -BigInteger(low), false);
    if (high != plusInfinite)
        bound(-1, high, false);
}

/// Adds the variables that floors are computed from, and puts all in the order of their numbers, so that the order in
/// which they were met has no say in what solving costs.
void PathSystem::sortVariables(const IdMap<std::uint32_t>& numbers) {
    for (std::size_t i = 0; i < variables_.size(); ++i) { // NOLINT(modernize-loop-convert): floors of floors add more
        if (const UnknownInfo& info = unknowns_[variables_[i]]; info.kind == UnknownKind::Floor)
            for (const WidePart& part : info.floor->form.parts)
                variableOf(part.unknown);
    }
    const std::vector<Unknown> before = variables_;
    std::ranges::sort(variables_, {}, [&](Unknown unknown) { return *numbers.find(unknown); });
    for (Variable variable = 0; variable < variables_.size(); ++variable)
        numbers_.insert(variables_[variable], variable);
    for (Row& row : rows_) {
        for (auto& part : row.parts)
            part.first = *numbers_.find(before[part.first]);
        std::ranges::sort(row.parts, {}, &std::pair<Variable, BigInteger>::first);
    }
}

/// Adds the bounds of variables and what floors are.
void PathSystem::defineVariables() {
    for (Variable variable = 0; variable < variables_.size(); ++variable) {
        const UnknownInfo& info = unknowns_[variables_[variable]];
        if (info.kind == UnknownKind::Floor)
            floors_.push_back(variable);
        else
            restrict(variables_[variable], noUnknown, info.low, info.high);
    }
    for (const Variable variable : floors_) {
        const FloorOf floor = nearestFloor(variable);
        for (const int sign : {1, -1}) { // 0 <= form - divisor * floor <= divisor - 1
            Row row{{}, sign > 0 ? BigInteger(0) : BigInteger(floor.divisor - 1)};
            append(row, floor.form, sign);
            row.parts.emplace_back(variable, -sign * floor.divisor);
            add(std::move(row));
        }
    }
}

/// The meaning of a floor, by another floor among the variables where there is one: floor((f + c + k * d) / (d * e)) is
/// floor((q + k) / e) with q = floor((f + c) / d).  That says more about numbers with fractions than f would.
FloorOf PathSystem::nearestFloor(Variable variable) const {
    const FloorOf& own = *unknowns_[variables_[variable]].floor;
    const FloorOf* nearest = nullptr;
    Unknown by = noUnknown;
    steps_.take(floors_.size());
    for (const Variable other : floors_) {
        const FloorOf& inner = *unknowns_[variables_[other]].floor;
        if (other != variable && inner.divisor < own.divisor && inner.form.parts == own.form.parts &&
            own.divisor % inner.divisor == 0 && (own.form.constant - inner.form.constant) % inner.divisor == 0 &&
            (nearest == nullptr || inner.divisor > nearest->divisor)) {
            nearest = &inner;
            by = variables_[other];
        }
    }
    if (nearest == nullptr)
        return own;
    const BigInteger shift = (own.form.constant - nearest->form.constant) / nearest->divisor;
    return {{{{by, 1}}, shift}, own.divisor / nearest->divisor};
}

/// For each variable the first one that it is tied to.
std::vector<PathSystem::Variable> PathSystem::groups() const {
    std::vector<Variable> parent(variables_.size());
    std::iota(parent.begin(), parent.end(), Variable{0});
    const auto find = [&](Variable variable) {
        while (parent[variable] != variable)
            variable = parent[variable] = parent[parent[variable]];
        return variable;
    };
    for (const Row& row : rows_) {
        for (const auto& part : row.parts) {
            const auto [first, second] = std::minmax({find(part.first), find(row.parts.front().first)});
            parent[second] = first;
        }
    }
    for (Variable& variable : parent)
        variable = find(variable);
    return parent;
}

std::optional<PathSystem::Values> PathSystem::solve(const IdMap<std::uint32_t>& numbers, bool smallest) {
    sortVariables(numbers);
    defineVariables();
    const std::vector<Variable> group = groups();
    std::vector<std::vector<Variable>> members(variables_.size());
    std::vector<std::vector<const Row*>> rows(variables_.size());
    for (Variable variable = 0; variable < variables_.size(); ++variable)
        members[group[variable]].push_back(variable);
    for (const Row& row : rows_) {
        if (!row.parts.empty())
            rows[group[row.parts.front().first]].push_back(&row);
        else if (row.constant < 0 || (row.isEquality && row.constant != 0))
            return std::nullopt;
    }
    Values values;
    values.reserve(variables_.size());
    std::vector<std::size_t> position(variables_.size());
    for (const std::vector<Variable>& own : members) {
        if (own.empty())
            continue;
        const std::vector<const Row*>& constraining = rows[group[own.front()]];
        const auto computed = std::ranges::partition_point(
            own, [&](Variable variable) { return !unknowns_[variables_[variable]].isComputed(); });
        for (std::size_t i = 0; i < own.size(); ++i)
            position[own[i]] = i;
        std::vector<LinearConstraint> constraints;
        constraints.reserve(constraining.size());
        for (const Row* row : constraining) {
            using Relation = LinearConstraint::Relation;
            constraints.push_back({std::vector<BigInteger>(own.size()), row->constant,
                                   row->isEquality ? Relation::Zero : Relation::NotNegative});
            steps_.take(own.size());
            for (const auto& [variable, factor] : row->parts)
                constraints.back().factors[position[variable]] = factor;
        }
        const auto minimized = static_cast<std::size_t>(computed - own.begin());
        LinearSolver solver(steps_);
        auto solution =
            smallest ? solver.solveSmallest(constraints, own.size(), minimized) : solver.solve(constraints, own.size());
        if (!solution)
            return std::nullopt;
        for (std::size_t i = 0; i < own.size(); ++i)
            values.emplace_back(variables_[own[i]], std::move((*solution)[i]));
    }
    return values;
}

} // namespace VT
