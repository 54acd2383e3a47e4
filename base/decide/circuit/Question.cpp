// Copies what a question needs of a circuit, depth first with an explicit stack, so that nodes and levels are numbered
// in the order of the text.
#include "base/decide/circuit/Question.hpp"

#include "base/core/Check.hpp"

#include <algorithm>

namespace VT {

void Question::begin() {
    if (++question_ == 0) {
        for (std::vector<Mark>* marks : {&ranks_, &byQuantity_, &byNode_})
            std::ranges::fill(*marks, Mark{});
        question_ = 1;
    }
    mentioned_.clear();
    ranked_ = 0;
    nodes_.assign(1, {noLevel, 0, 0});
    ends_.clear();
    operands_.clear();
    levels_.clear();
    turned_.clear();
    next_.clear();
    first_ = last_ = noLevel;
    frames_.clear();
    needsChecking_ = false;
    comparisons_ = 0;
}

void Question::clear() {
    ranks_.clear();
    byQuantity_.clear();
    byNode_.clear();
}

void Question::rankUnknowns() {
    for (const std::span<const Unknown> met : mentioned_) {
        for (const Unknown unknown : met) {
            if (unknown >= ranks_.size())
                ranks_.resize(unknown + 1);
            if (ranks_[unknown].question != question_)
                ranks_[unknown] = {question_, ranked_++};
        }
    }
    mentioned_.clear();
}

std::uint32_t Question::rankOf(Unknown unknown) const {
    const bool isKnown = unknown < ranks_.size() && ranks_[unknown].question == question_;
    return isKnown ? ranks_[unknown].value : ranked_ + unknown;
}

/// The level of a quantity; a new one is put after another, or last.
Level Question::addLevel(const Unknowns& unknowns, Quantity quantity, Level after) {
    if (quantity >= byQuantity_.size())
        byQuantity_.resize(quantity + 1);
    Mark& mark = byQuantity_[quantity];
    if (mark.question == question_)
        return mark.value;
    mark = {question_, static_cast<std::uint32_t>(levels_.size())};
    const QuantityInfo& info = unknowns.quantity(quantity);
    LevelInfo level{quantity, info.plus, info.minus, false, info.dependsOnOthers(), info.low, info.high};
    if (level.isChecked)
        rankUnknowns();
    bool turned = false;
    if (info.isDifference()) {
        turned = rankOf(info.plus) < rankOf(info.minus);
        if (turned)
            std::swap(level.plus, level.minus);
    } else if (info.kind == UnknownKind::Sum) {
        const LinearParts& parts = unknowns[info.plus].sum;
        turned =
            std::ranges::min_element(parts, {}, [&](const LinearPart& p) { return rankOf(p.unknown); })->factor < 0;
        level.opposed = turned;
    }
    if (turned) {
        level.low = info.high == plusInfinite ? minusInfinite : -info.high;
        level.high = info.low == minusInfinite ? plusInfinite : -info.low;
    }
    needsChecking_ = needsChecking_ || level.isChecked;
    levels_.push_back(level);
    turned_.push_back(turned);
    if (after == noLevel)
        after = last_;
    next_.push_back(after == noLevel ? noLevel : next_[after]);
    (after == noLevel ? first_ : next_[after]) = mark.value;
    if (after == last_)
        last_ = mark.value;
    return mark.value;
}

void Question::addComparisons(const Circuit& circuit, const Unknowns& unknowns, Gate conjunction) {
    Level after = noLevel;
    for (const Gate operand : circuit.operands(conjunction))
        if (circuit.isComparison(operand) && after == noLevel)
            after = levelOf(circuit.quantity(operand));
    for (const Gate operand : circuit.operands(conjunction)) {
        if (!circuit.isComparison(operand))
            continue;
        after = addLevel(unknowns, circuit.quantity(operand), after);
        if (byNode_[operand >> 1U].question != question_)
            addComparison(circuit, after, operand);
    }
}

/// Numbers the levels in the order of the list.
void Question::sortLevels() {
    sorted_.resize(levels_.size());
    bool isSorted = true;
    Level number = 0;
    for (Level level = first_; level != noLevel; level = next_[level]) {
        isSorted = isSorted && level == number;
        sorted_[level] = number++;
    }
    if (isSorted)
        return;
    unsorted_ = levels_;
    for (Level level = 0; level < levels_.size(); ++level)
        levels_[sorted_[level]] = unsorted_[level];
    for (Node& node : nodes_)
        if (node.level != noLevel)
            node.level = sorted_[node.level];
    for (const LevelInfo& level : levels_)
        byQuantity_[level.quantity].value = sorted_[byQuantity_[level.quantity].value];
}

/// A comparison holds up to its first end; turned round it does so from there on.
void Question::addComparison(const Circuit& circuit, Level level, Gate truth) {
    const std::span<const std::int64_t> ends = circuit.ends(truth);
    const auto first = static_cast<std::uint32_t>(ends_.size());
    bool flip = false;
    if (turned_[level]) {
        for (std::size_t i = ends.size(); i-- > 0;)
            ends_.push_back(-ends[i] - 1);
        flip = ends.size() % 2 != 0;
    } else {
        for (const std::int64_t end : ends) // one or two, as a rule
            ends_.push_back(end);
    }
    byNode_[truth >> 1U] = {question_, static_cast<std::uint32_t>(nodes_.size()) * 2 + (flip ? 1U : 0U)};
    nodes_.push_back({level, first, static_cast<std::uint32_t>(ends.size())});
    ++comparisons_;
}

void Question::ask(const Circuit& circuit, const Unknowns& unknowns, Steps& steps, Gate root) {
    byNode_.resize(std::max(byNode_.size(), circuit.nodeCount()));
    byNode_[0] = {question_, always};
    const auto isDone = [&](Gate truth) {
        if (byNode_[truth >> 1U].question == question_)
            return true;
        steps.take();
        if (circuit.isComparison(truth)) {
            addComparison(circuit, addLevel(unknowns, circuit.quantity(truth), noLevel), truth);
            return true;
        }
        addComparisons(circuit, unknowns, truth);
        frames_.push_back({truth, 0});
        return false;
    };
    isDone(root);
    while (!frames_.empty()) {
        Frame& top = frames_.back();
        const std::span<const Gate> operands = circuit.operands(top.truth);
        if (top.next < operands.size()) {
            const Gate operand = operands[top.next++];
            isDone(operand);
            continue;
        }
        const auto first = static_cast<std::uint32_t>(operands_.size());
        steps.take(operands.size());
        for (const Gate operand : operands)
            operands_.push_back(byNode_[operand >> 1U].value ^ (operand & 1U));
        byNode_[top.truth >> 1U] = {question_, static_cast<std::uint32_t>(nodes_.size()) * 2};
        nodes_.push_back({noLevel, first, static_cast<std::uint32_t>(operands.size())});
        frames_.pop_back();
    }
    root_ = byNode_[root >> 1U].value ^ (root & 1U);
    sortLevels();
}

bool Question::contains(const Node& node, std::int64_t value) const {
    const std::span<const std::int64_t> all = ends(node);
    return (std::ranges::lower_bound(all, value) - all.begin()) % 2 == 0;
}

bool Question::allHold(const Node& node) const {
    return std::ranges::all_of(operands(node), [&](Gate t) { return (truths_[t >> 1U] ^ (t & 1U)) != 0; });
}

} // namespace VT
