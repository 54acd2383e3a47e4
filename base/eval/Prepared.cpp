// An expression made ready for many evaluations.
//
// Method: the constructor flattens the expression into steps in the order of evaluation.  A run lays them out over
// cells (PreparedLayout) when the shapes of the slots have changed, chooses the code of each operation when their types
// have changed, and executes.
// Cost: a run with shapes and types as before is linear in its operations; laying out and choosing codes are, too.
#include "base/eval/Prepared.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/eval/EvalReports.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/eval/Evaluation.hpp"
#include "base/eval/PreparedLayout.hpp"
#include "base/util/IdMap.hpp"

#include <algorithm>
#include <stdexcept>

namespace VT {

using detail::Evaluation;

PreparedExpr::PreparedExpr(const SymbolicExprTable& table, SymbolicExprId id) : table_(&table) {
    IdMap<Source> sources;
    const auto add = [&](SymbolicExprId node, Source source) {
        if (sources.size() >= limits::evaluatedElements)
            throw std::length_error("evaluation: too many nodes");
        sources.insert(node, source);
    };
    std::vector<WalkFrame> stack;
    walkUnknown(
        table, id, stack,
        [&](SymbolicExprId visited, const SymbolicExpr*) {
            if (sources.find(visited) != nullptr)
                return true;
            const SymbolicExpr& node = *table.get(visited);
            const Evaluation way = detail::evaluationOf(node.op());
            if (way == Evaluation::None)
                detail::throwNotEvaluable(table, node);
            if (way != Evaluation::Operands)
                add(visited, sourceOf(visited, node));
            return way != Evaluation::Operands;
        },
        [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr*) {
            const auto first = static_cast<std::uint32_t>(operands_.size());
            const auto count = static_cast<std::uint32_t>(node.getNumInputs());
            for (std::uint32_t i = 0; i < count; ++i)
                operands_.push_back(*sources.find(node.getInput(i)));
            add(visited, {Source::Kind::Step, static_cast<std::uint32_t>(steps_.size())});
            steps_.push_back({visited, first, count, scalarRuleIndex(node.op())});
        },
        [&](SymbolicExprId missing, const SymbolicExpr* parent) { detail::throwMissingNode(table, missing, parent); });
    root_ = *sources.find(id);
    holdings_.assign(symbols_.size(), Holding::Nothing);
    cells_.resize(symbols_.size());
    types_.resize(symbols_.size());
}

/// The source of a leaf: a new constant or slot.
PreparedExpr::Source PreparedExpr::sourceOf(SymbolicExprId id, const SymbolicExpr& node) {
    const auto constant = [this](SymbolicScalar value) {
        constants_.push_back(value);
        return Source{Source::Kind::Constant, static_cast<std::uint32_t>(constants_.size() - 1)};
    };
    if (detail::evaluationOf(node.op()) == Evaluation::Literal)
        return constant(detail::literalValue(node, node.op()));
    if (node.op() == SymbolicOp::String)
        if (const auto truth = detail::truthConstant(node); truth)
            return constant(*truth);
    slots_.emplace(id, symbols_.size());
    symbols_.push_back(id);
    return {Source::Kind::Slot, static_cast<std::uint32_t>(symbols_.size() - 1)};
}

std::optional<std::size_t> PreparedExpr::slotOf(SymbolicExprId symbol) const {
    const auto found = slots_.find(symbol);
    if (found == slots_.end())
        return std::nullopt;
    return found->second;
}

std::optional<std::size_t> PreparedExpr::slotOf(const std::string& name) const {
    for (std::size_t slot = 0; slot < symbols_.size(); ++slot) {
        const auto* const node = dynamic_cast<const SymbolicString*>(table_->get(symbols_[slot]));
        if (node != nullptr && node->getName() == name)
            return slot;
    }
    return std::nullopt;
}

/// Lets a slot hold another kind of value than before.
void PreparedExpr::hold(std::size_t slot, Holding holding) {
    if (slot >= slotCount())
        throw std::out_of_range("prepared expression: no such slot");
    if (holding == Holding::Vector || holdings_[slot] == Holding::Vector)
        laidOut_ = false;
    holdings_[slot] = holding;
    if (holding <= Holding::Double)
        types_[slot] = static_cast<ScalarType>(holding);
    settled_ = false;
}

void PreparedExpr::set(std::size_t slot, const SymbolicValue& value) {
    if (value.isVector()) {
        setVector(slot, value.elements());
        return;
    }
    const SymbolicScalar& scalar = value.scalar();
    if (slot >= slotCount() || holdings_[slot] != static_cast<Holding>(scalar.type()))
        hold(slot, static_cast<Holding>(scalar.type()));
    cells_[slot] = scalar.cell();
}

void PreparedExpr::setVector(std::size_t slot, const SymbolicValue::Elements& elements) {
    if (slot >= slotCount())
        throw std::out_of_range("prepared expression: no such slot");
    vectors_.resize(slotCount());
    const bool sameShape = laidOut_ && holdings_[slot] == Holding::Vector && vectors_[slot].size() == elements.size();
    vectors_[slot] = elements;
    if (!sameShape) {
        hold(slot, Holding::Vector);
        return;
    }
    const std::uint32_t first = slotPlaces_[slot].at;
    for (std::uint32_t i = 0; i < elements.size(); ++i) {
        const std::uint32_t cell = vectorCells_[first + i];
        settled_ = settled_ && types_[cell] == elements[i].type();
        cells_[cell] = elements[i].cell();
        types_[cell] = elements[i].type();
    }
}

SymbolicValue PreparedExpr::run() {
    if (!settled_) {
        if (!complete_)
            return runFirst();
        settle();
    }
    return compute();
}

/// Runs with values from the table for slots that were not set; they keep these where the run succeeds.
SymbolicValue PreparedExpr::runFirst() {
    const std::vector<std::size_t> taken = emptySlots();
    try {
        takeValues(taken);
        settle();
        SymbolicValue value = compute();
        complete_ = true;
        return value;
    } catch (...) {
        giveUpValues(taken);
        throw;
    }
}

SymbolicValue PreparedExpr::compute() {
    detail::execute(operations_.data(), cells_.data(), cells_.data() + firstResult_);
    return result();
}

void PreparedExpr::settle() {
    if (!laidOut_) {
        PreparedExprLayout(*this).install(*this);
        laidOut_ = true;
    }
    settleTypes();
    settled_ = true;
}

std::vector<std::size_t> PreparedExpr::emptySlots() const {
    std::vector<std::size_t> slots;
    for (std::size_t slot = 0; slot < slotCount(); ++slot)
        if (holdings_[slot] == Holding::Nothing)
            slots.push_back(slot);
    return slots;
}

/// Gives slots the values that their symbols have in the table.
void PreparedExpr::takeValues(const std::vector<std::size_t>& slots) {
    SymbolicExprEvalImpl evaluator(*table_);
    for (const std::size_t slot : slots)
        set(slot, evaluator.evaluate(symbols_[slot]));
}

void PreparedExpr::giveUpValues(const std::vector<std::size_t>& slots) noexcept {
    for (const std::size_t slot : slots) {
        holdings_[slot] = Holding::Nothing;
        if (!vectors_.empty())
            vectors_[slot].clear();
    }
    laidOut_ = false;
    settled_ = false;
}

/// Chooses the code of each operation by the types of its operands.
void PreparedExpr::settleTypes() {
    std::size_t result = firstResult_;
    for (std::size_t i = 0; i + 1 < operations_.size(); ++i) {
        detail::Operation& operation = operations_[i];
        const ScalarRuleIndex rule = detail::ruleOfCode(operation.code);
        const ScalarType left = types_[operation.left];
        const ScalarType right = types_[operation.right];
        operation.code = detail::operationCode(rule, left, right);
        types_[result++] = scalarRules[static_cast<std::size_t>(rule)]
                               .by[static_cast<std::size_t>(left)][static_cast<std::size_t>(right)]
                               .result;
    }
}

SymbolicValue PreparedExpr::result() const {
    const auto value = [this](std::uint32_t cell) { return visibleScalar({types_[cell], cells_[cell]}); };
    if (!rootPlace_.isVector)
        return value(rootPlace_.at);
    SymbolicValue::Elements elements;
    elements.reserve(rootPlace_.length);
    for (std::uint32_t i = 0; i < rootPlace_.length; ++i)
        elements.push_back(value(vectorCells_[rootPlace_.at + i]));
    return elements;
}

} // namespace VT
