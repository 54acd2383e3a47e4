// Decides by another solver what the library's own procedures leave open.
#pragma once

#include "base/decide/Decision.hpp"
#include "base/decide/external/SmtWriter.hpp"
#include "base/decide/external/SolverPlugin.hpp"

#include <functional>
#include <string>

namespace VT {

/// What a solver has to be asked with.
struct SolverQuestion {
    const LeafReader& leaves;
    std::span<const SymbolicExprId> conditions;
    AskedOf asked;
    bool bits32;
    /// The text of an unknown, which orders the witness.
    std::function<std::string(SymbolicExprId)> nameOf;
    /// Whether evaluation accepts an assignment; the calls are those that have to agree as functions.
    std::function<bool(const Witness&, std::span<const SymbolicExprId> calls)> confirms;
};

/// Whether there is an assignment as asked; undecided without a usable plugin.
///
/// "No" is a proof.  The witness of "yes" is one that `confirms` accepted, made small: one unknown after the other, in
/// the order of their texts, gets the value nearest to 0 that the solver finds.  Takes at most limits::solverResources
/// of the solver for each of two translations, and limits::solverChecks checks.
Decision decideExternally(SolverPlugin& plugin, const SolverQuestion& question);

} // namespace VT
