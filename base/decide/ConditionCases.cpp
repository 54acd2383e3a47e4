// The cases of a term: its value as a form, wherever a guard holds.
//
// Cases of one form are one case.  A form of one name is a constant where its guard leaves the name values of which all
// make it the same: so the cases of nested quotients, x < 0 ? ... : ..., stay few.
// Cost: one look at each case, and at the operands of the guard.
#include "base/decide/ConditionReader.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

/// floor((factor * unknown + constant) / divisor), where factor and divisor are positive.
struct FloorOfOne {
    Unknown unknown;
    BigInteger factor = 1;
    BigInteger constant = 0;
    BigInteger divisor = 1;

    [[nodiscard]] BigInteger at(const BigInteger& value) const {
        return floorDivide(BigInteger(factor * value + constant), divisor);
    }
};

/// What an unknown is of one that is not computed; nothing where it is not such a floor.
std::optional<FloorOfOne> floorOfOne(const Unknowns& unknowns, Unknown unknown) {
    const UnknownInfo& info = unknowns[unknown];
    if (!info.isComputed())
        return FloorOfOne{unknown};
    if (info.kind != UnknownKind::Floor || info.floor->form.parts.size() != 1)
        return std::nullopt;
    const auto& [inner, factor] = info.floor->form.parts.front();
    if (factor < 0 || unknowns[inner].isComputed())
        return std::nullopt;
    return FloorOfOne{inner, factor, info.floor->form.constant, info.floor->divisor};
}

/// What is known of a name: none below or above it where there is no number.
struct BoundsOfName {
    std::optional<BigInteger> low;
    std::optional<BigInteger> high;

    void narrow(std::optional<BigInteger> least, std::optional<BigInteger> greatest) {
        if (least && (!low || *low < *least))
            low = std::move(least);
        if (greatest && (!high || *high > *greatest))
            high = std::move(greatest);
    }
};

} // namespace

/// The form, or the one value that it has where the guard holds.
RationalForm ConditionReader::pinned(Gate guard, const RationalForm& form) {
    if (guard == always || form.isConstant() || !form.isInteger())
        return form;
    const WideForm wide = form.widened();
    const auto floor = wide.parts.size() == 1 ? floorOfOne(unknowns_, wide.parts.front().unknown) : std::nullopt;
    if (!floor)
        return form;
    charge(wide);
    const UnknownInfo& info = unknowns_[floor->unknown];
    const auto finite = [](std::int64_t value, std::int64_t infinite) {
        return value == infinite ? std::nullopt : std::optional<BigInteger>(value);
    };
    BoundsOfName bounds{finite(info.low, minusInfinite), finite(info.high, plusInfinite)};
    const auto narrow = [&](Gate comparison) {
        const QuantityInfo& compared = unknowns_.quantity(circuit_.quantity(comparison));
        const auto by = compared.isDifference() ? std::nullopt : floorOfOne(unknowns_, compared.plus);
        if (!by || by->unknown != floor->unknown)
            return;
        const auto [low, high] = circuit_.range(comparison);
        auto least = finite(low, minusInfinite);
        auto greatest = finite(high, plusInfinite);
        if (least) // rounded up
            least = -floorDivide(BigInteger(by->constant - *least * by->divisor), by->factor);
        if (greatest)
            greatest = floorDivide(BigInteger(*greatest * by->divisor + by->divisor - 1 - by->constant), by->factor);
        bounds.narrow(std::move(least), std::move(greatest));
    };
    if (circuit_.isComparison(guard)) {
        narrow(guard);
    } else if ((guard & 1U) == 0) {
        steps_.take(circuit_.operands(guard).size() / partsPerStep + 1);
        for (const Gate operand : circuit_.operands(guard))
            if (circuit_.isComparison(operand))
                narrow(operand);
    }
    if (!bounds.low || !bounds.high || floor->at(*bounds.low) != floor->at(*bounds.high))
        return form;
    return RationalForm(BigInteger(wide.parts.front().factor * floor->at(*bounds.low) + wide.constant));
}

/// The cases of a number, of a truth value or of a finite real literal.
ConditionReader::Cases ConditionReader::casesOf(const Value& value) const {
    if (value.kind == Value::Kind::Number)
        return value.cases;
    Cases cases;
    if (value.kind == Value::Kind::Real) {
        cases.push_back({always, RationalForm::of(value.real)});
        return cases;
    }
    if (value.truth != never)
        cases.push_back({value.truth, LinearForm{{}, 1}});
    if (value.truth != always)
        cases.push_back({opposite(value.truth), LinearForm{}});
    return cases;
}

void ConditionReader::addCase(Cases& cases, Gate guard, const RationalForm& given) {
    if (guard == never)
        return;
    const RationalForm form = pinned(guard, given);
    const auto known = std::ranges::find(cases, form, &Case::form);
    if (known != cases.end()) {
        known->guard = circuit_.either(known->guard, guard);
        return;
    }
    cases.push_back({guard, form});
}

} // namespace VT
