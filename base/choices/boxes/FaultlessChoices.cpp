// Recognises choices without faults by the sides of their boxes.
//
// Method: each change that would be a fault is refuted by a point where it makes a difference and that no earlier
// choice hides: a point of the choice, one outside of it, and one for each operand, product and group.  Points found on
// the way refute most comparisons that a whole group might be written as. Cost: a question for each operand and
// product, at most limits::boxSteps each, and a few for groups.
#include "base/choices/boxes/ChoiceBoxes.hpp"
#include "base/core/Limits.hpp"

#include <algorithm>

namespace VT {

/// The search for a fault of one choice.
class ChoiceBoxes::FaultSearch {
public:
    FaultSearch(ChoiceBoxes& boxes, const Form& form) : boxes_(boxes), form_(form) {
        for (const Product& product : form)
            if (!product.isEmpty)
                all_.push_back(product.box);
    }

    bool findsNone() {
        return std::ranges::none_of(form_, &Product::isEmpty) && isNotAlways() && isEachProductNeeded() &&
               isEachOperandNeeded() && isNoGroupOneComparison();
    }

private:
    /// The boxes of all products but one.
    [[nodiscard]] std::vector<Cube> without(std::size_t product) const {
        std::vector<Cube> others = all_;
        others.erase(others.begin() + static_cast<std::ptrdiff_t>(product));
        return others;
    }

    /// Whether some point of a region is in none of the further boxes, and not hidden.
    bool isSomewhere(const Cube& region, std::span<const Cube> further) {
        BoxGap gap = boxes_.ask(*boxes_.hiding_, region, further);
        if (gap.answer != Answer::Yes)
            return false;
        points_.push_back(std::move(gap.point));
        return true;
    }

    /// A hidden part shows that the choice is not always active.
    bool isNotAlways() { return !boxes_.hiding_->boxes().empty() || isSomewhere(boxes_.context_, all_); }

    bool isEachProductNeeded() {
        for (std::size_t i = 0; i < form_.size(); ++i)
            if (!isSomewhere(form_[i].box, without(i)))
                return false;
        return true;
    }

    /// A product within the context, with other values for one of its operands.
    [[nodiscard]] std::optional<Cube> changed(const Product& product, const Operand& operand,
                                              const IntegerSet& values) const {
        Cube region = boxes_.context_;
        for (const Operand& each : product.operands)
            if (&each != &operand && !region.restrict(each.allows.atom, each.allows.set))
                return std::nullopt;
        return region.restrict(operand.allows.atom, values) ? std::optional(std::move(region)) : std::nullopt;
    }

    bool isEachOperandNeeded() {
        for (std::size_t i = 0; i < form_.size(); ++i) {
            const std::vector<Cube> others = without(i);
            const Product& product = form_[i];
            const auto matters = [&](const Operand& operand, const IntegerSet& values) {
                const std::optional<Cube> region = changed(product, operand, values);
                return region && isSomewhere(*region, others);
            };
            for (const Operand& operand : product.operands) {
                const IntegerSet& allowed = operand.allows.set;
                if (product.operands.size() > 1 && !matters(operand, allowed.complement()))
                    return false;
                for (const IntegerSet& shorter : operand.shorter)
                    if (!matters(operand, allowed.minus(shorter)))
                        return false;
            }
        }
        return true;
    }

    /// Calls a function with each comparison that the literals at hand allow, until it returns false.
    template <class Refuted>
    bool allComparisons(Refuted refuted) const {
        std::vector<std::pair<Atom, std::int64_t>> literals;
        const auto collect = [&](const Constraint& side) {
            for (const auto& [low, high] : side.set.intervals()) {
                if (low != IntegerSet::minusInfinity)
                    literals.insert(literals.end(), {{side.atom, low}, {side.atom, low - 1}});
                if (high != IntegerSet::plusInfinity)
                    literals.insert(literals.end(), {{side.atom, high}, {side.atom, high + 1}});
            }
        };
        for (const Product& product : form_) {
            for (const Operand& operand : product.operands) {
                collect(operand.allows);
                if (const IntegerSet* const around = boxes_.context_.find(operand.allows.atom))
                    collect({operand.allows.atom, *around});
            }
        }
        std::ranges::sort(literals);
        literals.erase(std::unique(literals.begin(), literals.end()), literals.end());
        return std::ranges::all_of(literals, [&](const auto& literal) {
            const auto& [atom, value] = literal;
            return refuted(Constraint{atom, IntegerSet::point(value)}) &&
                   refuted(Constraint{atom, IntegerSet::allBut(value)}) &&
                   refuted(Constraint{atom, IntegerSet(IntegerSet::minusInfinity, value)}) &&
                   refuted(Constraint{atom, IntegerSet(value, IntegerSet::plusInfinity)});
        });
    }

    [[nodiscard]] static bool isIn(std::span<const Cube> boxes, const BoxPoint& point) {
        return std::ranges::any_of(boxes, [&](const Cube& box) { return contains(box, point); });
    }

    /// Whether a comparison in the place of some boxes, which leaves `others`, makes a difference.
    bool makesDifference(const Constraint& comparison, std::span<const Cube> replaced, std::span<const Cube> others) {
        for (const BoxPoint& point : points_)
            if (isIn(all_, point) != (comparison.set.contains(point[comparison.atom]) || isIn(others, point)))
                return true;
        for (Cube region : replaced)
            if (region.restrict(comparison.atom, comparison.set.complement()) && isSomewhere(region, others))
                return true;
        Cube region = boxes_.context_;
        return region.restrict(comparison.atom, comparison.set) && isSomewhere(region, all_);
    }

    bool isNoGroupOneComparison() {
        const bool isGroup = form_.size() > 1 || form_.front().operands.size() > 1;
        if (isGroup && !allComparisons([&](const Constraint& each) { return makesDifference(each, all_, {}); }))
            return false;
        for (std::size_t i = 0; i < form_.size(); ++i) {
            const std::vector<Cube> others = without(i);
            const Product& product = form_[i];
            const std::span<const Cube> own(&product.box, 1);
            if (form_.size() > 1 && product.operands.size() > 1 &&
                !allComparisons([&](const Constraint& each) { return makesDifference(each, own, others); }))
                return false;
            for (const Operand& operand : product.operands) {
                if (!operand.shorter.empty() && form_.size() + product.operands.size() > 2 &&
                    !allComparisons(
                        [&](const Constraint& each) { return isOtherOperand(product, operand, each, others); }))
                    return false;
            }
        }
        return true;
    }

    /// Whether a comparison in the place of an operand makes a difference.
    bool isOtherOperand(const Product& product, const Operand& operand, const Constraint& comparison,
                        std::span<const Cube> others) {
        std::optional<Cube> lost = changed(product, operand, operand.allows.set);
        if (lost && lost->restrict(comparison.atom, comparison.set.complement()) && isSomewhere(*lost, others))
            return true;
        std::optional<Cube> gained = changed(product, operand, operand.allows.set.complement());
        return gained && gained->restrict(comparison.atom, comparison.set) && isSomewhere(*gained, others);
    }

    ChoiceBoxes& boxes_;
    const Form& form_;
    std::vector<Cube> all_;
    std::vector<BoxPoint> points_; ///< that are not hidden
};

bool ChoiceBoxes::isFaultless(std::size_t choice) {
    return isHidingKnownOf(choice) && FaultSearch(*this, *forms_[choice]).findsNone();
}

} // namespace VT
