// Copies expressions from one table into another, together with the values bound to their symbols.
#pragma once

#include "base/transform/XForm.hpp"
#include "base/util/IdMap.hpp"

#include <vector>

namespace VT {

/// Rebuilds every node as it is and brings the value of each symbol along: the value is copied too, with the values of
/// the symbols that it mentions, and bound to the symbol's copy, where it replaces an earlier value.  A
/// symbol without a value in the source keeps the one that it has in the target.  Only symbols bring values; those
/// bound to other expressions are not copied.
///
/// For one run; both tables outlive it.
class VTSYM_API SymbolicExprCopyVisitor : public SymbolicExprXFormVisitor {
public:
    /// A visitor for expressions of `source` that builds in `target`.
    SymbolicExprCopyVisitor(const SymbolicExprTable& source, SymbolicExprTable& target);

    using SymbolicExprXFormVisitor::visit;
    void visit(const SymbolicString& node) override;

    /// The copy of an expression of the source, or the invalid identifier for one that is not there.  A node that this
    /// visitor copied before is not visited again.
    SymbolicExprId copy(SymbolicExprId id);

private:
    /// A symbol's copy that waits for its value.
    struct Binding {
        SymbolicExprId name;        ///< in the target
        SymbolicExprId sourceValue; ///< in the source
    };

    void bindValues();

    const SymbolicExprTable& source_;
    IdMap<SymbolicExprId> copies_; ///< by the source's identifiers
    std::vector<Binding> bindings_;
};

/// Copies expressions of one table into another.
class VTSYM_API SymbolicExprCopy {
public:
    /// Both tables outlive the driver.
    SymbolicExprCopy(const SymbolicExprTable& source, SymbolicExprTable& target) : source_(source), target_(target) {}

    /// The copy's identifier in the target: the expression itself where both tables are one.  An identifier that is not
    /// of the source yields the invalid one.  Chains of bound values may be of any length and lead in circles.  Linear
    /// in the number of distinct nodes of the expression and of the values that come with it.
    SymbolicExprId operator()(SymbolicExprId id) const;

private:
    const SymbolicExprTable& source_;
    SymbolicExprTable& target_;
};

} // namespace VT
