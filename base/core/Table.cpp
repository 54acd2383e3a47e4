// The interning store: one identifier for one structure (hash consing).
//
// Method: nodes lie in cells that never move.  A key of 64 bits for each node holds its operator and operands, or a
// hash where they do not fit.  An index with open addressing and linear probing holds the identifiers of nodes and 32
// bits of the hashes of their keys; a look-up reads a slot and a key, and a node only where the key is a hash.  The
// topmost bits of a hash choose the slot, so that a larger index is filled almost in order and without hashing anew.
// A seed of the process is mixed in, so that nobody can prepare texts whose nodes share slots.
// Cost: O(1) on average for each constructor and look-up; the index is filled to three quarters at most.
// Relies on: nodes that are equal have equal keys, but for real literals within a tolerance.
#include "base/core/Table.hpp"

#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/util/LargePages.hpp"

#include <algorithm>
#include <bit>
#include <chrono>
#include <limits>
#include <memory>
#include <utility>

namespace VT {

namespace {
constexpr std::size_t firstSlots = 16;
constexpr std::size_t firstRoom = 128; // nodes

/// The nodes for which both arrays have room.
template <class Keys, class Nodes>
std::size_t arrayRoom(const Keys& keys, const Nodes& nodes) {
    return std::min(keys.capacity(), nodes.capacity());
}

} // namespace

std::uint64_t processSeed() noexcept {
    // The time and where the system has put the library and the stack.
    static const std::uint64_t seed = [] {
        const int local = 0;
        const auto now = std::chrono::high_resolution_clock::now().time_since_epoch().count();
        const std::uint64_t places =
            hashStep(reinterpret_cast<std::uintptr_t>(&local), reinterpret_cast<std::uintptr_t>(&firstSlots));
        return hashStep(places, static_cast<std::uint64_t>(now));
    }();
    return seed;
}

SymbolicExprTable::SymbolicExprTable()
    : index_(firstSlots),
      indexShift_(32U - static_cast<unsigned>(std::countr_zero(firstSlots))) {}

SymbolicExprTable::~SymbolicExprTable() {
    // Both lists are in the order of addition, so one pass separates foreign nodes from those in cells.
    auto foreign = foreignNodes_.begin();
    for (std::size_t id = 0; id < nodes_.size(); ++id) {
        const SymbolicExpr* const node = nodes_[id];
        if (foreign != foreignNodes_.end() && *foreign == node) {
            delete node;
            ++foreign;
        } else {
            node->~SymbolicExpr();
        }
    }
}

bool SymbolicExprTable::equalNodes(const SymbolicExpr& interned, const SymbolicExpr& node) {
    return &interned == &node || (interned == node && interned.getHash() == node.getHash());
}

/// The key of a node of any class: what a node of the library with this operator and these operands has.
std::uint64_t SymbolicExprTable::keyOf(const SymbolicExpr& node) {
    const SymbolicOp op = node.op();
    if (op == SymbolicOp::String)
        return static_cast<const detail::StringShape&>(node).keyOf(op);
    if (op == SymbolicOp::IntValue)
        return static_cast<const detail::IntShape&>(node).keyOf(op);
    const bool isUnary = node.isUnaryExpr();
    const bool isKnown = op > SymbolicOp::None && static_cast<int>(op) < operatorCount && exactKeyOps.contains(op);
    if (isKnown && (isUnary || node.isBinaryExpr())) {
        const SymbolicExprId left = node.getInput(0);
        const SymbolicExprId right = isUnary ? 0 : node.getInput(1);
        if (NodeKeys::fits(left, right))
            return NodeKeys::exact(op, left, right);
    }
    const std::uint64_t hash = node.getHash();
    const bool isNaN = op == SymbolicOp::DoubleValue && hash == SymbolicDoubleValue::hashOfNaN;
    return isNaN ? addressKey(node) : NodeKeys::inexact(hash);
}

std::size_t SymbolicExprTable::probe(const SymbolicExpr& node, std::uint64_t key) const {
    return probe(key, [&](const SymbolicExpr& interned) { return equalNodes(interned, node); });
}

/// Makes room for one more node, so that nothing but its own storage can fail once it is made.
void SymbolicExprTable::reserveOne() {
    // A failure on the way leaves what there is, and room_ the less of what all three hold.
    if (nodes_.size() == arrayRoom(keys_, nodes_)) {
        const std::size_t room = std::max(firstRoom, 2 * nodes_.size());
        keys_.reserve(room);
        nodes_.reserve(room);
        preferLargePages(&keys_[0], room * sizeof(keys_[0]));
        preferLargePages(&nodes_[0], room * sizeof(nodes_[0])); // NOLINT(bugprone-sizeof-expression): of a pointer
    }
    const auto indexRoom = [&] { return index_.size() / 4 * 3; };
    if (nodes_.size() == indexRoom())
        growIndex();
    room_ = std::min(arrayRoom(keys_, nodes_), indexRoom());
}

/// Doubles the slots.
void SymbolicExprTable::growIndex() {
    if (indexShift_ == 0)
        throw std::length_error("expression table: no room for another node");
    // The topmost bits of the tags choose the slots, so the old index is copied nearly in order.
    std::vector<Slot> larger;
    larger.reserve(index_.size() * 2);
    preferLargePages(larger.data(), larger.capacity() * sizeof(Slot));
    larger.resize(index_.size() * 2);
    const std::size_t mask = larger.size() - 1;
    for (const Slot& slot : index_) {
        if (slot.idAndOne == 0)
            continue;
        std::size_t at = std::size_t{slot.tag} >> (indexShift_ - 1);
        while (larger[at].idAndOne != 0)
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
    if (foreignNodes_.size() == foreignNodes_.capacity())
        foreignNodes_.reserve(std::max(firstSlots, 2 * foreignNodes_.size()));
    const std::uint64_t key = keyOf(*node);
    Slot& slot = index_[probe(*node, key)];
    if (slot.idAndOne == 0)
        slot = {tagOf(key), static_cast<std::uint32_t>(nodes_.size()) + 1};
    keys_.push_back(key);
    foreignNodes_.push_back(node);
    nodes_.push_back(owned.release());
}

bool SymbolicExprTable::contains(const SymbolicExpr* node) const {
    return SymbolicExprTable::lookup(node) != invalidId;
}

SymbolicExprId SymbolicExprTable::lookup(const SymbolicExpr* node) const {
    // Another node may be where the remembered one was, so it is compared.
    if (node == lastAnswer_.candidate && *nodes_[lastAnswer_.id] == *node)
        return lastAnswer_.id;
    const std::uint32_t found = index_[probe(*node, keyOf(*node))].idAndOne;
    return found == 0 ? invalidId : found - 1;
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

SymbolicExprId SymbolicExprTable::internName(std::string_view text) {
    if (isPlain()) {
        const std::size_t position = probe(NodeKeys::ofText(text), [&](const SymbolicExpr& interned) {
            return interned.op() == SymbolicOp::String &&
                   static_cast<const detail::StringShape&>(interned).getName() == text;
        });
        if (const std::uint32_t known = index_[position].idAndOne; known != 0)
            return known - 1;
    }
    return SymbolicString(*this, std::string(text)).getId(*this);
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
