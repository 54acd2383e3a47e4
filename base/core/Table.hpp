// The interning store of expression nodes.
#pragma once

#include "base/core/Arena.hpp"
#include "base/core/Node.hpp"

#include <boost/unordered_map.hpp>

#include <new>
#include <string>
#include <type_traits>
#include <vector>

namespace VT {

namespace detail {
template <class Node, SymbolicOp Op, class Payload>
class InternedNode;
}

/// Owns expression nodes and gives one identifier to one structure.  Nodes enter through their constructors and live as
/// long as the table.  Beside them stand value bindings of expressions, aliases of identifiers and the two truth
/// constants.
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
    /// The node of an identifier; nullptr for an identifier that is not of this table.
    virtual const SymbolicExpr* get(SymbolicExprId id) const;
    /// A new, empty table of the same kind, owned by the caller.
    virtual SymbolicExprTable* CreateSymbolicExprTable() const;

    /// Fills `out` with the identifiers of all nodes of an operator, in increasing order.  Scans the whole table.
    void lookup(const SymbolicOp& op, std::vector<SymbolicExprId>& out) const;

    /// Number of nodes; identifiers are the numbers below it.
    [[nodiscard]] std::size_t size() const noexcept { return nodes_.size(); }

    /// Whether an identifier is one of this table.
    [[nodiscard]] bool has(SymbolicExprId id) const noexcept { return id < nodes_.size(); }

    /// Interns "false" and then "true" and remembers them as the truth constants.  A second call changes nothing.
    void addBoolSymbols();

    /// The identifiers of the truth constants; all bits set before addBoolSymbols().
    [[nodiscard]] SymbolicExprId getIdTRUE() const noexcept { return trueId_; }

    [[nodiscard]] SymbolicExprId getIdFALSE() const noexcept { return falseId_; }

    /// Binds a value to an expression; a later binding replaces an earlier one.
    void registerValueId(SymbolicExprId exprId, SymbolicExprId valueId);
    void registerValueId(const std::string& name, SymbolicExprId valueId);
    void registerValue(const std::string& name, int value);
    /// The value bound to an expression, or the invalid identifier.
    [[nodiscard]] SymbolicExprId getValueId(SymbolicExprId exprId) const;

    /// Whether an identifier is the invalid one.
    [[nodiscard]] bool isUnsetValue(SymbolicExprId id) const noexcept { return id == invalidId_; }

    /// The integer bound to a name: a real value is truncated toward zero, at most to the bounds of int; a name without
    /// a binding, or bound to anything but a number, answers 2147483647.  Interns the name.
    int getValue(const std::string& name);

    /// Fills `symbols` with the text of every identifier below `id`, each once, in the order of first occurrence.
    /// Linear in the number of distinct nodes.
    void getSymbolsFromExpression(SymbolicExprId id, std::vector<std::string>& symbols) const;

    /// Records an alias of an identifier; the first alias stays.
    void insertAliasInfo(std::string identifier, std::string alias);
    /// The alias of an identifier, or the empty text.
    [[nodiscard]] std::string getAliasForSymbolicIdentifier(const std::string& identifier) const;

protected:
    enum class NodeStorage : unsigned char { Pooled, Heap };
    /// A derived table that keeps nodes itself asks for heap nodes, so that what reaches add() can be deleted.
    explicit SymbolicExprTable(NodeStorage storage);

private:
    template <class Node, SymbolicOp Op, class Payload>
    friend class detail::InternedNode;

    struct Slot {
        std::uint64_t hash;
        SymbolicExprId id; ///< invalidId marks a free slot
    };

    /// An interned answer, so that the lookup right behind a construction need not probe again.
    struct LastAnswer {
        const SymbolicExpr* node = nullptr;
        SymbolicExprId id = invalidId;
    };

    /// What an unsuccessful probe learned, so that the add right behind it need not hash and probe again.
    struct LastMiss {
        std::uint64_t hash = 0;
        std::size_t position = 0;
        const SymbolicExpr* node = nullptr;
    };

    struct Probe {
        std::uint64_t hash;
        std::size_t position;
        SymbolicExprId id;
    };
    class Adoption;

    template <class Node, class Payload>
    void intern(const SymbolicExpr& candidate, const Payload& payload);
    [[nodiscard]] Probe probe(const SymbolicExpr& node) const;
    [[nodiscard]] Probe probe(const SymbolicExpr& node, std::uint64_t hash) const;
    [[nodiscard]] std::size_t home(std::uint64_t hash) const noexcept;
    [[nodiscard]] std::size_t freePosition(std::uint64_t hash) const noexcept;
    void reserveOne();
    void growIndex();

    std::vector<Slot> index_; ///< open addressing, linear probing, a power of two of slots
    std::vector<const SymbolicExpr*> nodes_;
    boost::unordered_map<SymbolicExprId, SymbolicExprId> values_;
    boost::unordered_map<std::string, std::string> aliases_;
    SymbolicExprId invalidId_ = invalidId;
    SymbolicExprId trueId_ = invalidId;
    SymbolicExprId falseId_ = invalidId;

    Arena arena_;
    std::vector<const SymbolicExpr*> heapNodes_; ///< nodes that came from operator new
    NodeStorage storage_ = NodeStorage::Pooled;
    unsigned indexShift_ = 0;
    const SymbolicExpr* pooled_ = nullptr; ///< the arena node that is on its way into add()
    mutable LastAnswer lastAnswer_;
    mutable LastMiss lastMiss_;
};

/// Interns `candidate`, a node of class Node under construction, by adding a copy made from its payload unless an equal
/// node is there.
template <class Node, class Payload>
void SymbolicExprTable::intern(const SymbolicExpr& candidate, const Payload& payload) {
    if (contains(&candidate)) {
        if (!Node::equalWithinTolerance && storage_ == NodeStorage::Pooled)
            lastAnswer_.node = &candidate;
        return;
    }
    if (storage_ == NodeStorage::Heap) {
        add(new Node(payload));
        return;
    }
    void* place = arena_.allocate(sizeof(Node));
    const SymbolicExpr* copy = nullptr;
    try {
        copy = new (place) Node(payload);
    } catch (...) {
        arena_.release(place, sizeof(Node));
        throw;
    }
    pooled_ = copy;
    lastMiss_.node = lastMiss_.node == &candidate ? copy : nullptr;
    const std::size_t id = nodes_.size();
    add(copy);
    if (!Node::equalWithinTolerance && nodes_.size() > id)
        lastAnswer_ = {&candidate, id};
}

} // namespace VT
