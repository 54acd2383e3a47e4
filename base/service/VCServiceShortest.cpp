// Shortens conditions, everywhere or under a known condition: sets up proofs and search (base/decide/shorten), and
// falls back to the given form where the result would be longer.
#include "base/core/Make.hpp"
#include "base/decide/shorten/ConditionProofs.hpp"
#include "base/decide/shorten/ShortestForm.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"
#include "base/simplify/ConditionRoot.hpp"

namespace VT {

namespace {

/// Returns the shortened form as a condition of its own, or the given one where that would be longer.
SymbolicExprId noLonger(SymbolicExprTable& table, const SymbolicExprPrinter& printer, SymbolicExprId shortened,
                        SymbolicExprId given) {
    if (shortened == given || !booleanOps.contains(table.get(given)->op()))
        return shortened;
    const SymbolicExprId condition = asConditionOfItsOwn(table, shortened);
    return condition == shortened || printer.textLength(condition) <= printer.textLength(given) ? condition : given;
}

} // namespace

VCSymbolicExprId VCService::shortestCondition(const VCSymbolicExprId& condition, bool isQuill,
                                              std::vector<ShortForm>* forms) {
    if (forms != nullptr)
        forms->clear();
    if (!has(condition))
        return invalidId;
    const SymbolicExprId given = isQuill ? condition.id() : parts_->toC(condition.id());
    const SymbolicExprPrinter& printer = isQuill ? parts_->quillPrinter : parts_->cPrinter;
    SymbolicExprTable& table = parts_->table;
    const auto normalForm = [&] { return simplify(given, isQuill).id(); };
    // A number is not a condition: its value matters, not whether it is 0.
    if (!booleanOps.contains(table.get(given)->op())) {
        const SymbolicExprId simple = normalForm();
        return printer.textLength(simple) <= printer.textLength(given) ? simple : given;
    }
    const SymbolicExprId assumed = parts_->assumptions.knownOf(std::span(&given, 1));
    const bool isAnythingAssumed = assumed != table.getIdTRUE();
    ConditionProofs proofs(parts_->decider(), parts_->toC, given, assumed, isAnythingAssumed);
    ShortestForm search(table, printer, parts_->keywordsInForce(), proofs);
    // Bounds of the unknowns are known facts.
    const SymbolicExprId result =
        search.find(given, parts_->bits32 || isAnythingAssumed ? assumed : invalidId, normalForm);
    if (forms != nullptr)
        *forms = search.forms();
    return noLonger(table, printer, result, given);
}

VCSymbolicExprId VCService::getImpliedCondition(const VCSymbolicExprId& condition, const VCSymbolicExprId& known,
                                                bool isQuill) {
    if (!has(condition) || !has(known))
        return invalidId;
    SymbolicExprTable& table = parts_->table;
    const SymbolicExprId given = isQuill ? condition.id() : parts_->toC(condition.id());
    const SymbolicExprId fact = isQuill ? known.id() : parts_->toC(known.id());
    const SymbolicExprId assumed = parts_->assumptions.knownOf(std::initializer_list<SymbolicExprId>{given, fact});
    const SymbolicExprId context =
        assumed == table.getIdTRUE() ? fact : makeBinary(table, SymbolicOp::And, assumed, fact);
    ConditionProofs proofs(parts_->decider(), parts_->toC, given, context, true);
    if (const auto decided = proofs.decided(given))
        return *decided ? table.getIdTRUE() : table.getIdFALSE();
    const SymbolicExprPrinter& printer = isQuill ? parts_->quillPrinter : parts_->cPrinter;
    const auto normalForm = [&] { return simplify(given, isQuill).id(); };
    ShortestForm search(table, printer, parts_->keywordsInForce(), proofs);
    return noLonger(table, printer, search.find(given, context, normalForm), given);
}

} // namespace VT
