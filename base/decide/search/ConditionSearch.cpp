// Turns questions into clauses, and assignments of clauses back into values.
#include "base/decide/search/ConditionSearch.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

constexpr unsigned usedAsIs = 1;
constexpr unsigned usedNegated = 2;

constexpr unsigned turned(unsigned uses, Gate gate) {
    return (gate & 1U) == 0 ? uses : (uses >> 1U | uses << 1U) & 3U;
}

} // namespace

Decision ConditionSearch::find(const Question& question, std::span<const UnknownLeaf> leaves) {
    question_ = &question;
    unconfirmed_ = false;
    try {
        witnesses_.beginPaths(question, leaves, WitnessSearch::Order::Mentioned);
        encode();
        if (!hasPath())
            return {unconfirmed_ ? Answer::Undecided : Answer::No,
                    unconfirmed_ ? DecisionBound::Terms : DecisionBound::None, std::nullopt};
    } catch (const StepsUsedUp&) {
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    }
    if (!witnesses_.hasTerms())
        steps_.spellOut([&] { minimize(leaves); });
    return {Answer::Yes, DecisionBound::None, witnesses_.pathWitness(leaves)};
}

// Clauses.

void ConditionSearch::encode() {
    vertices_.clear();
    for (const LevelInfo& level : question_->levels()) {
        if (level.minus != noUnknown) {
            addVertex(level.plus);
            addVertex(level.minus);
        }
    }
    clauses_.begin(vertices_.size() + 1);
    encodeLevels();
    encodeNodes();
}

void ConditionSearch::addVertex(Unknown unknown) {
    if (vertices_.find(unknown) == nullptr)
        vertices_.insert(unknown, static_cast<Vertex>(vertices_.size() + 1));
}

void ConditionSearch::encodeLevels() {
    levels_.assign(question_->levels().size(), {});
    for (const Question::Node& node : question_->nodes()) {
        if (question_->isComparison(node)) {
            std::vector<std::int64_t>& ends = levels_[node.level].ends;
            ends.insert(ends.end(), question_->ends(node).begin(), question_->ends(node).end());
        }
    }
    for (Level level = 0; level < levels_.size(); ++level)
        addLevel(level);
    // What bounds the unknowns themselves holds always.
    const Literal truth = clauses_.addVariable(true);
    for (const LevelInfo& level : question_->levels()) {
        for (const Unknown unknown : {level.plus, level.minus}) {
            const Vertex* vertex = level.minus != noUnknown ? vertices_.find(unknown) : nullptr;
            if (vertex == nullptr)
                continue;
            const UnknownInfo& info = unknowns_[unknown];
            if (info.high != plusInfinite)
                clauses_.addBound(truth, {0, *vertex, info.high});
            if (info.low != minusInfinite)
                clauses_.addBound(truth, {*vertex, 0, -info.low});
        }
    }
    clauses_.addClause(std::span(&truth, 1));
}

void ConditionSearch::addLevel(Level level) {
    LevelVariables& variables = levels_[level];
    std::ranges::sort(variables.ends);
    variables.ends.erase(std::unique(variables.ends.begin(), variables.ends.end()), variables.ends.end());
    const LevelInfo& info = question_->levels()[level];
    variables.isInGraph = info.minus != noUnknown || vertices_.find(info.plus) != nullptr;
    for (const std::int64_t end : variables.ends) {
        const Literal literal = clauses_.addVariable(end >= 0);
        if (variables.isInGraph)
            addBounds(info, end, literal);
        if (!variables.literals.empty()) {
            const Literal follows[] = {negated(variables.literals.back()), literal};
            clauses_.addClause(follows);
        }
        variables.literals.push_back(literal);
    }
}

/// What the literal "at most `end`" and its opposite mean for the unknowns of the level.
void ConditionSearch::addBounds(const LevelInfo& level, std::int64_t end, Literal literal) {
    Vertex plus = *vertices_.find(level.plus);
    Vertex minus = level.minus != noUnknown ? *vertices_.find(level.minus) : 0;
    if (level.opposed)
        std::swap(plus, minus);
    clauses_.addBound(literal, {minus, plus, end});
    clauses_.addBound(negated(literal), {plus, minus, -end - 1});
}

