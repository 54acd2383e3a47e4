// Counts the assignments for which conditions hold together.
//
// Method: the And operands fall into parts that share no names, whose counts are multiplied.  A part is evaluated for
// one value of each class that its comparisons with literals do not distinguish, weighted by the size of the class.
// Cost: at most limits::countedAssignments evaluations for each part.
#include "base/choices/AssignmentCounter.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/transform/Symbols.hpp"

#include <algorithm>

namespace VT {

/// Operands of And, and the names that they share with none outside.
struct AssignmentCounter::Part {
    std::vector<SymbolicExprId> operands;
    std::vector<SymbolicExprId> names; ///< in ascending order
};

/// Classes of values between which a condition does not distinguish.
struct AssignmentCounter::Values {
    struct Class {
        std::int64_t value; ///< one of them
        std::uint64_t size;
    };

    std::vector<Class> classes;
};

namespace {

/// Names, literals, and operators whose value is that of their operands: no calls, no members.
constexpr OperatorSet countedOps = OperatorSet::where([](const OperatorInfo& row) {
    return row.op <= SymbolicOp::DoubleValue || row.form == OperatorForm::Infix || row.form == OperatorForm::Prefix;
});

std::optional<std::uint64_t> multiplied(std::optional<std::uint64_t> a, std::optional<std::uint64_t> b) {
    std::uint64_t product = 0;
    if (!a || !b || __builtin_mul_overflow(*a, *b, &product))
        return std::nullopt;
    return product;
}

SymbolicExprId compared(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId name, std::int64_t value) {
    return makeBinary(table, op, name, SymbolicIntValue(table, static_cast<int>(value)).getId(table));
}

} // namespace

IntegerSet valuesOf(const SymbolDomain& domain) {
    IntegerSet range(domain.min ? *domain.min : IntegerSet::minusInfinity,
                     domain.max ? *domain.max : IntegerSet::plusInfinity);
    if (!domain.values)
        return range;
    std::vector<IntegerSet::Interval> listed;
    for (const int value : *domain.values)
        listed.push_back({value, value});
    return IntegerSet::of(std::move(listed)).intersect(range);
}

SymbolicExprId conditionOf(SymbolicExprTable& table, const SymbolDomain& domain) {
    using enum SymbolicOp;
    const IntegerSet values = valuesOf(domain);
    if (values.isAll())
        return table.getIdTRUE();
    std::vector<SymbolicExprId> intervals;
    for (const auto& [low, high] : values.intervals()) {
        const auto notBelow = [&, low = low] { return compared(table, GreaterThanEqual, domain.symbol, low); };
        const auto notAbove = [&, high = high] { return compared(table, LessThanEqual, domain.symbol, high); };
        intervals.push_back(low == high                        ? compared(table, Equal, domain.symbol, low)
                            : low == IntegerSet::minusInfinity ? notAbove()
                            : high == IntegerSet::plusInfinity ? notBelow()
                                                               : makeBinary(table, And, notBelow(), notAbove()));
    }
    return intervals.empty() ? table.getIdFALSE() : makeChain(table, Or, intervals);
}

std::vector<SymbolicExprId> AssignmentCounter::namesOf(std::span<const SymbolicExprId> conditions) const {
    std::vector<SymbolicExprId> names;
    SymbolsOfSymbolicExpr symbols(table_);
    for (const SymbolicExprId condition : conditions)
        symbols.getSymbolIds(condition, names);
    std::erase_if(names, [&](SymbolicExprId id) { return id == table_.getIdTRUE() || id == table_.getIdFALSE(); });
    std::ranges::sort(names);
    names.erase(std::unique(names.begin(), names.end()), names.end());
    return names;
}

/// The declared values of a name; nullptr unless they are bounded.
const IntegerSet* AssignmentCounter::boundedValuesOf(SymbolicExprId name) const {
    const IntegerSet* const values = values_.find(name);
    const bool isBounded = values != nullptr && !values->empty() && fitsInt(values->low()) && fitsInt(values->high());
    return isBounded ? values : nullptr;
}

/// The classes of a name's values in a condition: between the literals that it is compared with, or single values where
/// it is used in any other way.
std::optional<AssignmentCounter::Values> AssignmentCounter::classesOf(SymbolicExprId name,
                                                                      SymbolicExprId condition) const {
    static constexpr OperatorSet logicalOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::Not};
    std::vector<std::int64_t> cuts;
    bool isCompared = true;
    const auto use = [&](SymbolicExprId id, const SymbolicExpr* parent) {
        if (id != name)
            return;
        if (parent == nullptr || logicalOps.contains(parent->op())) {
            cuts.push_back(0);
            return;
        }
        const bool isComparison = comparisonOps.contains(parent->op());
        const SymbolicExprId other =
            isComparison ? parent->getInput(parent->getInput(0) == name ? 1 : 0) : SymbolicExprId{invalidId};
        const SymbolicExpr* const literal = table_.has(other) ? table_.get(other) : nullptr;
        if (literal != nullptr && literal->op() == SymbolicOp::IntValue)
            cuts.push_back(static_cast<const SymbolicIntValue*>(literal)->getValue());
        else
            isCompared = false;
    };
    walkDistinctWithParents(
        table_, condition, [&](SymbolicExprId id, const SymbolicExpr&, const SymbolicExpr* parent) { use(id, parent); },
        use);
    std::ranges::sort(cuts);
    cuts.erase(std::unique(cuts.begin(), cuts.end()), cuts.end());
    Values values;
    const auto add = [&](std::int64_t low, std::int64_t high) {
        if (low <= high)
            values.classes.push_back({low, static_cast<std::uint64_t>(high - low) + 1});
        return values.classes.size() <= limits::countedAssignments;
    };
    for (const auto& [low, high] : boundedValuesOf(name)->intervals()) {
        std::int64_t next = low;
        if (isCompared) {
            for (const std::int64_t cut : cuts) {
                if (cut < next || cut > high)
                    continue;
                add(next, cut - 1);
                add(cut, cut);
                next = cut + 1;
            }
            if (!add(next, high))
                return std::nullopt;
            continue;
        }
        for (; next <= high; ++next)
            if (!add(next, next))
                return std::nullopt;
    }
    return values;
}

