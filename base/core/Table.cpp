// The interning store: one identifier for one structure (hash consing).
//
// Method: nodes lie in cells that never move.  An index with open addressing and linear probing holds, for each node,
// the number of its cell and 32 bits of its hash; most probes that miss read no node.  The topmost bits of a hash
// spread by multiplication (Knuth, "The Art of Computer Programming", vol. 3, 6.4) choose the slot, so that a larger
// index is filled almost in order and without hashing anew.
// Cost: O(1) on average for each constructor and look-up; the index is filled to three quarters at most.
// Relies on: nodes that are equal have equal hashes, but for real literals within a tolerance.
#include "base/core/Table.hpp"

#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/util/LargePages.hpp"

#include <algorithm>
#include <bit>
#include <limits>
#include <memory>
#include <utility>

namespace VT {

namespace {
constexpr std::size_t firstSlots = 16;

void makeRoom(std::vector<const SymbolicExpr*>& nodes) {
    if (nodes.size() < nodes.capacity())
        return;
    std::vector<const SymbolicExpr*> larger;
    larger.reserve(std::max(firstSlots, nodes.size() * 2));
    preferLargePages(larger.data(),
                     larger.capacity() * sizeof(larger.front())); // NOLINT(bugprone-sizeof-expression): of a pointer
    larger.assign(nodes.begin(), nodes.end());
    nodes.swap(larger);
}
} // namespace

SymbolicExprTable::SymbolicExprTable()
    : index_(firstSlots),
      indexShift_(32U - static_cast<unsigned>(std::countr_zero(firstSlots))) {}

SymbolicExprTable::~SymbolicExprTable() {
    // Both lists are in the order of addition, so one pass separates foreign nodes from those in cells.
    auto foreign = foreignNodes_.begin();
    for (const SymbolicExpr* node : nodes_) {
        if (foreign != foreignNodes_.end() && *foreign == node) {
            delete node;
            ++foreign;
        } else {
            node->~SymbolicExpr();
        }
    }
}

bool SymbolicExprTable::equalNodes(const SymbolicExpr& interned, const SymbolicExpr& node, std::uint64_t hash) {
    return &interned == &node || (interned == node && interned.getHash() == hash);
}

std::uint32_t SymbolicExprTable::tagOf(const SymbolicExpr& node, std::uint64_t hash) {
    const bool isNaN = hash == SymbolicDoubleValue::hashOfNaN && node.op() == SymbolicOp::DoubleValue;
    return isNaN ? addressTag(node) : tagOf(hash);
}

std::size_t SymbolicExprTable::probe(const SymbolicExpr& node, std::uint64_t hash) const {
    return probe(tagOf(node, hash), [&](const NodeCell& cell) { return equalNodes(*cell.node(), node, hash); });
}

/// Makes room for one more node, so that nothing but its own storage can fail once it is made.
void SymbolicExprTable::reserveOne() {
    makeRoom(nodes_);
    if ((nodes_.size() + 1) * 4 <= index_.size() * 3)
        return;
    if (indexShift_ == 0)
        throw std::length_error("expression table: no room for another node");
    // The topmost bits of the tags choose the slots, so the old index is copied nearly in order.
    std::vector<Slot> larger;
    larger.reserve(index_.size() * 2);
    preferLargePages(larger.data(), larger.capacity() * sizeof(Slot));
    larger.resize(index_.size() * 2);
    const std::size_t mask = larger.size() - 1;
    for (const Slot& slot : index_) {
        if (slot.cell == 0)
            continue;
        std::size_t at = std::size_t{slot.tag} >> (indexShift_ - 1);
        while (larger[at].cell != 0)
            at = (at + 1) & mask;
        larger[at] = slot;
    }
    index_.swap(larger);
    --indexShift_;
}

void SymbolicExprTable::add(const SymbolicExpr* node) {
    std::unique_ptr<const SymbolicExpr> owned(node);
    if (isFull())
        reserveOne();
    makeRoom(foreignNodes_);
    const CellStore::Number number =
        cells_.allocate(sizeof(node)); // NOLINT(bugprone-sizeof-expression): a pointer is kept
    NodeCell* const fresh = cell(number);
    fresh->id = static_cast<std::uint32_t>(nodes_.size());
    fresh->code = NodeCell::foreign;
    new (fresh + 1) const SymbolicExpr*(node);
    const std::uint64_t hash = node->getHash();
    Slot& slot = index_[probe(*node, hash)];
    if (slot.cell == 0)
        slot = {tagOf(*node, hash), number};
    foreignNodes_.push_back(node);
    nodes_.push_back(owned.release());
}

bool SymbolicExprTable::contains(const SymbolicExpr* node) const {
    return SymbolicExprTable::lookup(node) != invalidId;
}

SymbolicExprId SymbolicExprTable::lookup(const SymbolicExpr* node) const {
    // Another node may be where the remembered one was, so it is compared.
    if (node == lastAnswer_.candidate && *lastAnswer_.cell->node() == *node)
        return lastAnswer_.cell->id;
    const CellStore::Number found = index_[probe(*node, node->getHash())].cell;
    return found == 0 ? invalidId : cell(found)->id;
}

const SymbolicExpr* SymbolicExprTable::get(SymbolicExprId id) const {
    return id < nodes_.size() ? nodes_[id] : nullptr;
}

SymbolicExprTable* SymbolicExprTable::CreateSymbolicExprTable() const {
    return new SymbolicExprTable;
}

void SymbolicExprTable::lookup(const SymbolicOp& op, std::vector<SymbolicExprId>& out) const {
    out.clear();
    if (!isPlain()) {
        const SymbolicExpr* node = nullptr;
        for (SymbolicExprId id = 0; (node = get(id)) != nullptr; ++id)
            if (node->op() == op)
                out.push_back(id);
        return;
    }
    if (out.capacity() < nodes_.size() / 10)
        out.reserve(nodes_.size() / 10);
    for (SymbolicExprId id = 0; id < nodes_.size(); ++id)
        if (nodes_[id]->op() == op)
            out.push_back(id);
}

void SymbolicExprTable::addBoolSymbols() {
    const SymbolicExprId falseId = SymbolicString(*this, "false").getId(*this);
    const SymbolicExprId trueId = SymbolicString(*this, "true").getId(*this);
    falseId_ = falseId;
    trueId_ = trueId;
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
