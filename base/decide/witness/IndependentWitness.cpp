// The smallest witness where unknowns do not depend on others, or where what depends on them need not be searched.
//
// Method: where every comparison is in the question once, one walk up the nodes finds for each what it costs to hold
// and to fail, and one walk down picks the values.  Elsewhere the values that comparisons force which have to hold, and
// 0 for the rest, are below every witness, so they are the smallest where they are one; differences, sums and floors
// follow from them.  What is left is read from the diagram.
// Cost: linear in the nodes of the question, or of its diagram.
#include "base/decide/witness/WitnessSearch.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

constexpr std::uint32_t noPosition = ~std::uint32_t{0};

} // namespace

/// The positions of levels in the order of the texts; those that no leaf stands for come last.
void WitnessSearch::placeLevels(std::span<const UnknownLeaf> leaves) {
    positions_.assign(question_->levels().size(), noPosition);
    std::uint32_t next = 0;
    for (const UnknownLeaf& leaf : leaves) {
        if (const Level level = question_->levelOf(unknowns_[leaf.unknown].quantity);
            level != noLevel && positions_[level] == noPosition)
            positions_[level] = next++;
    }
    for (std::uint32_t& position : positions_)
        if (position == noPosition)
            position = next++;
}

Witness WitnessSearch::byLevels(std::span<const UnknownLeaf> leaves, std::span<const std::int64_t> values) const {
    return witness(leaves, [&](Unknown unknown) {
        const Level level = question_->levelOf(unknowns_[unknown].quantity);
        return level == noLevel ? std::int64_t{0} : values[level];
    });
}

/// The value nearest to 0 for which a comparison holds.
std::int64_t WitnessSearch::nearest(Gate gate) const {
    const Question::Node& node = question_->nodes()[gate >> 1U];
    const LevelInfo& level = question_->levels()[node.level];
    bool in = (gate & 1U) == 0;
    std::int64_t low = level.low;
    std::optional<std::int64_t> nearest;
    const auto tryUpTo = [&](std::int64_t high) {
        const std::int64_t value = std::clamp(std::int64_t{0}, low, high);
        if (in && (!nearest || isSmaller(value, *nearest)))
            nearest = value;
        in = !in;
    };
    for (const std::int64_t end : question_->ends(node)) {
        tryUpTo(end);
        low = end + 1;
    }
    tryUpTo(level.high);
    return *nearest;
}

std::optional<Decision> WitnessSearch::findAtOnce(const Question& question, std::span<const UnknownLeaf> leaves) {
    question_ = &question;
    steps_.take(question.nodes().size() / 4 + 1);
    byLevel_.assign(question.levels().size(), 0);
    if (question.isReadOnce() && !question.needsChecking()) {
        placeLevels(leaves);
        valuesOfReadOnce();
    } else {
        forcedValues();
        if (question.needsChecking() && !computeLevels())
            return std::nullopt;
        if (!question.holds([&](Level level) { return byLevel_[level]; }))
            return std::nullopt;
    }
    return Decision{Answer::Yes, DecisionBound::None, byLevels(leaves, byLevel_)};
}

/// Computes the values of the levels that depend on others; false where one is a term, or has no 64 bits.
bool WitnessSearch::computeLevels() {
    const std::vector<LevelInfo>& levels = question_->levels();
    const auto valueOf = [&](Unknown unknown) {
        const Level level = question_->levelOf(unknowns_[unknown].quantity);
        return level == noLevel ? std::int64_t{0} : byLevel_[level];
    };
    const auto computed = [&](Unknown unknown) -> std::optional<std::int64_t> {
        const UnknownInfo& info = unknowns_[unknown];
        if (!info.isComputed())
            return valueOf(unknown);
        const auto isFree = [&](const auto& part) { return !unknowns_[part.unknown].isComputed(); };
        if (info.kind == UnknownKind::Term || !std::ranges::all_of(info.sum, isFree) ||
            (info.floor != nullptr && !std::ranges::all_of(info.floor->form.parts, isFree)))
            return std::nullopt;
        steps_.take(info.sum.size());
        return computedValue(info, valueOf);
    };
    for (Level level = 0; level < levels.size(); ++level) {
        if (!levels[level].isChecked)
            continue;
        auto plus = computed(levels[level].plus);
        auto minus = levels[level].minus != noUnknown ? computed(levels[level].minus) : std::optional<std::int64_t>(0);
        if (levels[level].opposed)
            std::swap(plus, minus);
        if (!plus || !minus || __builtin_sub_overflow(*plus, *minus, &byLevel_[level]))
            return false;
    }
    return true;
}

/// Values that no witness can go below, one by one: what comparisons say that have to hold, and 0 for the others.
void WitnessSearch::forcedValues() {
    if (question_->nodes().size() == 1)
        return;
    const Question::Node& root = question_->nodes()[question_->root() >> 1U];
    if (question_->isComparison(root) || (question_->root() & 1U) != 0)
        return;
    for (const Gate operand : question_->operands(root))
        if (const Question::Node& node = question_->nodes()[operand >> 1U]; question_->isComparison(node))
            byLevel_[node.level] = nearest(operand);
}

/// The smallest values where no two nodes share anything.  An And fails most cheaply by the operand whose first value
/// beside 0 comes last; it holds by all of them.
void WitnessSearch::valuesOfReadOnce() {
    const std::vector<Question::Node>& nodes = question_->nodes();
    cheapest_.resize(nodes.size() * 2);
    for (Gate gate = 2; gate < nodes.size() * 2; ++gate) {
        const Question::Node& node = nodes[gate >> 1U];
        Cheapest& cheapest = cheapest_[gate];
        const bool fails = (gate & 1U) != 0;
        if (question_->isComparison(node)) {
            const bool costsNothing = question_->contains(node, 0) != fails;
            cheapest = {costsNothing ? noPosition : positions_[node.level], gate};
            continue;
        }
        cheapest = {fails ? 0 : noPosition, gate};
        bool isFirst = true;
        for (const Gate operand : question_->operands(node)) {
            const std::uint32_t first = cheapest_[fails ? opposite(operand) : operand].first;
            if (fails ? isFirst || first > cheapest.first : first < cheapest.first)
                cheapest = {first, opposite(operand)};
            isFirst = false;
        }
    }
    wanted_.assign(nodes.size() * 2, 0);
    wanted_[question_->root()] = 1;
    for (Gate gate = static_cast<Gate>(nodes.size() * 2); gate-- > 2;) {
        if (wanted_[gate] == 0)
            continue;
        const Question::Node& node = nodes[gate >> 1U];
        if (question_->isComparison(node))
            byLevel_[node.level] = nearest(gate);
        else if ((gate & 1U) != 0)
            wanted_[cheapest_[gate].operand] = 1;
        else
            for (const Gate operand : question_->operands(node))
                wanted_[operand] = 1;
    }
}

Witness WitnessSearch::smallestOf(Diagram diagram, std::span<const UnknownLeaf> leaves) {
    placeLevels(leaves);
    const std::vector<LevelInfo>& levels = question_->levels();
    const std::vector<std::int64_t>& values = smallest_.find(diagrams_, diagram, levels, positions_);
    byLevel_.resize(levels.size());
    for (Level level = 0; level < levels.size(); ++level)
        byLevel_[level] = values[positions_[level]];
    return byLevels(leaves, byLevel_);
}

} // namespace VT
