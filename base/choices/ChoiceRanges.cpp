// Ranges that conditions confine names to.
//
// Method: an Or of Ands of comparisons of a name with an integer.  Ranges of an And are intersected; those of an Or are
// joined to the smallest range that holds both, for names that both confine.  Other operands are left out, which only
// makes ranges wider.
// Cost: linear in the operands, of which at most limits::rangeOperands are looked at; comparing two conditions is
// linear in their names.
#include "base/choices/ChoiceRanges.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Operators.hpp"
#include "base/integer/IntegerSet.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <boost/unordered_map.hpp>

#include <algorithm>
#include <numeric>
#include <optional>

namespace VT {

bool isIntegerName(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* const node = table.get(id);
    if (node == nullptr || node->op() != SymbolicOp::String || id == table.getIdTRUE() || id == table.getIdFALSE())
        return false;
    return !VariantKeywords::isVariantKeyword(static_cast<const SymbolicString*>(node)->getName(), false);
}

std::optional<std::vector<SymbolicExprId>> operandsOf(const SymbolicExprTable& table, SymbolicExprId chain,
                                                      SymbolicOp op, std::size_t most) {
    std::vector<SymbolicExprId> operands;
    const bool isComplete =
        walkChain(table, chain, most, LinksOf(op), [&](SymbolicExprId id, const SymbolicExpr* node) {
            operands.push_back(id);
            return node != nullptr;
        });
    return isComplete ? std::optional(std::move(operands)) : std::nullopt;
}

namespace {

/// The operands of a chain; nothing where a range cannot be read from them.
std::vector<SymbolicExprId> rangeOperandsOf(const SymbolicExprTable& table, SymbolicExprId chain, SymbolicOp op) {
    return operandsOf(table, chain, op, limits::rangeOperands).value_or(std::vector<SymbolicExprId>());
}

/// The range of a comparison of a name with an integer.
std::optional<NameRange> rangeOf(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr& node = *table.get(id);
    const auto& row = operatorTable()[static_cast<std::size_t>(node.op())];
    if (row.mirrored == SymbolicOp::None)
        return std::nullopt;
    SymbolicOp op = node.op();
    SymbolicExprId name = node.getInput(0);
    SymbolicExprId literal = node.getInput(1);
    if (!table.hasOperand(id, name) || !table.hasOperand(id, literal))
        return std::nullopt;
    if (isIntegerName(table, literal)) {
        std::swap(name, literal);
        op = row.mirrored;
    }
    const SymbolicExpr* const number = table.get(literal);
    if (!isIntegerName(table, name) || number == nullptr || number->op() != SymbolicOp::IntValue)
        return std::nullopt;
    const std::int64_t value = static_cast<const SymbolicIntValue*>(number)->getValue();
    const IntegerSet set = IntegerSet::satisfying(op, value);
    if (set.intervals().size() != 1)
        return std::nullopt;
    return NameRange{name, set.intervals().front().low, set.intervals().front().high};
}

/// The ranges of an And.
NameRanges rangesOfProduct(const SymbolicExprTable& table, SymbolicExprId product) {
    NameRanges ranges;
    for (const SymbolicExprId operand : rangeOperandsOf(table, product, SymbolicOp::And)) {
        const std::optional<NameRange> range = rangeOf(table, operand);
        if (!range)
            continue;
        const auto at = std::ranges::lower_bound(ranges, range->name, {}, &NameRange::name);
        if (at == ranges.end() || at->name != range->name) {
            ranges.insert(at, *range);
            continue;
        }
        at->low = std::max(at->low, range->low);
        at->high = std::min(at->high, range->high);
    }
    return ranges;
}

} // namespace

NameRanges rangesOf(const SymbolicExprTable& table, SymbolicExprId condition) {
    if (!table.has(condition))
        return {};
    std::optional<NameRanges> ranges;
    for (const SymbolicExprId product : rangeOperandsOf(table, condition, SymbolicOp::Or)) {
        NameRanges next = rangesOfProduct(table, product);
        ranges = ranges ? joined(*ranges, next) : std::move(next);
    }
    return std::move(ranges).value_or(NameRanges());
}

NameRanges joined(const NameRanges& a, const NameRanges& b) {
    NameRanges result;
    auto other = b.begin();
    for (const NameRange& range : a) {
        other = std::find_if(other, b.end(), [&](const NameRange& each) { return each.name >= range.name; });
        if (other != b.end() && other->name == range.name)
            result.push_back({range.name, std::min(range.low, other->low), std::max(range.high, other->high)});
    }
    return result;
}

bool areApart(const NameRanges& a, const NameRanges& b) {
    auto other = b.begin();
    for (const NameRange& range : a) {
        other = std::find_if(other, b.end(), [&](const NameRange& each) { return each.name >= range.name; });
        if (other != b.end() && other->name == range.name && (range.high < other->low || other->high < range.low))
            return true;
    }
    return false;
}

std::vector<std::size_t> sortedByRange(const std::vector<NameRanges>& ranges) {
    boost::unordered_map<SymbolicExprId, std::size_t> uses;
    for (const NameRanges& each : ranges)
        for (const NameRange& range : each)
            ++uses[range.name];
    SymbolicExprId key = invalidId;
    std::size_t most = 0;
    for (const auto& [name, count] : uses) {
        if (count > most || (count == most && name < key)) {
            key = name;
            most = count;
        }
    }
    const auto lowOf = [&](std::size_t position) {
        const auto at = std::ranges::lower_bound(ranges[position], key, {}, &NameRange::name);
        return at == ranges[position].end() || at->name != key ? IntegerSet::plusInfinity : at->low;
    };
    std::vector<std::size_t> sorted(ranges.size());
    std::iota(sorted.begin(), sorted.end(), std::size_t{0});
    std::ranges::stable_sort(sorted, {}, lowOf);
    return sorted;
}

} // namespace VT
