// The interning store of expression nodes: owns them and yields one identifier for one structure.
//
// Look-ups and additions are O(1) on average; Table.cpp describes the index.
#pragma once

#include "base/core/Cells.hpp"
#include "base/core/Node.hpp"
#include "base/core/NodeHash.hpp"
#include "base/util/Hash.hpp"
#include "base/util/PlainVector.hpp"

#include <boost/unordered_map.hpp>

#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <typeinfo>
#include <vector>

namespace VT {

namespace detail {
template <class Node, SymbolicOp Op, class Payload>
class InternedNode;
}

/// Owns expression nodes and gives one identifier to one structure.  Nodes enter through their constructors and live as
/// long as the table.  The table also holds value bindings of expressions, aliases of identifiers and the two truth
/// constants.
///
/// A table holds three thousand million nodes at most, and throws std::length_error for one more.
/// A derived class may keep its nodes elsewhere by overriding the virtual operations, through which all of the library
/// reaches them: constructors call contains() and add(), getId() calls lookup(), everything else calls get().
///
/// A table is used by one thread at a time; const operations may run concurrently while no thread interns.
class VTSYM_API SymbolicExprTable {
public:
    SymbolicExprTable();
    SymbolicExprTable(const SymbolicExprTable&) = delete;
    SymbolicExprTable& operator=(const SymbolicExprTable&) = delete;
    virtual ~SymbolicExprTable();

    /// Takes ownership of a node and gives it the next identifier.  A node equal to an interned one is kept, but never
    /// found. When memory runs out, the node is freed, the table is as before and std::bad_alloc passes.  Amortised
    /// O(1).
    virtual void add(const SymbolicExpr* node);
    /// Whether an equal node is interned.  O(1) on average.
    virtual bool contains(const SymbolicExpr* node) const;
    /// The identifier of the interned node equal to this one, or the invalid identifier.  A node that is itself in the
    /// table is found even where it equals nothing (NaN).  O(1) on average.
    virtual SymbolicExprId lookup(const SymbolicExpr* node) const;
    /// The node of an identifier; nullptr for an identifier that is not of this table, which holds for every override
    /// too.  The node stays where it is as long as the table lives.  O(1).
    virtual const SymbolicExpr* get(SymbolicExprId id) const;
    /// A new, empty table of the same kind, owned by the caller.
    virtual SymbolicExprTable* CreateSymbolicExprTable() const;

    /// Fills `out` with the identifiers of all nodes of an operator, in increasing order.  Scans the whole table; a
    /// derived class provides the nodes 0, 1, ... up to the first one that it does not have.
    void lookup(const SymbolicOp& op, std::vector<SymbolicExprId>& out) const;

    /// Number of nodes in the table's own storage; where no derived class keeps nodes elsewhere, identifiers are the
    /// numbers below it.
    [[nodiscard]] std::size_t size() const noexcept { return nodes_.size(); }

    /// Whether the virtual operations are this class's own, so that they need not be called.
    [[nodiscard]] bool isPlain() const { return typeid(*this) == typeid(SymbolicExprTable); }

    /// The key of a node in the table's own storage (NodeHash.hpp): mostly its operator and operands, without a look at
    /// the node.
    [[nodiscard]] std::uint64_t keyAt(SymbolicExprId id) const noexcept { return keys_[id]; }

    /// Whether an identifier is one of this table.
    [[nodiscard]] bool has(SymbolicExprId id) const { return isPlain() ? id < nodes_.size() : get(id) != nullptr; }

    /// Whether there is a node for `operand`, an operand of the node `id`.  In the table's own
    /// storage operands are older than their nodes, so that nothing leads in a circle: an operand whose identifier is
    /// not below its node's counts as missing.  Elsewhere, and for a node that is not interned and has the invalid
    /// identifier, every node of the table will do.
    [[nodiscard]] bool hasOperand(SymbolicExprId id, SymbolicExprId operand) const {
        if (!isPlain() && (id >= nodes_.size() || nodes_[id] != get(id)))
            return has(operand);
        return operand < id && has(operand);
    }

    /// Interns an identifier and returns what the constructor of SymbolicString and getId() return.  Makes no copy of a
    /// text that is there.
    SymbolicExprId internName(std::string_view text);

    /// Interns "false" and then "true" and remembers them as the truth constants.  A second call changes nothing.
    void addBoolSymbols();

