// What the parts of the library make of one condition, judged by one oracle.
#pragma once

#include "base/VCService.hpp"
#include "tests/support/generators/AnyCondition.hpp"
#include "tests/support/oracles/ExactValue.hpp"

#include <stdexcept>
#include <string>
#include <vector>

namespace VT::Testing {

/// Two parts of the library disagree, or one with the oracle; says about which condition and where.
struct Disagreement : std::logic_error {
    using std::logic_error::logic_error;
};

/// One condition and assignments, of which those count under which everything has an exact value.  Each demand throws
/// a Disagreement where it is not met.  The service outlives the object.
class Agreement {
public:
    Agreement(VCService& library, SymbolicExprId condition, const ConditionWorld& world,
              std::vector<Assignment> assignments);

    /// The simplified condition is the same, to the oracle and to the decider, and is not simplified further.
    void demandSimplified() const;
    /// The shortest form is the same, and not longer.
    void demandShortest() const;
    /// The condition under a known one is the same where that holds.
    void demandGiven(SymbolicExprId known) const;
    /// The evaluator computes the exact value.
    void demandEvaluated() const;
    /// What the decider proves of the condition, alone and beside the known one, no assignment refutes; its witnesses
    /// do what they are for.
    void demandDecided(SymbolicExprId known) const;
    /// What is printed in a language and has no obstacle there is read back with the same meaning.
    void demandReadBack(bool inQuill) const;
    /// All of the above.
    void demandAll(SymbolicExprId known) const;

    /// Another condition, which `what` names, is as large.
    void demandSame(const char* what, SymbolicExprId other) const {
        demandSame(what, other, Kept::Value, table_.getIdTRUE());
    }

private:
    enum class Kept : bool { Truth, Value };

    template <class Words>
    void demand(bool met, Words words) const;
    void demandSame(const char* what, SymbolicExprId other, Kept kept, SymbolicExprId known) const;
    void demandEquivalent(SymbolicExprId other) const;
    void demandWitness(const Decision& decision, const ExactValue& of, bool wanted) const;

    [[nodiscard]] std::string text(SymbolicExprId of) const { return service_.printCExprNoConversion(of); }

    [[nodiscard]] std::optional<Assignment> assignmentOf(const Decision& decision) const;

    VCService& service_;
    SymbolicExprTable& table_;
    SymbolicExprId id_;
    const ConditionWorld& world_;
    ExactValue exact_;
    std::vector<Assignment> assignments_;
};

} // namespace VT::Testing
