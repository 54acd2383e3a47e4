// Hash, equality and operand access of the shapes; dispatch of the node classes.
#include "base/core/Nodes.hpp"

#include "base/core/Walk.hpp"
#include "host/Diagnostics.hpp"

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>

// The fatal diagnostic names the function that was called, so it is raised where __PRETTY_FUNCTION__ says that.
#define VTSYM_FATAL(message) vtsvFatalDiagnostic(message, __FILE__, __LINE__, __PRETTY_FUNCTION__)

namespace VT {

// What a node answers unless its shape knows better.

std::size_t SymbolicExpr::getNumInputs() const {
    return 0;
}

bool SymbolicExpr::isTermExpr() const {
    return false;
}

bool SymbolicExpr::isNumValue() const {
    return false;
}

bool SymbolicExpr::isUnaryExpr() const {
    return false;
}

bool SymbolicExpr::isBinaryExpr() const {
    return false;
}

bool SymbolicExpr::isTernaryExpr() const {
    return false;
}

bool SymbolicExpr::isMultiExpr() const {
    return false;
}

bool SymbolicExpr::isFcnCallExpr() const {
    return false;
}

double SymbolicExpr::getNumValue() const {
    return 18446744073709551616.0;
}

std::size_t SymbolicExpr::getNumDimensions() const {
    return 0;
}

std::size_t SymbolicExpr::getNumArgs() const {
    return 0;
}

SymbolicExprId SymbolicExpr::getInput(std::size_t) const {
    VTSYM_FATAL("VT::SymbolicExpr::getInput() should not be called");
}

SymbolicExprId SymbolicExpr::getId(const SymbolicExprTable& table) const {
    return table.lookup(this);
}

// Operand access.

SymbolicExprId SymbolicUnaryExpr::getInput(std::size_t aIdx) const {
    if (aIdx > 0 && vtsvAssertionsEnabled())
        VTSYM_FATAL("VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is greater than 0");
    return operand_;
}

SymbolicExprId SymbolicBinaryExpr::getInput(std::size_t aIdx) const {
    if (aIdx > 1)
        VTSYM_FATAL("VT::SymbolicBinaryExpr::getInput(aIdx) aIdx is out of bounds");
    return aIdx == 0 ? left_ : right_;
}

SymbolicExprId SymbolicTernaryExpr::getInput(std::size_t aIdx) const {
    if (aIdx > 2)
        VTSYM_FATAL("VT::SymbolicTernaryExpr::getInput(aIdx) aIdx is out of bounds");
    return inputs_[aIdx];
}

SymbolicExprId SymbolicMultiExpr::getInput(std::size_t aIdx) const {
    if (aIdx < inputs_.size())
        return inputs_[aIdx];
    if (vtsvAssertionsEnabled())
        VTSYM_FATAL("VT::SymbolicUnaryExpr::getInput(aIdx) aIdx is out of bounds");
    return invalidId;
}

// Hashes.

std::uint64_t SymbolicUnaryExpr::getHash() const {
    return hashStep(hashSeed(op()), operand_);
}

std::uint64_t SymbolicBinaryExpr::getHash() const {
    return hashStep(hashStep(hashSeed(op()), left_), right_);
}

std::uint64_t SymbolicTernaryExpr::getHash() const {
    return hashStep(hashStep(hashStep(hashSeed(op()), inputs_[0]), inputs_[1]), inputs_[2]);
}

std::uint64_t SymbolicMultiExpr::hashAs(SymbolicOp op) const {
    std::uint64_t hash = hashSeed(op);
    for (const SymbolicExprId input : inputs_)
        hash = hashStep(hash, input);
    return hash;
}

std::uint64_t SymbolicMultiExpr::getHash() const {
    return hashAs(op());
}

// Equality.

bool SymbolicUnaryExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isUnaryExpr() &&
           operand_ == static_cast<const SymbolicUnaryExpr&>(other).operand_;
}

bool SymbolicBinaryExpr::operator==(const SymbolicExpr& other) const {
    if (op() != other.op() || !other.isBinaryExpr())
        return false;
    const auto& twin = static_cast<const SymbolicBinaryExpr&>(other);
    return left_ == twin.left_ && right_ == twin.right_;
}

bool SymbolicTernaryExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isTernaryExpr() &&
           std::ranges::equal(inputs_, static_cast<const SymbolicTernaryExpr&>(other).inputs_);
}

bool SymbolicMultiExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isMultiExpr() && inputs_ == static_cast<const SymbolicMultiExpr&>(other).inputs_;
}