    /// The identifiers of the truth constants; all bits set before addBoolSymbols().
    [[nodiscard]] SymbolicExprId getIdTRUE() const noexcept { return trueId_; }

    [[nodiscard]] SymbolicExprId getIdFALSE() const noexcept { return falseId_; }

    /// Binds a value to an expression; a later binding replaces an earlier one.  What was simplified and kept before,
    /// such as results in the caches of the condition service, does not see it.
    void registerValueId(SymbolicExprId exprId, SymbolicExprId valueId);
    void registerValueId(const std::string& name, SymbolicExprId valueId);
    void registerValue(const std::string& name, int value);
    /// The value bound to an expression, or the invalid identifier.
    [[nodiscard]] SymbolicExprId getValueId(SymbolicExprId exprId) const;

    /// Whether an identifier is the invalid one.
    [[nodiscard]] bool isUnsetValue(SymbolicExprId id) const noexcept { return id == invalidId_; }

    /// The integer bound to a name: a real value is truncated toward zero, at most to the bounds of int; for a name
    /// without a binding, or bound to anything but a number, 2147483647.  Interns the name.
    int getValue(const std::string& name);

    /// Fills `symbols` with the text of every identifier below `id`, each once, in the order of first occurrence.
    /// Linear in the number of distinct nodes.
    void getSymbolsFromExpression(SymbolicExprId id, std::vector<std::string>& symbols) const;

    /// Records an alias of an identifier; the first alias stays.
    void insertAliasInfo(std::string identifier, std::string alias);
    /// The alias of an identifier, or the empty text.
    [[nodiscard]] std::string getAliasForSymbolicIdentifier(const std::string& identifier) const;

    /// Number of identifiers with an alias.  Aliases neither change nor go, so equal numbers mean equal aliases.
    [[nodiscard]] std::size_t aliasCount() const noexcept { return aliases_.size(); }

private:
    template <class Node, SymbolicOp Op, class Payload>
    friend class detail::InternedNode;

    /// The hash of a node's key is what chooses the slot, so that a larger index is filled without hashing anew.
    struct Slot {
        std::uint32_t tag = 0;
        std::uint32_t idAndOne = 0; ///< 0 marks a free slot
    };

    /// What a constructor found or added, so that the lookup right after it need not probe again.  Kept for classes in
    /// which equal nodes have equal hashes.
    struct LastAnswer {
        const SymbolicExpr* candidate = nullptr;
        std::uint32_t id = 0;
    };

    template <class Node, class Payload>
    void intern(const Payload& candidate);
    template <class Node, class Payload>
    std::uint32_t place(const Payload& candidate, std::uint64_t key, Slot* slot);
    template <class Node, class Payload>
    [[nodiscard]] SymbolicExprId idOf(const Payload& node) const;

    /// A hash of two multiplications, different in each process.
    [[nodiscard]] std::uint32_t tagOf(std::uint64_t key) const noexcept {
        key = (key ^ seed_) * 0xd6e8feb86659fd93U;
        return static_cast<std::uint32_t>(((key ^ key >> 32U) * spread) >> 32U);
    }

    /// NaN literals have one hash and equal nothing, so each is found by its address alone.
    [[nodiscard]] static std::uint64_t addressKey(const SymbolicExpr& node) noexcept {
        return NodeKeys::inexact(reinterpret_cast<std::uintptr_t>(&node));
    }

    [[nodiscard]] static std::uint64_t keyOf(const SymbolicExpr& node);

    template <class Equal>
    [[nodiscard]] std::size_t probe(std::uint64_t key, Equal equal) const {
        return probe(key, tagOf(key), equal);
    }

    template <class Equal>
    [[nodiscard]] std::size_t probe(std::uint64_t key, std::uint32_t tag, Equal equal) const;
    [[nodiscard]] std::size_t probe(const SymbolicExpr& node, std::uint64_t key) const;
    [[nodiscard]] static bool equalNodes(const SymbolicExpr& interned, const SymbolicExpr& node);

    [[nodiscard]] bool isFull() const noexcept { return nodes_.size() == room_; }

    void reserveOne();
    void growIndex();

    std::vector<Slot> index_;         ///< open addressing, linear probing, a power of two of slots
    PlainVector<std::uint64_t> keys_; ///< by identifier
    PlainVector<const SymbolicExpr*> nodes_;
    boost::unordered_map<SymbolicExprId, SymbolicExprId> values_;
    boost::unordered_map<std::string, std::string> aliases_;
    SymbolicExprId invalidId_ = invalidId;
    SymbolicExprId trueId_ = invalidId;
    SymbolicExprId falseId_ = invalidId;

