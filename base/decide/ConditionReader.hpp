// From nodes to circuits.
//
// A node is read as a truth value, or as a number: a list of cases, each a linear form that is the node's value where
// the case's guard holds.  So A + (B == 1) is A + 1 where B == 1 and A elsewhere, and (A == 1) == (B == 2) needs no
// rule of its own.  A quotient by a constant is a floor where it is not negative and the opposite of one elsewhere; the
// bits of a mask and shifts to the right are floors of divisions by powers of two.  Real literals are exact fractions.
// A comparison of two linear forms restricts one quantity: an unknown, the difference of two, or else a sum as an
// unknown of its own.  Arithmetic that is not linear is an unknown of its own for each node, and where a real number
// takes part in it, a truth value of its own for each comparison.
//
// Cost: linear in the distinct nodes, plus what the circuits cost.  Cases multiply; beyond limits::termCases a term
// becomes an unknown of its own.  Chains of && and || are read as a whole, so that their operands are joined in pairs,
// and so are long sums, whose parts are sorted once.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/decide/Decision.hpp"
#include "base/decide/LeafReader.hpp"
#include "base/decide/circuit/Circuit.hpp"

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
    Gate truth = never;
    DecisionBound bound = DecisionBound::None; ///< why it could not be read
    std::vector<UnknownLeaf> leaves;           ///< in the order of their texts
    std::vector<Unknown> met;                  ///< in the order in which they are met when the condition is read aloud
    std::vector<SymbolicExprId> calls;         ///< leaves that are functions of their arguments
};

class ConditionReader {
public:
    ConditionReader(const LeafReader& leaves, Unknowns& unknowns, Circuit& circuit, Steps& steps);

    /// Throws StepsUsedUp.
    ReadCondition read(SymbolicExprId condition);
    /// That two calls of one function, which are leaves of conditions, have equal values where their arguments are
    /// equal.
    ReadCondition readCongruence(SymbolicExprId a, SymbolicExprId b);

private:
    /// Adding up a part of a sum is that much cheaper than joining an edge of diagrams.
    static constexpr std::size_t partsPerStep = 4;

    /// The form's value where the guard holds.
    struct Case {
        Gate guard;
        RationalForm form;
    };

    using Cases = boost::container::small_vector<Case, 1>;

    struct Value {
        enum class Kind : std::uint8_t { Truth, Number, Real, RealTerm } kind; ///< Real is a literal
        Gate truth = never;
        double real = 0;
        Cases cases = {};
        std::optional<Gate> nonZero = {}; ///< where a number is known to differ from 0, beside what its cases say
        bool isReal = false;              ///< whether a number is real: its quotients are exact
        bool isLiteral = false;           ///< whether a number is made of integer literals alone
    };

    struct Frame {
        SymbolicExprId id;
        const SymbolicExpr* node;
        std::size_t firstOperand; ///< in operands_
        std::size_t next;
        bool isSum = false; ///< a long one, whose operands are those of the whole chain
    };

    /// Takes steps for work on a form.
    void charge(const WideForm& form) { steps_.take(1 + costOf(form) / partsPerStep); }

    [[nodiscard]] const Value& valueOf(SymbolicExprId id) const { return values_[*read_.find(id)]; }

    [[nodiscard]] const Value& operand(const Frame& frame, std::size_t at) const {
        return valueOf(operands_[frame.firstOperand + at]);
    }

    void begin();
    void walk(SymbolicExprId root);
    void finish(ReadCondition& result);
    bool enter(SymbolicExprId id);
    bool isWhole(SymbolicExprId id);
    void collectChain(SymbolicOp op, SymbolicExprId root);
    bool collectSum(SymbolicExprId root);
    void store(SymbolicExprId id, Value value);
    Value leaf(SymbolicExprId id, const LeafMeaning& meaning);
    Value compute(const Frame& frame);
    Value chain(const Frame& frame);
    Value comparison(const Frame& frame);
    std::optional<Gate> equalProducts(SymbolicExprId a, SymbolicExprId b);
    bool isLinear(const Value& value);
    std::optional<Gate> compared(SymbolicOp op, const Value& a, const Value& b);
    Value arithmetic(const Frame& frame);
    Value sum(const Frame& frame);
    std::optional<Value> addedUp(const Frame& frame, std::span<const SymbolicOp> ops) const;
    std::optional<Value> joined(SymbolicOp op, const Value& a, const Value* b);
    bool isOpposed(std::span<const WidePart> parts);
    Value term(SymbolicExprId node);
    Value opaque(const Frame& frame);
    std::optional<Value> ofLiterals(SymbolicOp op, const Value& a, const Value& b) const;
    bool addUnary(Cases& cases, SymbolicOp op, const Case& a);
    bool addBinary(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& a, const RationalForm& b, bool isReal);
    bool addQuotient(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& a, const RationalForm& b);
    bool addBits(Cases& cases, SymbolicOp op, Gate guard, const RationalForm& form, std::int64_t constant);
    std::optional<RationalForm> floor(const RationalForm& form, const BigInteger& divisor);
    std::optional<RationalForm> masked(const RationalForm& form, std::int64_t mask);
    [[nodiscard]] std::optional<RationalForm> constantOf(const Value& value) const;

    Gate truthOf(SymbolicExprId id);
    Gate ownTruth(SymbolicExprId id);
    Cases casesOf(const Value& value) const;
    RationalForm pinned(Gate guard, const RationalForm& form);
    void addCase(Cases& cases, Gate guard, const RationalForm& given);
    /// Where `form op 0` holds.
    Gate compare(SymbolicOp op, const RationalForm& form);
    /// The same for the three operators that the others are the opposites of.
    Gate compareDirectly(SymbolicOp op, const RationalForm& form);
    Gate compareSmall(SymbolicOp op, const LinearForm& form);
    Gate compareWide(SymbolicOp op, WideForm form);

    [[nodiscard]] bool isFloor(Unknown unknown) const { return unknowns_[unknown].kind == UnknownKind::Floor; }

    static Value ofTruth(Gate truth) { return {Value::Kind::Truth, truth}; }

    static Value ofReal(double real) { return {Value::Kind::Real, never, real}; }

    static Value ofNumber(std::int64_t number);

    const LeafReader& leafReader_;
    const SymbolicExprTable& table_;
    Unknowns& unknowns_;
    Circuit& circuit_;
    Steps& steps_;
    IdMap<std::uint32_t> read_; ///< node to position in values_
    IdMap<bool> whole_;         ///< nodes below which no operand is missing
    std::vector<Value> values_;
    std::vector<Frame> frames_;
    std::vector<SymbolicExprId> operands_;
    std::vector<SymbolicExprId> added_; ///< of a long sum, from right to left
    std::vector<Gate> folded_;
    std::vector<UnknownLeaf> leaves_;
    std::vector<Unknown> met_;
    std::vector<SymbolicExprId> calls_;
    bool missing_ = false;
};

} // namespace VT
