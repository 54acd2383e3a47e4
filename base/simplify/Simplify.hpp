// The simplifier's driver: passes over a condition until nothing changes.
#pragma once

#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/SimplifyVisitor.hpp"

#include <boost/container/flat_set.hpp>

#include <cstdint>

namespace VT {

/// Simplifies expressions of one table.  Conditions are over integers: every symbol stands for an integer, a truth
/// value is an integer that is not zero.  A condition becomes a sum of products of comparisons, as far as the operand
/// limit allows; the result has the same truth for every assignment of integers.  What is no comparison and no logical
/// operator is a dimension, and keeps its value: dimensions divide exactly, quotients below a comparison or a logical
/// operator are truncated toward zero.
///
/// Keeps the texts of operands that it has ordered, so that further calls need not print them again.  Used by one
/// thread at a time.
class VTSYM_API SymbolicExprSimplify {
public:
    explicit SymbolicExprSimplify(SymbolicExprTable& table, std::uint64_t maxIterations = limits::simplifyPasses);

    /// The simplified expression; `passes` receives the number of passes that ran.  An identifier that is not of the
    /// table gives the invalid one.  Interns the truth constants where the table has none.
    SymbolicExprId simplify(SymbolicExprId id, std::uint64_t& passes) const;
    /// The same with the caller's visitor, which is used for every pass.
    SymbolicExprId simplify(SymbolicExprId id, std::uint64_t& passes, SymbolicExprSimplifyVisitor& visitor) const;

    /// Adds the distinct operands of the And chain (Or chain) rooted at a node; the node alone where the chain is
    /// longer than the operand limit.
    void computeUniqueAndOperandsId(const SymbolicExpr& node, boost::container::flat_set<SymbolicExprId>& out) const;
    void computeUniqueOrOperandsId(const SymbolicExpr& node, boost::container::flat_set<SymbolicExprId>& out) const;

    [[nodiscard]] bool isVariantKeywordsSimCodegenFeatureOn() const;

    /// Whether the rules of the variant keywords may be used; and-ed with the feature flag when a pass is prepared.
    void setKeywordsFlag(bool on) noexcept { keywordsFlag_ = on; }

    [[nodiscard]] bool keywordsFlag() const noexcept { return keywordsFlag_; }

    /// Receives the rules that fire in further calls; nullptr for none.
    void setListener(RuleListener* listener) noexcept { listener_ = listener; }

    [[nodiscard]] SymbolicExprTable& table() const noexcept { return table_; }

    [[nodiscard]] const SymbolicExprPrinter& printer() const noexcept { return printer_; }

private:
    /// Whether a further call, which no listener hears of, leaves a result as it is.
    [[nodiscard]] bool keepsItsId(SymbolicExprId result) const;

    SymbolicExprTable& table_;
    std::uint64_t maxIterations_;
    bool keywordsFlag_;
    SymbolicExprPrinter printer_;
    RuleListener* listener_ = nullptr;
};

} // namespace VT
