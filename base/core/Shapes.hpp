// The shapes of nodes: payload, operands, hash and equality.  The node classes themselves are in Nodes.hpp.
//
// Beside the virtual operations each shape compares its parts with those of another node of its class (hasParts),
// hashes them as operands of an operator (hashOf) and has a key for them (keyOf): interning knows the class and needs
// no virtual call.
#pragma once

#include "base/core/Node.hpp"
#include "base/core/NodeHash.hpp"

#include <string>
#include <vector>

namespace VT {

/// One operand.
class VTSYM_API SymbolicUnaryExpr : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] std::uint64_t getHash() const override { return hashOf(op()); }

    [[nodiscard]] std::size_t getNumInputs() const override { return 1; }

    [[nodiscard]] bool isUnaryExpr() const override { return true; }

    [[nodiscard]] SymbolicExprId getInput(std::size_t aIdx) const override;

    [[nodiscard]] SymbolicExprId operand() const noexcept { return operand_; }

    [[nodiscard]] bool hasParts(const SymbolicUnaryExpr& other) const noexcept { return operand_ == other.operand_; }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept { return hashStep(hashSeed(op), operand_); }

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept {
        return NodeKeys::fits(operand_, 0) ? NodeKeys::exact(op, operand_, 0) : NodeKeys::inexact(hashOf(op));
    }

protected:
    explicit SymbolicUnaryExpr(SymbolicExprId operand) : operand_(operand) {}

private:
    SymbolicExprId operand_;
};

/// Two operands: input 0 is the left one, input 1 the right one.
class VTSYM_API SymbolicBinaryExpr : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] std::uint64_t getHash() const override { return hashOf(op()); }

    [[nodiscard]] std::size_t getNumInputs() const override { return 2; }

    [[nodiscard]] bool isBinaryExpr() const override { return true; }

    [[nodiscard]] SymbolicExprId getInput(std::size_t aIdx) const override;

    [[nodiscard]] SymbolicExprId left() const noexcept { return left_; }

    [[nodiscard]] SymbolicExprId right() const noexcept { return right_; }

    [[nodiscard]] bool hasParts(const SymbolicBinaryExpr& other) const noexcept {
        return left_ == other.left_ && right_ == other.right_;
    }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept {
        return hashStep(hashStep(hashSeed(op), left_), right_);
    }

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept {
        return NodeKeys::fits(left_, right_) ? NodeKeys::exact(op, left_, right_) : NodeKeys::inexact(hashOf(op));
    }

protected:
    SymbolicBinaryExpr(SymbolicExprId left, SymbolicExprId right) : left_(left), right_(right) {}

private:
    SymbolicExprId left_;
    SymbolicExprId right_;
};

/// Three operands.
class VTSYM_API SymbolicTernaryExpr : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] std::uint64_t getHash() const override { return hashOf(op()); }

    [[nodiscard]] std::size_t getNumInputs() const override { return 3; }

    [[nodiscard]] bool isTernaryExpr() const override { return true; }

    [[nodiscard]] SymbolicExprId getInput(std::size_t aIdx) const override;

    [[nodiscard]] SymbolicExprId first() const noexcept { return inputs_[0]; }

    [[nodiscard]] SymbolicExprId second() const noexcept { return inputs_[1]; }

    [[nodiscard]] SymbolicExprId third() const noexcept { return inputs_[2]; }

    [[nodiscard]] bool hasParts(const SymbolicTernaryExpr& other) const noexcept {
        return first() == other.first() && second() == other.second() && third() == other.third();
    }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept {
        return hashStep(hashStep(hashStep(hashSeed(op), first()), second()), third());
    }

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

protected:
    SymbolicTernaryExpr(SymbolicExprId a, SymbolicExprId b, SymbolicExprId c) : inputs_{a, b, c} {}

private:
    SymbolicExprId inputs_[3];
};

/// Any number of operands, in order.
class VTSYM_API SymbolicMultiExpr : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] std::uint64_t getHash() const override { return hashOf(op()); }

    [[nodiscard]] std::size_t getNumInputs() const override { return inputs_.size(); }

    [[nodiscard]] bool isMultiExpr() const override { return true; }

    [[nodiscard]] SymbolicExprId getInput(std::size_t aIdx) const override;

    [[nodiscard]] const std::vector<SymbolicExprId>& inputs() const noexcept { return inputs_; }

    [[nodiscard]] bool hasParts(const SymbolicMultiExpr& other) const noexcept { return inputs_ == other.inputs_; }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

protected:
    explicit SymbolicMultiExpr(std::vector<SymbolicExprId> inputs) : inputs_(std::move(inputs)) {}

private:
    std::vector<SymbolicExprId> inputs_;
};

