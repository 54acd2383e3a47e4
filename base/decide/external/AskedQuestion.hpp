// What a question asks of its conditions.
#pragma once

#include "base/core/Table.hpp"

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace VT {

/// What an assignment has to make of the truth values of some conditions.
enum class AskedOf : std::uint8_t {
    Holds,       ///< the first holds
    Fails,       ///< the first fails
    Both,        ///< the first and the second hold
    FirstAlone,  ///< the first holds, the second fails
    Differ,      ///< one of the first two holds
    DifferGiven, ///< the same, and the third holds
    NoneHolds,
    TwoHold, ///< at least two of all
};

/// Whether truth values are as asked.
[[nodiscard]] bool isAsAsked(AskedOf asked, const std::vector<bool>& truths);

/// The same as a term of SMT-LIB over terms of the truth values.
[[nodiscard]] std::string askedText(AskedOf asked, std::span<const std::string> truths);

/// A condition that holds, or fails, for every assignment that answers a question.
struct AskedFact {
    SymbolicExprId condition;
    bool holds;
};

/// The facts that a question states: its conditions, and what && and || make of them.  Linear in the operands.
[[nodiscard]] std::vector<AskedFact> factsOf(const SymbolicExprTable& table, AskedOf asked,
                                             std::span<const SymbolicExprId> conditions);

} // namespace VT
