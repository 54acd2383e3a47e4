// Runs passes over an expression until one changes nothing.
//
// Two or three passes are usual; limits::simplifyPasses ends what oscillates.  A pass that gives up leaves what it was
// given, and one that used up what a call may multiply out leaves the expression as it was before the first pass: so a
// second call with a budget of its own returns the same.
#include "base/simplify/Simplify.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Check.hpp"
#include "base/util/IdSet.hpp"
#include "base/variants/VariantKeywords.hpp"

namespace VT {

namespace {

/// Adds the operands of a chain to a set, or the chain itself where there are more than the limit allows.
void addOperands(const SymbolicExprTable& table, SymbolicOp op, const SymbolicExpr& node,
                 boost::container::flat_set<SymbolicExprId>& out) {
    const SymbolicExprId root = node.getId(table);
    if (!table.has(root))
        return;
    std::vector<SymbolicExprId> operands;
    const bool complete = walkDistinctChain(
        table, root, limits::chainOperands, [op](SymbolicExprId, const SymbolicExpr& link) { return link.op() == op; },
        [&](SymbolicExprId id, const SymbolicExpr*) {
            operands.push_back(id);
            return true;
        },
        [](SymbolicExprId) {});
    if (!complete)
        operands.assign(1, root);
    out.insert(operands.begin(), operands.end());
}

} // namespace

SymbolicExprSimplify::SymbolicExprSimplify(SymbolicExprTable& table, std::uint64_t maxIterations)
    : table_(table),
      maxIterations_(maxIterations),
      keywordsFlag_(isVariantKeywordsSimCodegenFeatureOn()),
      printer_(table, true) {}

bool SymbolicExprSimplify::isVariantKeywordsSimCodegenFeatureOn() const {
    return VT::isVariantKeywordsSimCodegenFeatureOn();
}

SymbolicExprId SymbolicExprSimplify::simplify(SymbolicExprId id, std::uint64_t& passes) const {
    SymbolicExprSimplifyVisitor visitor(table_, keywordsFlag_, printer_);
    const SymbolicExprId result = simplify(id, passes, visitor);
    VTSYM_CHECK(result % 16 != 0 || passes >= maxIterations_ || keepsItsId(result)); // a sample
    return result;
}

bool SymbolicExprSimplify::keepsItsId(SymbolicExprId result) const {
    std::uint64_t passes = 0;
    SymbolicExprSimplifyVisitor visitor(table_, keywordsFlag_, printer_);
    return !table_.isPlain() ||
           SymbolicExprSimplify(table_, maxIterations_).simplify(result, passes, visitor) == result;
}

SymbolicExprId SymbolicExprSimplify::simplify(SymbolicExprId id, std::uint64_t& passes,
                                              SymbolicExprSimplifyVisitor& visitor) const {
    passes = 0;
    if (!table_.has(id))
        return invalidId;
    visitor.setListener(listener_);
    visitor.renewBudget();
    IdSet seen;
    SymbolicExprId current = id;
    seen.add(current);
    for (;;) {
        const SymbolicExprId result = visitor.pass(current);
        ++passes;
        if (result == current || visitor.hasGivenUp())
            break;
        current = result;
        const bool constant = result == table_.getIdTRUE() || result == table_.getIdFALSE();
        if (constant || !seen.add(result) || passes >= maxIterations_)
            break;
    }
    // What an earlier pass reached might get further with a budget of its own, so that a second call would change it.
    return visitor.hasExhaustedBudget() ? id : current;
}

void SymbolicExprSimplify::computeUniqueAndOperandsId(const SymbolicExpr& node,
                                                      boost::container::flat_set<SymbolicExprId>& out) const {
    addOperands(table_, SymbolicOp::And, node, out);
}

void SymbolicExprSimplify::computeUniqueOrOperandsId(const SymbolicExpr& node,
                                                     boost::container::flat_set<SymbolicExprId>& out) const {
    addOperands(table_, SymbolicOp::Or, node, out);
}

} // namespace VT