Literal ConditionSearch::endLiteral(Level level, std::int64_t end) const {
    const LevelVariables& variables = levels_[level];
    const auto at = std::ranges::lower_bound(variables.ends, end);
    return variables.literals[static_cast<std::size_t>(at - variables.ends.begin())];
}

void ConditionSearch::encodeNodes() {
    const std::vector<Question::Node>& nodes = question_->nodes();
    std::vector<std::uint8_t> uses(nodes.size(), 0);
    uses[question_->root() >> 1U] = static_cast<std::uint8_t>(turned(usedAsIs, question_->root()));
    for (std::size_t i = nodes.size(); i-- > 1;) {
        if (!question_->isComparison(nodes[i]))
            for (const Gate operand : question_->operands(nodes[i]))
                uses[operand >> 1U] |= static_cast<std::uint8_t>(turned(uses[i], operand));
    }
    gates_.assign(nodes.size(), 0);
    atZero_.assign(nodes.size(), 1);
    for (std::size_t i = 1; i < nodes.size(); ++i) {
        const Question::Node& node = nodes[i];
        if (question_->isComparison(node)) {
            atZero_[i] = question_->contains(node, 0) ? 1 : 0;
            gates_[i] = addComparison(node);
        } else {
            const auto holds = [&](Gate gate) { return holdsAtZero(gate); };
            atZero_[i] = std::ranges::all_of(question_->operands(node), holds) ? 1 : 0;
            gates_[i] = addAnd(node, uses[i]);
        }
    }
    const Literal root = literalOf(question_->root());
    clauses_.addClause(std::span(&root, 1));
}

/// A literal for a comparison: that of its end, or a new one that each stretch between two ends implies.
Literal ConditionSearch::addComparison(const Question::Node& node) {
    const std::span<const std::int64_t> ends = question_->ends(node);
    if (ends.size() == 1)
        return endLiteral(node.level, ends.front());
    const Literal holds = clauses_.addVariable(question_->contains(node, 0));
    for (std::size_t i = 0; i <= ends.size(); ++i) {
        boost::container::small_vector<Literal, 3> clause{i % 2 == 0 ? holds : negated(holds)};
        if (i > 0)
            clause.push_back(endLiteral(node.level, ends[i - 1]));
        if (i < ends.size())
            clause.push_back(negated(endLiteral(node.level, ends[i])));
        clauses_.addClause({clause.data(), clause.size()});
    }
    return holds;
}

Literal ConditionSearch::addAnd(const Question::Node& node, unsigned uses) {
    const std::span<const Gate> operands = question_->operands(node);
    const bool atZero = std::ranges::all_of(operands, [&](Gate gate) { return holdsAtZero(gate); });
    const Literal all = clauses_.addVariable(atZero);
    if ((uses & usedAsIs) != 0) {
        for (const Gate operand : operands) {
            const Literal implied[] = {negated(all), literalOf(operand)};
            clauses_.addClause(implied);
        }
    }
    if ((uses & usedNegated) != 0) {
        std::vector<Literal> clause{all};
        for (const Gate operand : operands)
            clause.push_back(negated(literalOf(operand)));
        clauses_.addClause(clause);
    }
    return all;
}

// Paths.

/// Whether a path is met.  Those that take many steps are tried again, with more, when there are no others.
bool ConditionSearch::hasPath() {
    postponed_.clear();
    for (pathSteps_ = steps_.total() / limits::pathShare + 1;; pathSteps_ *= limits::pathGrowth) {
        while (const auto end = nextPath({}))
            if (*end == PathEnd::Met)
                return true;
        if (postponed_.empty())
            return false;
        for (std::vector<LevelRange>& path : std::exchange(postponed_, {})) {
            path_ = std::move(path);
            if (tryPath() == PathEnd::Met)
                return true;
        }
    }
}

