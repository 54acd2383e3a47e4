// Writes formulas as nodes, from the inside out.
//
// Every chain is written plainly and, where it has several negations, as the negation of the opposite chain; the
// shorter of both serves the chain around it.
// Cost: linear in the formulas below and their opposites.
#include "base/decide/shorten/FormulaWriter.hpp"

#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

constexpr std::uint64_t bracketBytes = 2;

/// Negated operands from which on one Not of them all is shorter.
constexpr std::size_t negationsTogether = 4;

} // namespace

/// The formulas below one and, on request, those below its opposite; operands before what they are of.
std::vector<Formula> FormulaWriter::byHeight(Formula formula, bool withOpposites) {
    std::vector<Formula> all = formulas_.below(formula);
    if (withOpposites) {
        const std::vector<Formula> opposites = formulas_.below(formulas_.negated(formula));
        all.insert(all.end(), opposites.begin(), opposites.end());
        std::ranges::sort(all);
        all.erase(std::unique(all.begin(), all.end()), all.end());
        std::ranges::stable_sort(all, {}, [&](Formula each) { return formulas_.height(each); });
    }
    return all;
}

/// The form of an operand that makes a chain shortest.
SymbolicExprId FormulaWriter::shorter(const Written& written, bool inBrackets) const {
    if (written.negation == invalidId || written.plain == invalidId)
        return written.plain;
    const std::uint64_t plain = printer_.textLength(written.plain) + (inBrackets ? bracketBytes : 0);
    return printer_.textLength(written.negation) < plain ? written.negation : written.plain;
}

/// Appends an operand of a chain; false where it cannot be written.
bool FormulaWriter::append(Kind kind, Formula operand, std::vector<SymbolicExprId>& out) {
    if (formulas_.kind(operand) != Kind::Leaf) {
        out.push_back(shorter(written_[operand], kind == Kind::And));
        return out.back() != invalidId;
    }
    const WrittenSet set = terms_.write(formulas_.constraint(operand));
    const Kind own = set.op == SymbolicOp::Or ? Kind::Or : Kind::And;
    const std::vector<SymbolicExprId> comparisons(set.operands.begin(), set.operands.end());
    if (comparisons.size() < 2 || own == kind)
        out.insert(out.end(), comparisons.begin(), comparisons.end());
    else
        out.push_back(makeChain(table_, opOf(own), comparisons));
    return !comparisons.empty();
}

/// Replaces many Nots by one.
void FormulaWriter::drawTogether(Kind kind, std::vector<SymbolicExprId>& operands) {
    const auto isNot = [&](SymbolicExprId id) { return isNegation(id); };
    if (static_cast<std::size_t>(std::ranges::count_if(operands, isNot)) < negationsTogether)
        return;
    std::vector<SymbolicExprId> inner;
    for (const SymbolicExprId operand : operands)
        if (isNot(operand))
            inner.push_back(table_.get(operand)->getInput(0));
    const auto first = std::ranges::find_if(operands, isNot);
    *first = SymbolicNotExpr(table_, makeChain(table_, opOf(Formulas::opposite(kind)), inner)).getId(table_);
    operands.erase(std::remove_if(first + 1, operands.end(), isNot), operands.end());
}

SymbolicExprId FormulaWriter::writeOne(Formula formula, bool together) {
    const Kind kind = formulas_.kind(formula);
    if (kind == Kind::Constant)
        return formula == Formulas::yes ? table_.getIdTRUE() : table_.getIdFALSE();
    std::vector<SymbolicExprId> operands;
    if (kind == Kind::Leaf) {
        const WrittenSet set = terms_.write(formulas_.constraint(formula));
        operands.assign(set.operands.begin(), set.operands.end());
        return operands.empty() ? invalidId
                                : makeChain(table_, opOf(set.op == SymbolicOp::Or ? Kind::Or : Kind::And), operands);
    }
    const Formulas::Operands parts = formulas_.operands(formula);
    for (const Formula part : parts)
        if (!append(kind, part, operands))
            return invalidId;
    if (together)
        drawTogether(kind, operands);
    return makeChain(table_, opOf(kind), operands);
}

std::uint32_t FormulaWriter::countNegations(Formula formula) const {
    if (formulas_.kind(formula) == Kind::Leaf)
        return isNegation(written_[formula].plain) ? 1 : 0;
    std::uint32_t sum = 0;
    if (formulas_.kind(formula) != Kind::Constant)
        for (const Formula operand : formulas_.operands(formula))
            sum += written_[operand].negatedLeaves;
    return sum;
}

SymbolicExprId FormulaWriter::writePlainly(Formula formula) {
    written_.assign(formulas_.size(), {});
    for (const Formula each : byHeight(formula, false)) {
        written_[each].plain = writeOne(each, false);
        if (written_[each].plain == invalidId)
            return invalidId;
        written_[each].negatedLeaves = countNegations(each);
    }
    return written_[formula].plain;
}

/// Offers the Not of the opposite chain.
void FormulaWriter::offerNegation(Formula chain) {
    const Written& opposite = written_[formulas_.negated(chain)];
    if (opposite.plain != invalidId && 2 * (opposite.negatedLeaves + 1) <= written_[chain].negatedLeaves)
        written_[chain].negation = SymbolicNotExpr(table_, opposite.plain).getId(table_);
}

SymbolicExprId FormulaWriter::write(Formula formula) {
    const SymbolicExprId plain = writePlainly(formula);
    if (plain == invalidId || written_[formula].negatedLeaves < 2)
        return plain;
    const std::vector<Formula> all = byHeight(formula, true);
    written_.assign(formulas_.size(), {});
    for (auto begin = all.begin(); begin != all.end();) {
        const auto end = std::find_if(begin, all.end(),
                                      [&](Formula each) { return formulas_.height(each) != formulas_.height(*begin); });
        for (auto at = begin; at != end; ++at) {
            written_[*at].plain = writeOne(*at, true);
            if (written_[*at].plain == invalidId)
                return plain;
            written_[*at].negatedLeaves = countNegations(*at);
        }
        for (auto at = begin; at != end; ++at)
            if (formulas_.height(*at) > 0)
                offerNegation(*at);
        begin = end;
    }
    const SymbolicExprId together = shorter(written_[formula], false);
    return printer_.textLength(plain) <= printer_.textLength(together) ? plain : together;
}

} // namespace VT