namespace detail {

/// Whether `other` is a dimension list, or a call, with the operands of `node`, whichever class holds them.
VTSYM_API bool equalDimensions(const SymbolicExpr& node, const SymbolicExpr& other);
VTSYM_API bool equalCalls(const SymbolicExpr& node, const SymbolicExpr& other);

// Shapes of one or few classes: the operands above with another equality, hash or count.

class VTSYM_API StringShape : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] bool isTermExpr() const override { return true; }

    /// The identifier or keyword, as received.
    [[nodiscard]] const std::string& getName() const noexcept { return name_; }

    [[nodiscard]] bool hasParts(const StringShape& other) const noexcept { return name_ == other.name_; }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp) const noexcept { return NodeKeys::ofText(name_); }

protected:
    explicit StringShape(std::string name) : name_(std::move(name)) {}

private:
    std::string name_;
};

class VTSYM_API IntShape : public SymbolicExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] bool isTermExpr() const override { return true; }

    [[nodiscard]] bool isNumValue() const override { return true; }

    [[nodiscard]] double getNumValue() const override { return value_; }

    [[nodiscard]] int getValue() const noexcept { return value_; }

    [[nodiscard]] bool hasParts(const IntShape& other) const noexcept { return value_ == other.value_; }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp) const noexcept {
        return static_cast<std::uint64_t>(static_cast<std::int64_t>(value_));
    }

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp) const noexcept { return NodeKeys::ofInteger(value_); }

protected:
    explicit IntShape(int value) : value_(value) {}

private:
    int value_;
};

class VTSYM_API DoubleShape : public SymbolicExpr {
public:
    static constexpr std::uint64_t hashOfNaN = 0xfffffffffffffffdU;

    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    [[nodiscard]] bool isTermExpr() const override { return true; }

    [[nodiscard]] bool isNumValue() const override { return true; }

    [[nodiscard]] double getNumValue() const override { return value_; }

    [[nodiscard]] double getValue() const noexcept { return value_; }

    /// Within the tolerance.
    [[nodiscard]] bool hasParts(const DoubleShape& other) const noexcept;

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

protected:
    explicit DoubleShape(double value) : value_(value) {}

private:
    double value_;
};

class VTSYM_API MemberShape : public SymbolicUnaryExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override;

    /// The field after the dot.
    [[nodiscard]] const std::string& getMemberName() const noexcept { return name_; }

    [[nodiscard]] bool hasParts(const MemberShape& other) const noexcept {
        return operand() == other.operand() && name_ == other.name_;
    }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

protected:
    MemberShape(SymbolicExprId owner, std::string name) : SymbolicUnaryExpr(owner), name_(std::move(name)) {}

private:
    std::string name_;
};

/// A dimension list with a fixed number of entries.
template <class Inputs>
class FixedDimsShape : public Inputs {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override { return equalDimensions(*this, other); }

    [[nodiscard]] std::size_t getNumDimensions() const override { return this->getNumInputs(); }

    /// The key of the twin with any number of operands.
    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(this->hashOf(op)); }

protected:
    using Inputs::Inputs;
};

class VTSYM_API DimsNShape : public SymbolicMultiExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override { return equalDimensions(*this, other); }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

    [[nodiscard]] std::size_t getNumDimensions() const override { return getNumInputs(); }

protected:
    using SymbolicMultiExpr::SymbolicMultiExpr;
};

/// A call with a fixed number of arguments: input 0 is the function's name.
template <class Inputs>
class FixedCallShape : public Inputs {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override { return equalCalls(*this, other); }

    [[nodiscard]] bool isFcnCallExpr() const override { return true; }

    [[nodiscard]] std::size_t getNumArgs() const override { return this->getNumInputs() - 1; }

    /// The key of the twin with any number of operands.
    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(this->hashOf(op)); }

protected:
    using Inputs::Inputs;
};

class VTSYM_API CallNShape : public SymbolicMultiExpr {
public:
    [[nodiscard]] bool operator==(const SymbolicExpr& other) const override { return equalCalls(*this, other); }

    [[nodiscard]] std::uint64_t hashOf(SymbolicOp op) const noexcept;

    [[nodiscard]] std::uint64_t keyOf(SymbolicOp op) const noexcept { return NodeKeys::inexact(hashOf(op)); }

    [[nodiscard]] std::size_t getNumArgs() const override;

protected:
    using SymbolicMultiExpr::SymbolicMultiExpr;
};

/// Input 0 is the head, further operands follow.
class VTSYM_API CellShape : public SymbolicMultiExpr {
public:
    [[nodiscard]] std::size_t getNumArgs() const override;

protected:
    using SymbolicMultiExpr::SymbolicMultiExpr;
};

} // namespace detail
} // namespace VT