/// Tries the next path; nothing where there is none.
std::optional<ConditionSearch::PathEnd> ConditionSearch::nextPath(std::span<const Literal> assumptions) {
    if (!clauses_.solve(assumptions))
        return std::nullopt;
    readPath();
    return tryPath();
}

/// Tries the path at hand, and excludes it from those that follow unless it is met.
ConditionSearch::PathEnd ConditionSearch::tryPath() {
    const std::uint64_t before = steps_.left();
    const PathEnd end = witnesses_.tryPath(path_, pathSteps_);
    if (end != PathEnd::Met) {
        unconfirmed_ = unconfirmed_ || end == PathEnd::Open;
        if (end == PathEnd::Hard)
            postponed_.push_back(path_);
        if (end == PathEnd::Excluded)
            refute(before - steps_.left());
        std::vector<Literal> clause;
        for (const auto& [level, low, high] : path_) {
            if (low != minusInfinite)
                clause.push_back(endLiteral(level, low - 1));
            if (high != plusInfinite)
                clause.push_back(negated(endLiteral(level, high)));
        }
        clauses_.addClause(clause);
    }
    return end;
}

/// The stretch between two ends of a comparison that the assignment is on.
ConditionSearch::LevelRange ConditionSearch::rangeOf(const Question::Node& node) const {
    const std::span<const std::int64_t> ends = question_->ends(node);
    const auto high = std::ranges::partition_point(
        ends, [&](std::int64_t end) { return !clauses_.holds(endLiteral(node.level, end)); });
    return {node.level, high == ends.begin() ? minusInfinite : high[-1] + 1, high == ends.end() ? plusInfinite : *high};
}

/// Ranges that suffice: of an And that holds those of all operands, of one that does not those of one operand.
void ConditionSearch::readPath() {
    const std::vector<Question::Node>& nodes = question_->nodes();
    path_.clear();
    positions_.assign(levels_.size(), 0);
    isOnPath_.assign(nodes.size(), 0);
    isOnPath_[question_->root() >> 1U] = 1;
    // What the comparisons say counts: a gate that only one side was written for may have either value.
    std::vector<std::uint8_t> truths(nodes.size(), 1);
    for (std::size_t i = 1; i < nodes.size(); ++i) {
        const Question::Node& node = nodes[i];
        if (question_->isComparison(node)) {
            const LevelRange range = rangeOf(node);
            truths[i] = question_->contains(node, range.high != plusInfinite ? range.high : plusInfinite) ? 1 : 0;
        } else {
            truths[i] = std::ranges::all_of(question_->operands(node),
                                            [&](Gate gate) { return (truths[gate >> 1U] ^ (gate & 1U)) != 0; });
        }
    }
    VTSYM_CHECK((truths[question_->root() >> 1U] ^ (question_->root() & 1U)) != 0);
    steps_.take(nodes.size() / 4 + 1);
    for (std::size_t i = nodes.size(); i-- > 1;) {
        if (isOnPath_[i] == 0)
            continue;
        const Question::Node& node = nodes[i];
        if (question_->isComparison(node)) {
            const LevelRange range = rangeOf(node);
            std::uint32_t& position = positions_[node.level];
            if (position == 0) {
                path_.push_back(range);
                position = static_cast<std::uint32_t>(path_.size());
            } else {
                path_[position - 1].low = std::max(path_[position - 1].low, range.low);
                path_[position - 1].high = std::min(path_[position - 1].high, range.high);
            }
            continue;
        }
        const std::span<const Gate> operands = question_->operands(node);
        if (truths[i] != 0) {
            for (const Gate operand : operands)
                isOnPath_[operand >> 1U] = 1;
            continue;
        }
        const auto fails = [&](Gate gate) { return (truths[gate >> 1U] ^ (gate & 1U)) == 0; };
        // One that is on the path anyway, or else the first.
        auto operand =
            std::ranges::find_if(operands, [&](Gate gate) { return fails(gate) && isOnPath_[gate >> 1U] != 0; });
        if (operand == operands.end())
            operand = std::ranges::find_if(operands, fails);
        isOnPath_[*operand >> 1U] = 1;
    }
}