/// The names of an operand; nullptr where a call or a member takes part, or an operand is missing.
const std::vector<SymbolicExprId>* AssignmentCounter::namesIfCountable(SymbolicExprId operand) {
    if (const auto* const before = operandNames_.find(operand))
        return *before ? &**before : nullptr;
    bool isCountable = true;
    walkDistinct(
        table_, operand,
        [&](SymbolicExprId, const SymbolicExpr& node) { isCountable = isCountable && countedOps.contains(node.op()); },
        [&](SymbolicExprId id) { isCountable = isCountable && id != invalidId; });
    auto names = isCountable ? std::optional(namesOf(std::span(&operand, 1))) : std::nullopt;
    const auto& kept = operandNames_.insert(operand, std::move(names));
    return kept ? &*kept : nullptr;
}

/// Counts the assignments of a part's names; a part that was counted before is looked up.
std::optional<std::uint64_t> AssignmentCounter::countPart(const Part& part) {
    const SymbolicExprId condition = makeChain(table_, SymbolicOp::And, part.operands);
    if (const auto* const before = counted_.find(condition))
        return *before;
    const std::optional<std::uint64_t> count = countAssignments(part, condition);
    counted_.insert(condition, count);
    return count;
}

std::optional<std::uint64_t> AssignmentCounter::countAssignments(const Part& part, SymbolicExprId condition) {
    std::vector<Values> values;
    std::uint64_t evaluations = 1;
    for (const SymbolicExprId name : part.names) {
        auto ofName = classesOf(name, condition);
        if (!ofName)
            return std::nullopt;
        const auto product = multiplied(evaluations, ofName->classes.size());
        if (!product || *product > limits::countedAssignments)
            return std::nullopt;
        evaluations = *product;
        values.push_back(std::move(*ofName));
    }
    std::uint64_t nodes = 0;
    walkDistinct(
        table_, condition, [&](SymbolicExprId, const SymbolicExpr&) { ++nodes; }, [](SymbolicExprId) {});
    if (nodes > workLeft_ / evaluations)
        return std::nullopt;
    workLeft_ -= nodes * evaluations;
    std::uint64_t total = 0;
    Witness assignment(part.names.size());
    for (std::uint64_t i = 0; i < evaluations; ++i) {
        std::optional<std::uint64_t> weight = 1;
        std::uint64_t rest = i;
        for (std::size_t n = 0; n < part.names.size(); ++n) {
            const auto& [value, size] = values[n].classes[rest % values[n].classes.size()];
            rest /= values[n].classes.size();
            assignment[n] = {part.names[n], value};
            weight = multiplied(weight, size);
        }
        const std::optional<bool> holds = decider_.holds(condition, assignment);
        if (!holds || !weight || (*holds && __builtin_add_overflow(total, *weight, &total)))
            return std::nullopt;
    }
    return total;
}

std::optional<std::uint64_t> AssignmentCounter::count(std::span<const SymbolicExprId> conditions,
                                                      std::span<const SymbolicExprId> names) {
    if (!std::ranges::all_of(names, [&](SymbolicExprId name) { return boundedValuesOf(name) != nullptr; }))
        return std::nullopt;
    std::vector<Part> parts;
    bool isCountable = true;
    const auto add = [&](SymbolicExprId operand) {
        const std::vector<SymbolicExprId>* const operandNames = namesIfCountable(operand);
        isCountable = operandNames != nullptr;
        if (!isCountable)
            return;
        Part part{{operand}, *operandNames};
        const auto isApart = [&](const Part& other) {
            return std::ranges::none_of(
                part.names, [&](SymbolicExprId name) { return std::ranges::binary_search(other.names, name); });
        };
        for (Part& other : parts) {
            if (isApart(other))
                continue;
            part.operands.insert(part.operands.begin(), other.operands.begin(), other.operands.end());
            part.names.insert(part.names.end(), other.names.begin(), other.names.end());
            other.operands.clear();
        }
        std::ranges::sort(part.names);
        part.names.erase(std::unique(part.names.begin(), part.names.end()), part.names.end());
        std::erase_if(parts, [](const Part& other) { return other.operands.empty(); });
        parts.push_back(std::move(part));
    };
    for (const SymbolicExprId condition : conditions) {
        const bool complete = walkChain(table_, condition, limits::chainOperands, LinksOf(SymbolicOp::And),
                                        [&](SymbolicExprId id, const SymbolicExpr*) {
                                            if (id != table_.getIdTRUE())
                                                add(id);
                                            return isCountable;
                                        });
        isCountable = isCountable && complete;
    }
    if (!isCountable)
        return std::nullopt;
    std::optional<std::uint64_t> total = 1;
    std::vector<SymbolicExprId> used;
    for (const Part& part : parts) {
        total = multiplied(total, countPart(part));
        used.insert(used.end(), part.names.begin(), part.names.end());
    }
    for (const SymbolicExprId name : names) {
        if (std::ranges::find(used, name) != used.end())
            continue;
        std::uint64_t size = 0;
        for (const auto& [low, high] : boundedValuesOf(name)->intervals())
            size += static_cast<std::uint64_t>(high - low) + 1;
        total = multiplied(total, size);
    }
    return total;
}

} // namespace VT
