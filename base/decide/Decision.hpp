// What a question about conditions is answered with.
#pragma once

#include "base/core/Node.hpp"

#include <cstdint>
#include <optional>
#include <utility>
#include <vector>

namespace VT {

enum class Answer : std::uint8_t { No, Yes, Undecided };

/// Why a question stayed undecided.
enum class DecisionBound : std::uint8_t {
    None,        ///< it was decided
    Steps,       ///< the steps were used up: limits::decisionSteps unless set
    Terms,       ///< an answer hangs on arithmetic that is not understood, and no assignment tried confirms it
    NoCondition, ///< an identifier, or an operand, that no node stands for
};

/// The value of one unknown.
struct UnknownValue {
    SymbolicExprId unknown; ///< a symbol, a call, a member without a bound value, or a variant keyword
    std::int64_t value;
    bool operator==(const UnknownValue&) const = default;
};

/// An assignment of integers to the unknowns of the conditions asked about, in the order of their texts.
///
/// Every witness was confirmed.  It is the smallest: the first unknown is as near to 0 as it can be, then the second,
/// and so on; of two values equally near the positive one is the smaller.  Two exceptions: where the steps ran out
/// after a witness was found it may not be the smallest, and where the conditions hold sums of several unknowns,
/// quotients, bits or arithmetic that is not understood (products of unknowns) it is the first that was confirmed.
/// Either way it does not depend on what was interned or asked before.
using Witness = std::vector<UnknownValue>;

struct Decision {
    Answer answer = Answer::Undecided;
    DecisionBound bound = DecisionBound::None;
    /// The assignment that proves the answer, where one assignment can: that a condition can hold, that an implication
    /// fails.  Left out where the assignment found has a number beyond 64 bits, as for A > 1.0e300.
    std::optional<Witness> witness;

    [[nodiscard]] bool isYes() const noexcept { return answer == Answer::Yes; }

    [[nodiscard]] bool isNo() const noexcept { return answer == Answer::No; }

    [[nodiscard]] bool isUndecided() const noexcept { return answer == Answer::Undecided; }

    /// The answer to the opposite question; the witness stays.
    [[nodiscard]] Decision opposite() && {
        if (answer != Answer::Undecided)
            answer = isYes() ? Answer::No : Answer::Yes;
        return std::move(*this);
    }
};

/// How two conditions stand to each other.  What never holds is disjoint from everything and implies everything; the
/// first kind of this list that is true is reported.
enum class RelationKind : std::uint8_t { Equivalent, Disjoint, Implies, ImpliedBy, Overlaps, Undecided };

struct Relation {
    RelationKind kind = RelationKind::Undecided;
    DecisionBound bound = DecisionBound::None;
    Decision onlyA; ///< whether the first can hold without the second
    Decision onlyB; ///< whether the second can hold without the first
    Decision both;  ///< whether they can hold together

    /// The relation that the three answers make.
    [[nodiscard]] VTSYM_API static Relation of(Decision onlyA, Decision onlyB, Decision both);
};

/// The answer about a set, with two of its members where they prove it.
struct SetDecision : Decision {
    std::optional<std::pair<std::size_t, std::size_t>> members; ///< positions
};

} // namespace VT
