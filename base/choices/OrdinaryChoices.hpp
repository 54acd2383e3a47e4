// Recognises choices that have no fault by themselves, without a decision about the whole choice.
#pragma once

#include "base/core/Table.hpp"
#include "base/decide/Decision.hpp"
#include "base/util/IdMap.hpp"

#include <functional>

namespace VT {

/// Recognises an And of parts about one name each, comparisons with integers joined by && || !, where the context
/// neither excludes nor implies a part by itself, and a part has no redundant operand there: such a choice can be
/// active, is not always active, and needs each of its operands.
///
/// The names must not be in an operand of the context together with others.  Answers about a part are kept, so a set of
/// n such choices costs n look-ups for each operand and a few decisions for each different part.
class OrdinaryChoices {
public:
    /// Whether a context neither excludes nor implies a condition, nor makes an operand of it redundant.
    using Judge = std::function<bool(SymbolicExprId context, SymbolicExprId condition)>;

    /// `context` can hold and has C shape.
    OrdinaryChoices(SymbolicExprTable& table, SymbolicExprId context, Judge judge);

    /// Whether a condition in C shape was recognised; any other one is to be decided.
    bool contains(SymbolicExprId condition);

private:
    SymbolicExprId nameIn(SymbolicExprId operand);

    SymbolicExprTable& table_;
    Judge judge_;
    IdMap<SymbolicExprId> contexts_; ///< by name: what the context says of it; invalid where it says more
    IdMap<SymbolicExprId> names_;    ///< by operand: its name; invalid where it is about more than one name
    IdMap<bool> isOrdinary_;         ///< by part
    bool isUsable_ = true;
};

} // namespace VT
