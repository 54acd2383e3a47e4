// From nodes to diagrams.
//
// A node is read as a truth value, or as a number: a list of cases, each a linear form that is the node's value where
// the case's guard holds.  So A + (B == 1) is A + 1 where B == 1 and A elsewhere, and (A == 1) == (B == 2) needs no
// rule of its own.  A comparison of two linear forms restricts one quantity: an unknown, the difference of two, or else
// a sum as an unknown of its own.  Arithmetic that is not linear is an unknown of its own for each node.  What real
// literals take part in, but for a comparison with one, is a truth value of its own for each comparison.
//
// Cost: linear in the distinct nodes, plus what the diagrams cost.  Cases multiply; beyond limits::termCases a term
// becomes an unknown of its own.  Chains of && and || are read as a whole, so that their operands are joined in pairs.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/decide/Decision.hpp"
#include "base/decide/LeafReader.hpp"
#include "base/decide/diagram/Diagrams.hpp"

#include <boost/container/small_vector.hpp>

#include <optional>
#include <vector>

namespace VT {

/// A leaf with a value of its own.
struct UnknownLeaf {
    SymbolicExprId node;
    Unknown unknown;
    bool opposite; ///< the code generation keyword: 1 where the unknown is 0
    bool operator==(const UnknownLeaf&) const = default;
};

/// The order of leaves: that of their texts, but for copies of one keyword.
[[nodiscard]] bool comesBefore(const Unknowns& unknowns, const UnknownLeaf& a, const UnknownLeaf& b);

struct ReadCondition {
    Diagram truth = never;
    DecisionBound bound = DecisionBound::None; ///< why it could not be read
    std::vector<UnknownLeaf> leaves;           ///< in the order of their texts
};

class ConditionReader {
public:
    ConditionReader(const LeafReader& leaves, Unknowns& unknowns, Diagrams& diagrams, Steps& steps);

    /// Throws StepsUsedUp.
    ReadCondition read(SymbolicExprId condition);

private:
    /// The form's value where the guard holds.
    struct Case {
        Diagram guard;
        LinearForm form;
    };

    using Cases = boost::container::small_vector<Case, 1>;

    struct Value {
        enum class Kind : std::uint8_t { Truth, Number, Real, RealTerm } kind;
        Diagram truth = never;
        double real = 0;
        Cases cases;
        std::optional<Diagram> nonZero; ///< where a number is known to differ from 0, beside what its cases say
    };

    struct Frame {
        SymbolicExprId id;
        const SymbolicExpr* node;
        std::size_t firstOperand; ///< in operands_
        std::size_t next;
    };

    [[nodiscard]] const Value& valueOf(SymbolicExprId id) const { return values_[*read_.find(id)]; }

    [[nodiscard]] const Value& operand(const Frame& frame, std::size_t at) const {
        return valueOf(operands_[frame.firstOperand + at]);
    }

    bool enter(SymbolicExprId id);
    bool isWhole(SymbolicExprId id);
    void collectChain(SymbolicOp op, SymbolicExprId root);
    void store(SymbolicExprId id, Value value);
    Value leaf(SymbolicExprId id, const LeafMeaning& meaning);
    Value compute(const Frame& frame);
    Value chain(const Frame& frame);
    Value comparison(const Frame& frame);
    Value arithmetic(const Frame& frame);
    Value term(SymbolicExprId node, std::int64_t low, std::int64_t high);
    Value boundedTerm(const Frame& frame);
    Value zeroTested(const Frame& frame, Value value);
    [[nodiscard]] std::optional<std::int64_t> constantOf(const Value& value) const;
    std::optional<LinearForm> combined(SymbolicOp op, const LinearForm& a, const LinearForm& b) const;

    Diagram truthOf(SymbolicExprId id);
    Cases casesOf(const Value& value) const;
    void addCase(Cases& cases, Diagram guard, const LinearForm& form);
    /// Where `form op 0` holds.
    Diagram compare(SymbolicOp op, const LinearForm& form);
    /// The same for the three operators that the others are the opposites of.
    Diagram compareDirectly(SymbolicOp op, const LinearForm& form);
    std::optional<Diagram> compareReal(SymbolicOp op, const LinearForm& form, double real);

    static Value ofTruth(Diagram truth) { return {Value::Kind::Truth, truth, 0, {}, {}}; }

    static Value ofNumber(std::int64_t number);

    const LeafReader& leafReader_;
    const SymbolicExprTable& table_;
    Unknowns& unknowns_;
    Diagrams& diagrams_;
    Steps& steps_;
    IdMap<std::uint32_t> read_; ///< node to position in values_
    IdMap<bool> whole_;         ///< nodes below which no operand is missing
    std::vector<Value> values_;
    std::vector<Frame> frames_;
    std::vector<SymbolicExprId> operands_;
    std::vector<Diagram> folded_;
    std::vector<UnknownLeaf> leaves_;
    bool missing_ = false;
};

} // namespace VT
