// Reads choices as unions of boxes, and answers from them.
//
// Method: an operand that compares one name with integers becomes a set of them, an And a box, an Or of Ands a list of
// boxes within the context.  BoxUnion finds points that boxes leave out.
// Cost: linear in the operands to read; all questions together limits::boxSteps, beyond which each takes a few.
#include "base/choices/boxes/ChoiceBoxes.hpp"

#include "base/choices/ChoiceRanges.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/reasons/MinimalSubset.hpp"
#include "base/transform/Symbols.hpp"

#include <algorithm>
#include <limits>
#include <utility>

namespace VT {

namespace {

std::optional<int> integerOf(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* const node = table.has(id) ? table.get(id) : nullptr;
    if (node == nullptr || node->op() != SymbolicOp::IntValue)
        return std::nullopt;
    return static_cast<const SymbolicIntValue*>(node)->getValue();
}

} // namespace

ChoiceBoxes::ChoiceBoxes(const SymbolicExprTable& table, SymbolicExprId context,
                         std::span<const SymbolicExprId> choices, bool bits32)
    : table_(table) {
    for (const SymbolicExprId choice : choices)
        areAllRead_ = forms_.emplace_back(formOf(choice)).has_value() && areAllRead_;
    atomCount_ = atoms_.size();
    isUsable_ = atomCount_ <= limits::boxAtoms && readContext(context);
    if (!isUsable_)
        return;
    constexpr std::int64_t least = std::numeric_limits<std::int32_t>::min();
    constexpr std::int64_t most = std::numeric_limits<std::int32_t>::max();
    for (Atom atom = 0; bits32 && atom < atomCount_; ++atom)
        isUsable_ = context_.restrict(atom, IntegerSet(least, most)) && isUsable_;
    for (std::optional<Form>& form : forms_)
        if (form)
            restrict(*form);
    findCuts();
    left_ = limits::boxSteps + choices.size() * limits::boxStepsPerChoice;
    hiding_.emplace(atomCount_);
    none_.emplace(atomCount_);
}

Atom ChoiceBoxes::atomOf(SymbolicExprId name) {
    if (const Atom* const atom = atoms_.find(name))
        return *atom;
    names_.push_back(name);
    return atoms_.insert(name, static_cast<Atom>(atoms_.size()));
}

/// Finds the values at which what the choices and the context say of a name changes.
void ChoiceBoxes::findCuts() {
    cuts_.resize(atomCount_, {0, 0});
    const auto add = [&](const Constraint& side) {
        for (const auto& [low, high] : side.set.intervals()) {
            for (const std::int64_t end : {low, high})
                if (end != IntegerSet::minusInfinity && end != IntegerSet::plusInfinity)
                    cuts_[side.atom] = {std::min(cuts_[side.atom].first, end), std::max(cuts_[side.atom].second, end)};
        }
    };
    std::ranges::for_each(context_.constraints(), add);
    for (const std::optional<Form>& form : forms_) {
        if (form) {
            for (const Product& product : *form)
                for (const Operand& operand : product.operands)
                    add(operand.allows);
        }
    }
}

/// What an operand that compares one name with integers allows.
std::optional<Constraint> ChoiceBoxes::constraintOf(SymbolicExprId operand) {
    const auto ofComparison = [&](const SymbolicExpr& node) -> std::optional<Constraint> {
        const OperatorInfo& row = operatorInfo(node.op());
        const bool isMirrored = isIntegerName(table_, node.getInput(1));
        const SymbolicExprId name = node.getInput(isMirrored ? 1 : 0);
        const std::optional<int> value = integerOf(table_, node.getInput(isMirrored ? 0 : 1));
        if (!value || !isIntegerName(table_, name))
            return std::nullopt;
        return Constraint{atomOf(name), IntegerSet::satisfying(isMirrored ? row.mirrored : row.op, *value)};
    };
    const auto ofOperand = [&](const SymbolicExpr& node, std::size_t position) -> const Constraint* {
        const auto* const found = constraints_.find(node.getInput(position));
        return found != nullptr && *found ? &**found : nullptr;
    };
    const auto ofNode = [&](SymbolicExprId id, const SymbolicExpr& node) -> std::optional<Constraint> {
        if (comparisonOps.contains(node.op()))
            return ofComparison(node);
        if (isIntegerName(table_, id))
            return Constraint{atomOf(id), IntegerSet::allBut(0)};
        const bool isOr = node.op() == SymbolicOp::Or;
        if (node.op() != SymbolicOp::Not && node.op() != SymbolicOp::And && !isOr)
            return std::nullopt;
        const Constraint* const first = ofOperand(node, 0);
        if (first == nullptr || node.op() == SymbolicOp::Not)
            return first == nullptr ? std::nullopt : std::optional(Constraint{first->atom, first->set.complement()});
        const Constraint* const second = ofOperand(node, 1);
        if (second == nullptr || second->atom != first->atom)
            return std::nullopt;
        return Constraint{first->atom, isOr ? first->set.unite(second->set) : first->set.intersect(second->set)};
    };
    std::vector<WalkFrame> stack;
    walkUnknown(
        table_, operand, stack,
        [&](SymbolicExprId id, const SymbolicExpr*) { return constraints_.find(id) != nullptr; },
        [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr*) {
            constraints_.insert(id, ofNode(id, node));
        },
        [](SymbolicExprId, const SymbolicExpr*) {});
    const auto* const found = constraints_.find(operand);
    return found != nullptr ? *found : std::nullopt;
}

std::optional<ChoiceBoxes::Operand> ChoiceBoxes::operandOf(SymbolicExprId operand) {
    auto allows = constraintOf(operand);
    if (!allows)
        return std::nullopt;
    Operand result{std::move(*allows)};
    const auto parts = operandsOf(table_, operand, SymbolicOp::Or, limits::rangeOperands);
    if (!parts || parts->size() < 2)
        return parts ? std::optional(std::move(result)) : std::nullopt;
    for (const SymbolicExprId left : *parts) {
        if (table_.get(left)->op() == SymbolicOp::And)
            return std::nullopt;
        IntegerSet others;
        for (const SymbolicExprId part : *parts)
            if (part != left)
                others = others.unite(constraintOf(part)->set);
        result.shorter.push_back(std::move(others));
    }
    return result;
}

std::optional<ChoiceBoxes::Form> ChoiceBoxes::formOf(SymbolicExprId choice) {
    const auto products = operandsOf(table_, choice, SymbolicOp::Or, limits::rangeOperands);
    if (!products)
        return std::nullopt;
    Form form;
    std::size_t count = 0;
    for (const SymbolicExprId product : *products) {
        const auto operands = operandsOf(table_, product, SymbolicOp::And, limits::rangeOperands);
        if (!operands || (count += operands->size()) > limits::rangeOperands)
            return std::nullopt;
        form.emplace_back();
        for (const SymbolicExprId operand : *operands) {
            if (operand == table_.getIdTRUE())
                continue;
            auto read = operandOf(operand);
            if (!read)
                return std::nullopt;
            form.back().operands.push_back(std::move(*read));
        }
    }
    return form;
}

/// Reads the operands of the context that compare one name with integers; false where another one has a name in common
/// with a choice, or with such an operand.
bool ChoiceBoxes::readContext(SymbolicExprId context) {
    const auto operands = operandsOf(table_, context, SymbolicOp::And, limits::reasonOperands);
    if (!operands)
        return false;
    std::vector<SymbolicExprId> others;
    for (const SymbolicExprId operand : *operands) {
        if (operand == table_.getIdTRUE())
            continue;
        const std::optional<Constraint> allows = constraintOf(operand);
        if (!allows)
            others.push_back(operand);
        else if (allows->atom < atomCount_ && !context_.restrict(allows->atom, allows->set))
            return false;
    }
    hasOtherNames_ = !others.empty();
    std::vector<SymbolicExprId> names;
    SymbolsOfSymbolicExpr symbols(table_);
    for (const SymbolicExprId other : others)
        symbols.getSymbolIds(other, names);
    return std::ranges::none_of(names, [&](SymbolicExprId name) {
        const Atom* const atom = atoms_.find(name);
        return atom != nullptr && *atom < atomCount_;
    });
}

/// Finds the boxes of a form within the context.
void ChoiceBoxes::restrict(Form& form) const {
    for (Product& product : form) {
        product.box = context_;
        for (const Operand& operand : product.operands)
            product.isEmpty = product.isEmpty || !product.box.restrict(operand.allows.atom, operand.allows.set);
    }
}

std::vector<Cube> ChoiceBoxes::boxesOf(const Form& form) {
    std::vector<Cube> boxes;
    for (const Product& product : form)
        if (!product.isEmpty)
            boxes.push_back(product.box);
    return boxes;
}

Answer ChoiceBoxes::overlap(std::size_t a, std::size_t b) const {
    if (!isKnown(a) || !isKnown(b))
        return Answer::Undecided;
    for (const Product& first : *forms_[a]) {
        for (const Product& second : *forms_[b])
            if (!first.isEmpty && !second.isEmpty && first.box.intersects(second.box))
                return Answer::Yes;
    }
    return Answer::No;
}

/// Looks for a point of a region that is in none of some boxes.
BoxGap ChoiceBoxes::ask(BoxUnion& boxes, const Cube& region, std::span<const Cube> further) {
    const std::uint64_t most = std::max(limits::leastBoxSteps, left_ / 64);
    std::uint64_t left = most;
    BoxGap gap = boxes.gap(region, further, left);
    steps_ += most - left;
    left_ -= std::min(left_, most - left);
    return gap;
}

/// Looks for a point of one of some regions that is in none of some boxes.
BoxGap ChoiceBoxes::leaves(std::span<const Cube> regions, BoxUnion& boxes, std::span<const Cube> further) {
    BoxGap result{Answer::No};
    for (const Cube& region : regions) {
        BoxGap gap = ask(boxes, region, further);
        if (gap.answer == Answer::Yes)
            return gap;
        result.answer = gap.answer == Answer::Undecided ? gap.answer : result.answer;
        result.covering.insert(result.covering.end(), gap.covering.begin(), gap.covering.end());
    }
    return result;
}

Answer ChoiceBoxes::isActiveWithout(std::size_t choice, std::span<const std::size_t> others) {
    std::vector<Cube> boxes;
    for (const std::size_t other : others) {
        if (!isKnown(other))
            return Answer::Undecided;
        const std::vector<Cube> ofOther = boxesOf(*forms_[other]);
        boxes.insert(boxes.end(), ofOther.begin(), ofOther.end());
    }
    return isKnown(choice) ? leaves(boxesOf(*forms_[choice]), *none_, boxes).answer : Answer::Undecided;
}

BoxGap ChoiceBoxes::gapOf(std::span<const std::size_t> choices) {
    if (!isUsable_ || !std::ranges::all_of(choices, [&](std::size_t choice) { return isKnown(choice); }))
        return {};
    BoxUnion all(atomCount_);
    for (const std::size_t choice : choices)
        for (const Cube& box : boxesOf(*forms_[choice]))
            all.add(box);
    return ask(all, context_, {});
}

void ChoiceBoxes::hide(std::size_t choice) {
    if (!isKnown(choice)) {
        areHidingKnown_ = false;
        return;
    }
    for (const Cube& box : boxesOf(*forms_[choice])) {
        hiding_->add(box);
        hidingChoices_.push_back(choice);
        if (hidingGap_ && hidingGap_->answer != Answer::No &&
            (hidingGap_->answer == Answer::Undecided || contains(box, hidingGap_->point)))
            hidingGap_.reset();
    }
}

/// Looks for a point of the context that no box hides, or for the fewest boxes that hide all.
void ChoiceBoxes::findHidingGap() {
    hidingGap_ = ask(*hiding_, context_, {});
    if (hidingGap_->answer != Answer::No)
        return;
    std::vector<std::uint32_t>& covering = hidingGap_->covering;
    std::vector<Cube> some;
    const MinimalSubset needed = minimalSubset(covering.size(), [&](std::span<const std::size_t> positions) {
        some.clear();
        for (const std::size_t at : positions)
            some.push_back(hiding_->boxes()[covering[at]]);
        const Answer answer = ask(*none_, context_, some).answer;
        return answer == Answer::Undecided ? answer : answer == Answer::No ? Answer::Yes : Answer::No;
    });
    for (std::size_t i = 0; i < needed.positions.size(); ++i)
        covering[i] = covering[needed.positions[i]];
    covering.resize(needed.positions.size());
}

ChoiceBoxes::Activity ChoiceBoxes::activityOf(std::size_t choice) {
    if (!isHidingKnownOf(choice))
        return {};
    const std::vector<Cube> boxes = boxesOf(*forms_[choice]);
    const bool areAllHidden = hidingGap_ && hidingGap_->answer == Answer::No && !boxes.empty();
    BoxGap gap = areAllHidden ? *hidingGap_ : leaves(boxes, *hiding_, {});
    // What hides one choice may hide all that follow.
    if (gap.answer == Answer::No && !hidingGap_ && !boxes.empty())
        findHidingGap();
    Activity result{gap.answer, std::move(gap.point)};
    for (const std::uint32_t box : gap.covering)
        result.hiddenBy.push_back(hidingChoices_[box]);
    std::ranges::sort(result.hiddenBy);
    result.hiddenBy.erase(std::unique(result.hiddenBy.begin(), result.hiddenBy.end()), result.hiddenBy.end());
    return result;
}

Answer ChoiceBoxes::isEqual(std::size_t choice, SymbolicExprId condition) {
    if (!isHidingKnownOf(choice))
        return Answer::Undecided;
    const std::size_t known = atoms_.size();
    std::optional<Form> form = formOf(condition);
    if (!form || atoms_.size() > known) // it has names of its own
        return Answer::Undecided;
    restrict(*form);
    const std::vector<Cube> before = boxesOf(*forms_[choice]);
    const std::vector<Cube> after = boxesOf(*form);
    Answer gained = Answer::Undecided;
    const Answer lost = leaves(before, *hiding_, after).answer;
    if (lost != Answer::Yes)
        gained = leaves(after, *hiding_, before).answer;
    if (lost == Answer::Yes || gained == Answer::Yes)
        return Answer::No;
    return lost == Answer::No && gained == Answer::No ? Answer::Yes : Answer::Undecided;
}

std::vector<UnknownValue> ChoiceBoxes::valuesAt(const BoxPoint& point) const {
    std::vector<UnknownValue> values;
    for (Atom atom = 0; atom < atomCount_; ++atom) {
        const auto& [low, high] = cuts_[atom];
        const std::int64_t value = point[atom] == IntegerSet::minusInfinity  ? std::min<std::int64_t>(low - 1, 0)
                                   : point[atom] == IntegerSet::plusInfinity ? std::max<std::int64_t>(high + 1, 0)
                                                                             : point[atom];
        values.push_back({names_[atom], value});
    }
    return values;
}

std::uint64_t ChoiceBoxes::takeSteps() {
    return std::exchange(steps_, 0);
}

} // namespace VT
