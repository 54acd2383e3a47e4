// Lays out the cells of a prepared expression and the operations over them.
//
// Method: one pass over the steps.  The cells of scalar slots come first, then elements of vectors and constants, then
// one result for each operation, in order.  An operator on vectors becomes one operation for each element; one on
// constants is computed at once and becomes a constant.
// Cost: linear in the steps and in the elements of their vectors; limits::evaluatedElements bounds both.
#include "base/eval/PreparedLayout.hpp"

#include "base/core/Limits.hpp"
#include "base/eval/EvalReports.hpp"

#include <algorithm>
#include <stdexcept>

namespace VT {

namespace {

/// Marks the number of an operation as that of its result, until the number of cells before the results is known.
constexpr std::uint32_t ofResult = std::uint32_t{1} << 31U;

} // namespace

PreparedExprLayout::PreparedExprLayout(const PreparedExpr& expression) : expression_(expression) {
    placeSlots();
    placeConstants();
    stepPlaces_.reserve(expression_.steps_.size());
    operations_.reserve(expression_.steps_.size() + 1);
    for (const Step& step : expression_.steps_)
        stepPlaces_.push_back(step.rule == ScalarRuleIndex::None ? placeList(step) : placeOperator(step));
    rootPlace_ = placeOf(expression_.root_);
    finish();
}

void PreparedExprLayout::install(PreparedExpr& expression) noexcept {
    expression.cells_.swap(cells_);
    expression.types_.swap(types_);
    expression.operations_.swap(operations_);
    expression.slotPlaces_.swap(slotPlaces_);
    expression.vectorCells_.swap(vectorCells_);
    expression.rootPlace_ = rootPlace_;
    expression.firstResult_ = firstResult_;
}

/// Places the slots.  Their cells come first, so that they stay where they are; elements of vectors follow.
void PreparedExprLayout::placeSlots() {
    const std::size_t count = expression_.slotCount();
    cells_.assign(expression_.cells_.begin(), expression_.cells_.begin() + static_cast<std::ptrdiff_t>(count));
    types_.assign(expression_.types_.begin(), expression_.types_.begin() + static_cast<std::ptrdiff_t>(count));
    constant_.assign(count, false);
    for (std::size_t slot = 0; slot < count; ++slot) {
        if (expression_.holdings_[slot] != PreparedExpr::Holding::Vector) {
            slotPlaces_.push_back({static_cast<std::uint32_t>(slot), 0, false});
            continue;
        }
        const SymbolicValue::Elements& elements = expression_.vectors_[slot];
        slotPlaces_.push_back(
            {static_cast<std::uint32_t>(vectorCells_.size()), static_cast<std::uint32_t>(elements.size()), true});
        for (const SymbolicScalar& value : elements)
            listElement(addLeaf(value, false));
    }
}

void PreparedExprLayout::placeConstants() {
    for (const SymbolicScalar& value : expression_.constants_)
        constantPlaces_.push_back({addLeaf(value, true), 0, false});
}

PreparedExprLayout::Place PreparedExprLayout::placeOf(const PreparedExpr::Source& source) const {
    using Kind = PreparedExpr::Source::Kind;
    switch (source.kind) {
    case Kind::Slot:
        return slotPlaces_[source.number];
    case Kind::Constant:
        return constantPlaces_[source.number];
    default:
        return stepPlaces_[source.number];
    }
}

/// A list names cells that other steps make; it has no operation.
PreparedExprLayout::Place PreparedExprLayout::placeList(const Step& step) {
    const auto begin = static_cast<std::uint32_t>(vectorCells_.size());
    for (std::uint32_t i = 0; i < step.count; ++i) {
        const Place place = placeOf(expression_.operands_[step.first + i]);
        if (place.isVector)
            detail::throwNotEvaluable(*expression_.table_, *expression_.table_->get(step.id));
        listElement(place.at);
    }
    return {begin, step.count, true};
}

PreparedExprLayout::Place PreparedExprLayout::placeOperator(const Step& step) {
    const Place left = placeOf(expression_.operands_[step.first]);
    const Place right = step.count == 1 ? left : placeOf(expression_.operands_[step.first + 1]);
    if (!left.isVector && !right.isVector)
        return {addOperation(step.rule, left.at, right.at), 0, false};
    const std::uint32_t length = left.isVector ? left.length : right.length;
    if (right.isVector && right.length != length)
        detail::throwSizeMismatch(*expression_.table_, *expression_.table_->get(step.id), length, right.length);
    const auto begin = static_cast<std::uint32_t>(vectorCells_.size());
    for (std::uint32_t i = 0; i < length; ++i)
        listElement(addOperation(step.rule, element(left, i), element(right, i)));
    return {begin, length, true};
}

/// Returns the cell of an element of a vector; that of a scalar for every index.
std::uint32_t PreparedExprLayout::element(const Place& place, std::uint32_t index) const {
    return place.isVector ? vectorCells_[place.at + index] : place.at;
}

void PreparedExprLayout::listElement(std::uint32_t cell) {
    if (vectorCells_.size() >= limits::evaluatedElements)
        throw std::length_error("evaluation: too many elements of vectors");
    vectorCells_.push_back(cell);
}

std::uint32_t PreparedExprLayout::addLeaf(const SymbolicScalar& value, bool isConstant) {
    cells_.push_back(value.cell());
    types_.push_back(value.type());
    constant_.push_back(isConstant);
    return static_cast<std::uint32_t>(cells_.size() - 1);
}

std::uint32_t PreparedExprLayout::addOperation(ScalarRuleIndex rule, std::uint32_t left, std::uint32_t right) {
    const auto isConstant = [this](std::uint32_t cell) { return (cell & ofResult) == 0 && constant_[cell]; };
    if (isConstant(left) && isConstant(right)) {
        return addLeaf(evaluateScalars(scalarRules[static_cast<std::size_t>(rule)], {types_[left], cells_[left]},
                                       {types_[right], cells_[right]}),
                       true);
    }
    if (operations_.size() >= limits::evaluatedElements)
        throw std::length_error("evaluation: too many operations");
    operations_.push_back({detail::operationCode(rule, ScalarType::Bool, ScalarType::Bool), left, right});
    return ofResult | static_cast<std::uint32_t>(operations_.size() - 1);
}

/// Makes room for the results and turns their numbers into cells.
void PreparedExprLayout::finish() {
    firstResult_ = cells_.size();
    const auto settle = [first = static_cast<std::uint32_t>(firstResult_)](std::uint32_t& cell) {
        if ((cell & ofResult) != 0)
            cell = (cell & ~ofResult) + first;
    };
    for (detail::Operation& operation : operations_) {
        settle(operation.left);
        settle(operation.right);
    }
    std::ranges::for_each(vectorCells_, settle);
    if (!rootPlace_.isVector)
        settle(rootPlace_.at);
    cells_.resize(firstResult_ + operations_.size());
    types_.resize(cells_.size());
    operations_.push_back({detail::endCode, 0, 0});
}

} // namespace VT
