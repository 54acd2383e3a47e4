// The node classes: hash, equality and operand access by shape, dispatch by class.
//
// The bodies of accept() and invoke() are expanded from operators.def here, so that every table of virtual functions
// has one home.  Hash and equality are linear in the operands and O(1) but for the classes with any number of them.
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

// Defaults, which shapes override.

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

std::uint64_t SymbolicMultiExpr::hashOf(SymbolicOp op) const noexcept {
    std::uint64_t hash = hashSeed(op);
    for (const SymbolicExprId input : inputs_)
        hash = hashStep(hash, input);
    return hash;
}

// Equality.

bool SymbolicUnaryExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isUnaryExpr() && hasParts(static_cast<const SymbolicUnaryExpr&>(other));
}

bool SymbolicBinaryExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isBinaryExpr() && hasParts(static_cast<const SymbolicBinaryExpr&>(other));
}

bool SymbolicTernaryExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isTernaryExpr() && hasParts(static_cast<const SymbolicTernaryExpr&>(other));
}

bool SymbolicMultiExpr::operator==(const SymbolicExpr& other) const {
    return op() == other.op() && other.isMultiExpr() && hasParts(static_cast<const SymbolicMultiExpr&>(other));
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
    return other.op() == SymbolicOp::String && hasParts(static_cast<const StringShape&>(other));
}

std::uint64_t StringShape::hashOf(SymbolicOp) const noexcept {
    if (name_ == "true")
        return 0xfffffffffffffffeU;
    if (name_ == "false")
        return 0xfffffffffffffffdU;
    return hashBytes(0, name_);
}

bool IntShape::operator==(const SymbolicExpr& other) const {
    return other.op() == SymbolicOp::IntValue && hasParts(static_cast<const IntShape&>(other));
}

bool DoubleShape::operator==(const SymbolicExpr& other) const {
    return other.op() == SymbolicOp::DoubleValue && hasParts(static_cast<const DoubleShape&>(other));
}

bool DoubleShape::hasParts(const DoubleShape& other) const noexcept {
    const double a = value_;
    const double b = other.value_;
    if (!std::isfinite(a) || !std::isfinite(b))
        return a == b;
    // The difference of two large values of unlike sign overflows to infinity, which is beyond every tolerance.
    return std::fabs(a - b) <= std::numeric_limits<double>::epsilon() * std::max(std::fabs(a), std::fabs(b));
}

std::uint64_t DoubleShape::hashOf(SymbolicOp) const noexcept {
    if (value_ == 0.0)
        return 0;
    if (std::isnan(value_))
        return hashOfNaN;
    if (std::isinf(value_))
        return value_ > 0 ? 0xffffffffffffffffU : 0xfffffffffffffffeU;
    return std::bit_cast<std::uint64_t>(value_);
}

bool MemberShape::operator==(const SymbolicExpr& other) const {
    return other.op() == SymbolicOp::MemberValue && hasParts(static_cast<const MemberShape&>(other));
}

std::uint64_t MemberShape::hashOf(SymbolicOp op) const noexcept {
    return hashStep(hashStep(hashBytes(0, name_), static_cast<std::uint64_t>(op)), operand());
}

// The generic classes hash like their twins with a fixed number of operands.

std::uint64_t DimsNShape::hashOf(SymbolicOp op) const noexcept {
    switch (getNumInputs()) {
    case 2:
        return SymbolicMultiExpr::hashOf(SymbolicOp::Dims2D);
    case 3:
        return SymbolicMultiExpr::hashOf(SymbolicOp::Dims3D);
    default:
        return SymbolicMultiExpr::hashOf(op);
    }
}

std::uint64_t CallNShape::hashOf(SymbolicOp op) const noexcept {
    switch (getNumInputs()) {
    case 1:
        return SymbolicMultiExpr::hashOf(SymbolicOp::FcnCall0U);
    case 2:
        return SymbolicMultiExpr::hashOf(SymbolicOp::FcnCall1U);
    case 3:
        return SymbolicMultiExpr::hashOf(SymbolicOp::FcnCall2U);
    default:
        return SymbolicMultiExpr::hashOf(op);
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
    return isText_ ? SymbolicString(table, std::string(text_)).getId(table) : operand_.in(table);
}

// Dispatch.

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void Class::invoke(SymbolicExprVisitor& visitor) const {                                                           \
        visitor.visit(*this);                                                                                          \
    }                                                                                                                  \
    void Class::accept(const SymbolicExprTable& table, SymbolicExprVisitor& visitor) const {                           \
        visitEveryOccurrence(table, *this, visitor);                                                                   \
    }                                                                                                                  \
    template void SymbolicExprTable::intern<Class>(const Class::NodeBase::Shape&);
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

bool SymbolicExprVisitor::isBottomUpVistor() const {
    return true;
}

} // namespace VT