namespace detail {

namespace {

bool equalInputs(const SymbolicExpr& node, const SymbolicExpr& other) {
    const std::size_t count = node.getNumInputs();
    if (count != other.getNumInputs())
        return false;
    for (std::size_t i = 0; i < count; ++i)
        if (node.getInput(i) != other.getInput(i))
            return false;
    return true;
}

} // namespace

bool equalDimensions(const SymbolicExpr& node, const SymbolicExpr& other) {
    return dimensionOps.contains(other.op()) && equalInputs(node, other);
}

bool equalCalls(const SymbolicExpr& node, const SymbolicExpr& other) {
    return callOps.contains(other.op()) && equalInputs(node, other);
}

bool StringShape::operator==(const SymbolicExpr& other) const {
    return other.op() == SymbolicOp::String && name_ == static_cast<const StringShape&>(other).name_;
}

std::uint64_t StringShape::getHash() const {
    if (name_ == "true")
        return 0xfffffffffffffffeU;
    if (name_ == "false")
        return 0xfffffffffffffffdU;
    return hashBytes(0, name_);
}

bool IntShape::operator==(const SymbolicExpr& other) const {
    return other.op() == SymbolicOp::IntValue && value_ == static_cast<const IntShape&>(other).value_;
}

std::uint64_t IntShape::getHash() const {
    return static_cast<std::uint64_t>(static_cast<std::int64_t>(value_));
}

bool DoubleShape::operator==(const SymbolicExpr& other) const {
    if (other.op() != SymbolicOp::DoubleValue)
        return false;
    const double a = value_;
    const double b = static_cast<const DoubleShape&>(other).value_;
    if (!std::isfinite(a) || !std::isfinite(b))
        return a == b;
    // The difference of two large values of unlike sign overflows to infinity, which is beyond every tolerance.
    return std::fabs(a - b) <= std::numeric_limits<double>::epsilon() * std::max(std::fabs(a), std::fabs(b));
}

std::uint64_t DoubleShape::getHash() const {
    if (value_ == 0.0)
        return 0;
    if (std::isnan(value_))
        return 0xfffffffffffffffdU;
    if (std::isinf(value_))
        return value_ > 0 ? 0xffffffffffffffffU : 0xfffffffffffffffeU;
    return std::bit_cast<std::uint64_t>(value_);
}

bool MemberShape::operator==(const SymbolicExpr& other) const {
    if (other.op() != SymbolicOp::MemberValue)
        return false;
    const auto& twin = static_cast<const MemberShape&>(other);
    return operand() == twin.operand() && name_ == twin.name_;
}

std::uint64_t MemberShape::getHash() const {
    constexpr auto code = static_cast<std::uint64_t>(SymbolicOp::MemberValue);
    return hashStep(hashStep(hashBytes(0, name_), code), operand());
}

// The generic classes hash like their twins with a fixed number of operands.

std::uint64_t DimsNShape::getHash() const {
    switch (getNumInputs()) {
    case 2:
        return hashAs(SymbolicOp::Dims2D);
    case 3:
        return hashAs(SymbolicOp::Dims3D);
    default:
        return hashAs(SymbolicOp::DimsND);
    }
}

std::uint64_t CallNShape::getHash() const {
    switch (getNumInputs()) {
    case 1:
        return hashAs(SymbolicOp::FcnCall0U);
    case 2:
        return hashAs(SymbolicOp::FcnCall1U);
    case 3:
        return hashAs(SymbolicOp::FcnCall2U);
    default:
        return hashAs(SymbolicOp::FcnCall);
    }
}

std::size_t CallNShape::getNumArgs() const {
    return inputs().empty() ? 0 : inputs().size() - 1;
}

std::size_t CellShape::getNumArgs() const {
    return inputs().empty() ? 0 : inputs().size() - 1;
}

std::vector<SymbolicExprId> headed(SymbolicExprId head, const std::vector<SymbolicExprId>& rest) {
    std::vector<SymbolicExprId> all;
    all.reserve(rest.size() + 1);
    all.push_back(head);
    all.insert(all.end(), rest.begin(), rest.end());
    return all;
}

} // namespace detail

SymbolicExprId CallName::in(SymbolicExprTable& table) const {
    return text_ != nullptr ? SymbolicString(table, *text_).getId(table) : operand_.in(table);
}

// Dispatch.

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    Class::~Class() = default;                                                                                         \
    void Class::invoke(SymbolicExprVisitor& visitor) const {                                                           \
        visitor.visit(*this);                                                                                          \
    }                                                                                                                  \
    void Class::accept(const SymbolicExprTable& table, SymbolicExprVisitor& visitor) const {                           \
        visitEveryOccurrence(table, *this, visitor);                                                                   \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

bool SymbolicExprVisitor::isBottomUpVistor() const {
    return true;
}

} // namespace VT