    std::size_t room_ = 0; ///< nodes for which there is room in keys_, nodes_ and the index
    CellStore cells_;
    std::vector<const SymbolicExpr*> foreignNodes_; ///< those that came through add(), in the order of addition
    unsigned indexShift_;
    std::uint64_t seed_ = processSeed();
    LastAnswer lastAnswer_;
};

/// Returns the position of the slot of a node of this key for which `equal(node)` holds, or of the free slot where it
/// would go.  Nodes of an exact key are equal.
template <class Equal>
std::size_t SymbolicExprTable::probe(std::uint64_t key, std::uint32_t tag, Equal equal) const {
    const std::size_t mask = index_.size() - 1;
    for (std::size_t at = std::size_t{tag} >> indexShift_;; at = (at + 1) & mask) {
        const Slot& slot = index_[at];
        if (slot.idAndOne == 0)
            return at;
        if (slot.tag == tag && keys_[slot.idAndOne - 1] == key &&
            (NodeKeys::isExact(key) || equal(*nodes_[slot.idAndOne - 1])))
            return at;
    }
}

/// Interns `candidate`, a node of class Node under construction, by adding a copy unless an equal node is there.
template <class Node, class Payload>
void SymbolicExprTable::intern(const Payload& candidate) {
    if (!isPlain()) [[unlikely]] {
        // The class of the candidate is not complete yet, and a host may do with a node what it likes.
        std::unique_ptr<const Node> node(new Node(candidate));
        if (!contains(node.get()))
            add(node.release());
        return;
    }
    const std::uint64_t key = candidate.keyOf(Node::code);
    const std::uint32_t tag = tagOf(key);
    Slot* slot = &index_[probe(key, tag, [&](const SymbolicExpr& interned) {
        if constexpr (Node::equalWithinTolerance)
            return equalNodes(interned, candidate);
        else
            return interned == static_cast<const SymbolicExpr&>(candidate);
    })];
    std::uint32_t id = slot->idAndOne - 1;
    if (slot->idAndOne == 0) {
        // A copy, without a call: a processor looks ahead at the slots of the next nodes only as far as few
        // instructions lead it.
        if (isFull()) [[unlikely]] {
            reserveOne();
            slot = &index_[probe(key, tag, [](const SymbolicExpr&) { return false; })];
        }
        id = place<Node>(candidate, key, slot);
    }
    lastAnswer_ = {Node::equalWithinTolerance ? nullptr : &candidate, id};
}

/// Adds a copy of `candidate`, for which there is room, in the free slot of its key.
template <class Node, class Payload>
inline std::uint32_t SymbolicExprTable::place(const Payload& candidate, std::uint64_t key, Slot* slot) {
    void* const cell = cells_.allocate(sizeof(Node));
    const SymbolicExpr* node = nullptr;
    try {
        node = new (cell) Node(candidate);
    } catch (...) {
        cells_.release(cell);
        throw;
    }
    if constexpr (Node::equalWithinTolerance) {
        if (!candidate.hasParts(candidate)) {
            key = addressKey(*node);
            slot = &index_[probe(key, [](const SymbolicExpr&) { return false; })];
        }
    }
    const auto id = static_cast<std::uint32_t>(nodes_.size());
    *slot = {tagOf(key), id + 1};
    keys_.append(key);
    nodes_.append(node);
    return id;
}

/// The identifier of a node of class Node that was made by one of its constructors.
template <class Node, class Payload>
SymbolicExprId SymbolicExprTable::idOf(const Payload& node) const {
    // Another node may be where the remembered one was, so it is compared, which is cheaper than probing.
    if constexpr (!Node::equalWithinTolerance) {
        if (lastAnswer_.candidate == &node) {
            if constexpr (Node::hasExactKeys) {
                if (const std::uint64_t key = node.keyOf(Node::code);
                    NodeKeys::isExact(key) && keys_[lastAnswer_.id] == key)
                    return lastAnswer_.id;
            }
            if (*nodes_[lastAnswer_.id] == static_cast<const SymbolicExpr&>(node))
                return lastAnswer_.id;
        }
    }
    return lookup(&node);
}

} // namespace VT
