// Tables of Python objects: identity, hashes, and going on in another table.
//
// Method: hashes are computed bottom-up once for each node and leave out what equal nodes may differ in: the value of a
// real literal, which is equal within a tolerance, and the class of a list or call.
// Cost: linear in the distinct nodes that are looked at.
#include "python/src/Table.hpp"

#include "base/core/Walk.hpp"
#include "base/transform/Copy.hpp"

#include <algorithm>
#include <functional>
#include <stdexcept>

namespace vtsym::python {

namespace {

/// The operator, or one that stands for all classes of the same kind of node.
std::uint64_t kindOf(VT::SymbolicOp op) {
    if (VT::dimensionOps.contains(op))
        op = VT::SymbolicOp::DimsND;
    else if (VT::callOps.contains(op))
        op = VT::SymbolicOp::FcnCall;
    return static_cast<std::uint64_t>(op);
}

std::uint64_t hashOfLeaf(const VT::SymbolicExpr& node) {
    switch (node.op()) {
    case VT::SymbolicOp::String:
        return std::hash<std::string>()(static_cast<const VT::SymbolicString&>(node).getName());
    case VT::SymbolicOp::IntValue:
        return static_cast<std::uint64_t>(static_cast<const VT::SymbolicIntValue&>(node).getValue());
    case VT::SymbolicOp::MemberValue:
        return std::hash<std::string>()(static_cast<const VT::SymbolicMemberValue&>(node).getMemberName());
    default:
        return 0;
    }
}

} // namespace

Table::Table(bool bits32, std::size_t capacity) : bits32_(bits32), capacity_(capacity) {
    service_.setDecisions32Bit(bits32);
}

SymbolicExprId Table::checked(SymbolicExprId id) {
    if (!nodes().has(id))
        throw std::out_of_range("no such node");
    return id;
}

std::uint64_t Table::hashOf(SymbolicExprId id) {
    std::vector<VT::WalkFrame> stack;
    VT::walkUnknown(
        nodes(), id, stack, [&](SymbolicExprId met, const VT::SymbolicExpr*) { return hashes_.find(met) != nullptr; },
        [&](SymbolicExprId met, const VT::SymbolicExpr& node, const VT::SymbolicExpr*) {
            std::uint64_t hash = VT::hashStep(VT::hashSeed(VT::SymbolicOp::String), kindOf(node.op()));
            hash = VT::hashStep(hash, hashOfLeaf(node));
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                hash = VT::hashStep(hash, *hashes_.find(node.getInput(i)));
            hashes_.insert(met, hash);
        },
        [](SymbolicExprId, const VT::SymbolicExpr*) {});
    return *hashes_.find(id);
}

Table::Dimensions::Dimensions(Table& table)
    : decider(table.nodes(), {.bits32 = table.bits32_}),
      assumptions(table.nodes()),
      proofs(table.nodes(), decider, assumptions) {
    for (const VT::VCSymbolicExprId& condition : table.service_.assumptions())
        assumptions.add(condition.id());
}

VT::DimensionProofs& Table::dimensionProofs() {
    if (!dimensions_)
        dimensions_.emplace(*this);
    return dimensions_->proofs;
}

void Table::assume(SymbolicExprId condition) {
    service_.assume(condition);
    dimensions_.reset();
}

std::vector<SymbolicExprId> Table::adopt(Table& source, std::span<const SymbolicExprId> ids) {
    const VT::SymbolicExprCopy copy(source.nodes(), nodes());
    std::vector<SymbolicExprId> copies;
    for (const SymbolicExprId id : ids)
        copies.push_back(copy(source.checked(id)));
    return copies;
}

std::shared_ptr<Table> Table::successor(SymbolicExprId first) {
    if (successor_ != nullptr) {
        const std::lock_guard lock(successor_->mutex);
        if (!successor_->isFull())
            return successor_;
    }
    auto made = std::make_shared<Table>(bits32_, capacity_);
    std::vector<SymbolicExprId> assumed;
    for (const VT::VCSymbolicExprId& condition : service_.assumptions())
        assumed.push_back(condition.id());
    for (const SymbolicExprId condition : made->adopt(*this, assumed))
        made->assume(condition);
    const SymbolicExprId root[] = {first};
    made->adopt(*this, root);
    // A condition as large as the table would fill every further table at once.
    made->capacity_ = std::max(capacity_, 4 * made->nodes().size());
    successor_ = made;
    return made;
}

} // namespace vtsym::python