/// Takes ranges from a path that nothing meets while that stays so: long runs of them first.  Finding out about the
/// whole path took `spent` steps.  About fewer ranges it takes fewer, as a rule, or else many more: these tries are
/// given up.
void ConditionSearch::refute(std::uint64_t spent) {
    const Steps::Share share(steps_, limits::refutingSteps + limits::refutingFactor * spent);
    for (std::size_t length = path_.size(); length > 0; length /= 2) {
        for (std::size_t i = 0; i < path_.size();) {
            std::vector<LevelRange> without(path_.begin(), path_.begin() + static_cast<std::ptrdiff_t>(i));
            const std::size_t rest = std::min(i + length, path_.size());
            without.insert(without.end(), path_.begin() + static_cast<std::ptrdiff_t>(rest), path_.end());
            if (witnesses_.excludesPath(without, limits::refutingSteps + spent))
                path_ = std::move(without);
            else
                i = rest;
        }
    }
}

// The smallest witness.

void ConditionSearch::minimize(std::span<const UnknownLeaf> leaves) {
    witnesses_.beginPaths(*question_, leaves, WitnessSearch::Order::Texts);
    static_cast<void>(witnesses_.tryPath(path_, pathSteps_));
    for (const UnknownLeaf& leaf : leaves) {
        while (witnesses_.pathValue(leaf.unknown) != 0 && findSmaller(leaf.unknown, witnesses_.pathValue(leaf.unknown)))
            steps_.take();
        fix(leaf.unknown, witnesses_.pathValue(leaf.unknown));
    }
}

/// Looks for a witness with a smaller value of an unknown; those fixed before keep theirs.
bool ConditionSearch::findSmaller(Unknown unknown, std::int64_t value) {
    const std::int64_t high = value > 0 ? value - 1 : -value;
    const std::int64_t low = value > 0 ? 1 - value : value + 1;
    const Literal smaller = within(unknown, low, high);
    const std::size_t before = witnesses_.restrictions();
    witnesses_.restrictPaths(unknown, low, high);
    const auto end = nextPath(std::span(&smaller, 1));
    witnesses_.shrinkRestrictions(before);
    VTSYM_CHECK(!end || *end == PathEnd::Met);
    const Literal isNot = negated(smaller);
    if (!end)
        clauses_.addClause(std::span(&isNot, 1));
    return end.has_value();
}

void ConditionSearch::fix(Unknown unknown, std::int64_t value) {
    const Literal fixed = within(unknown, value, value);
    clauses_.addClause(std::span(&fixed, 1));
    witnesses_.restrictPaths(unknown, value, value);
}

/// A literal that says that the value nearest to 0 of an unknown's stretch lies between two bounds.
Literal ConditionSearch::within(Unknown unknown, std::int64_t low, std::int64_t high) {
    const Literal literal = clauses_.addVariable(true);
    if (const Vertex* vertex = vertices_.find(unknown); vertex != nullptr) {
        clauses_.addBound(literal, {0, *vertex, high});
        clauses_.addBound(literal, {*vertex, 0, -low});
        return literal;
    }
    const Level level = question_->levelOf(unknowns_[unknown].quantity);
    if (level == noLevel)
        return literal;
    const LevelVariables& variables = levels_[level];
    const auto above =
        static_cast<std::size_t>(std::ranges::lower_bound(variables.ends, high) - variables.ends.begin());
    const auto below = static_cast<std::size_t>(std::ranges::lower_bound(variables.ends, low) - variables.ends.begin());
    if (above < variables.ends.size()) {
        const Literal atMost[] = {negated(literal), variables.literals[above]};
        clauses_.addClause(atMost);
    }
    if (below > 0) {
        const Literal atLeast[] = {negated(literal), negated(variables.literals[below - 1])};
        clauses_.addClause(atLeast);
    }
    return literal;
}

} // namespace VT
