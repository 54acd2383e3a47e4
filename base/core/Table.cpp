#include "base/core/Table.hpp"

#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"

#include <bit>
#include <limits>
#include <utility>

namespace VT {

namespace {
constexpr std::size_t firstSlots = 16;
}

/// Frees a node that its table could not take over.
class SymbolicExprTable::Adoption {
public:
    Adoption(const SymbolicExpr* node, bool pooled) : node_(node), pooled_(pooled) {}

    Adoption(const Adoption&) = delete;
    Adoption& operator=(const Adoption&) = delete;

    ~Adoption() {
        if (node_ == nullptr)
            return;
        if (pooled_)
            node_->~SymbolicExpr();
        else
            delete node_;
    }

    void done() noexcept { node_ = nullptr; }

private:
    const SymbolicExpr* node_;
    bool pooled_;
};

SymbolicExprTable::SymbolicExprTable() : SymbolicExprTable(NodeStorage::Pooled) {}

SymbolicExprTable::SymbolicExprTable(NodeStorage storage) : storage_(storage) {}

SymbolicExprTable::~SymbolicExprTable() {
    // Both lists are in the order of addition, so one pass tells pooled nodes from heap nodes.
    auto heap = heapNodes_.begin();
    for (const SymbolicExpr* node : nodes_) {
        if (heap != heapNodes_.end() && *heap == node) {
            delete node;
            ++heap;
        } else {
            node->~SymbolicExpr();
        }
    }
}

std::size_t SymbolicExprTable::home(std::uint64_t hash) const noexcept {
    // Hashes of literals are their bits, so they are spread before the topmost bits choose the slot.
    return static_cast<std::size_t>((hash * 0x9e3779b97f4a7c15U) >> indexShift_);
}

std::size_t SymbolicExprTable::freePosition(std::uint64_t hash) const noexcept {
    const std::size_t mask = index_.size() - 1;
    std::size_t at = home(hash);
    while (index_[at].id != invalidId)
        at = (at + 1) & mask;
    return at;
}

SymbolicExprTable::Probe SymbolicExprTable::probe(const SymbolicExpr& node) const {
    return probe(node, node.getHash());
}

SymbolicExprTable::Probe SymbolicExprTable::probe(const SymbolicExpr& node, std::uint64_t hash) const {
    if (index_.empty())
        return {hash, 0, invalidId};
    const std::size_t mask = index_.size() - 1;
    for (std::size_t at = home(hash);; at = (at + 1) & mask) {
        const Slot& slot = index_[at];
        if (slot.id == invalidId)
            return {hash, at, invalidId};
        if (slot.hash == hash) {
            const SymbolicExpr* const candidate = nodes_[slot.id];
            if (candidate == &node || *candidate == node)
                return {hash, at, slot.id};
        }
    }
}

void SymbolicExprTable::growIndex() {
    std::vector<Slot> old(index_.empty() ? firstSlots : index_.size() * 2, Slot{0, invalidId});
    old.swap(index_);
    indexShift_ = static_cast<unsigned>(64 - std::countr_zero(index_.size()));
    for (const Slot& slot : old)
        if (slot.id != invalidId)
            index_[freePosition(slot.hash)] = slot;
}

/// Makes room for one more node, so that nothing can fail once the index knows it.
void SymbolicExprTable::reserveOne() {
    if (nodes_.size() == nodes_.capacity())
        nodes_.reserve(nodes_.empty() ? firstSlots : nodes_.size() * 2);
    if ((nodes_.size() + 1) * 4 > index_.size() * 3) {
        growIndex();
        lastMiss_.node = nullptr;
    }
}

void SymbolicExprTable::add(const SymbolicExpr* node) {
    const bool pooled = node == std::exchange(pooled_, nullptr);
    Adoption adoption(node, pooled);
    reserveOne();
    if (!pooled)
        heapNodes_.push_back(node);
    // A copy on its way from its constructor was just looked for and is known to be new.
    const bool known = lastMiss_.node == node;
    const Probe place = known ? Probe{lastMiss_.hash, lastMiss_.position, invalidId} : probe(*node);
    if (place.id == invalidId)
        index_[place.position] = {place.hash, nodes_.size()};
    nodes_.push_back(node);
    lastMiss_.node = nullptr;
    adoption.done();
}

bool SymbolicExprTable::contains(const SymbolicExpr* node) const {
    const Probe found = probe(*node);
    if (found.id == invalidId) {
        lastMiss_ = {found.hash, found.position, node};
        return false;
    }
    lastAnswer_ = {nullptr, found.id};
    return true;
}

SymbolicExprId SymbolicExprTable::lookup(const SymbolicExpr* node) const {
    // Another node may stand where the remembered one stood, so it is compared, which is cheaper than hashing and
    // probing.
    if (node == lastAnswer_.node && *nodes_[lastAnswer_.id] == *node)
        return lastAnswer_.id;
    return probe(*node).id;
}

const SymbolicExpr* SymbolicExprTable::get(SymbolicExprId id) const {
    return has(id) ? nodes_[id] : nullptr;
}

SymbolicExprTable* SymbolicExprTable::CreateSymbolicExprTable() const {
    return new SymbolicExprTable;
}

void SymbolicExprTable::lookup(const SymbolicOp& op, std::vector<SymbolicExprId>& out) const {
    out.clear();
    if (out.capacity() < nodes_.size() / 10)
        out.reserve(nodes_.size() / 10);
    for (SymbolicExprId id = 0; id < nodes_.size(); ++id)
        if (nodes_[id]->op() == op)
            out.push_back(id);
}

void SymbolicExprTable::addBoolSymbols() {
    falseId_ = SymbolicString(*this, "false").getId(*this);
    trueId_ = SymbolicString(*this, "true").getId(*this);
}

void SymbolicExprTable::registerValueId(SymbolicExprId exprId, SymbolicExprId valueId) {
    values_[exprId] = valueId;
}

void SymbolicExprTable::registerValueId(const std::string& name, SymbolicExprId valueId) {
    registerValueId(SymbolicString(*this, name).getId(*this), valueId);
}

void SymbolicExprTable::registerValue(const std::string& name, int value) {
    const SymbolicExprId valueId = SymbolicIntValue(*this, value).getId(*this);
    registerValueId(name, valueId);
}

SymbolicExprId SymbolicExprTable::getValueId(SymbolicExprId exprId) const {
    const auto found = values_.find(exprId);
    return found == values_.end() ? invalidId : found->second;
}

int SymbolicExprTable::getValue(const std::string& name) {
    constexpr int none = std::numeric_limits<int>::max();
    const SymbolicExpr* node = get(getValueId(SymbolicString(*this, name).getId(*this)));
    if (node == nullptr || !node->isNumValue())
        return none;
    const double value = node->getNumValue();
    if (!(value < 2147483648.0)) // also NaN
        return none;
    return value <= -2147483648.0 ? std::numeric_limits<int>::min() : static_cast<int>(value);
}

void SymbolicExprTable::getSymbolsFromExpression(SymbolicExprId id, std::vector<std::string>& symbols) const {
    symbols.clear();
    walkDistinct(
        *this, id,
        [&](SymbolicExprId, const SymbolicExpr& node) {
            if (node.op() == SymbolicOp::String)
                symbols.push_back(static_cast<const SymbolicString&>(node).getName());
        },
        [](SymbolicExprId) {});
}

void SymbolicExprTable::insertAliasInfo(std::string identifier, std::string alias) {
    aliases_.emplace(std::move(identifier), std::move(alias));
}

std::string SymbolicExprTable::getAliasForSymbolicIdentifier(const std::string& identifier) const {
    const auto found = aliases_.find(identifier);
    return found == aliases_.end() ? std::string() : found->second;
}

} // namespace VT
