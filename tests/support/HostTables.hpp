// Tables as hosts derive them, graphs in which operands are missing or lead in circles, and how to walk them, said once
// more by recursion.
#pragma once

#include "base/core/Nodes.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <memory>
#include <random>
#include <string>
#include <unordered_map>
#include <vector>

namespace VT::Testing {

/// A table that keeps its nodes itself, under identifiers of its own making; the base's storage stays empty.
class HostTable final : public SymbolicExprTable {
public:
    enum class Numbering { Dense, Descending, Far };

    explicit HostTable(Numbering numbering = Numbering::Dense) : numbering_(numbering) {}

    void add(const SymbolicExpr* node) override {
        const SymbolicExprId id = idAt(kept_.size());
        kept_.emplace_back(node);
        byId_.emplace(id, node);
        byHash_.emplace(node->getHash(), id);
    }

    bool contains(const SymbolicExpr* node) const override { return HostTable::lookup(node) != invalidId; }

    SymbolicExprId lookup(const SymbolicExpr* node) const override {
        const auto [begin, end] = byHash_.equal_range(node->getHash());
        const auto found = std::find_if(begin, end, [&](const auto& entry) {
            const SymbolicExpr* const known = byId_.at(entry.second);
            return known == node || *known == *node;
        });
        return found == end ? invalidId : found->second;
    }

    using SymbolicExprTable::lookup;

    const SymbolicExpr* get(SymbolicExprId id) const override {
        const auto found = byId_.find(id);
        return found == byId_.end() ? nullptr : found->second;
    }

    SymbolicExprTable* CreateSymbolicExprTable() const override { return new HostTable(numbering_); }

    [[nodiscard]] SymbolicExprId idAt(std::size_t position) const {
        constexpr SymbolicExprId million = 1'000'000;
        if (numbering_ == Numbering::Descending)
            return million - position;
        return numbering_ == Numbering::Far ? invalidId - 1 - position * million * million : position;
    }

    [[nodiscard]] std::size_t count() const { return kept_.size(); }

private:
    Numbering numbering_;
    std::vector<std::unique_ptr<const SymbolicExpr>> kept_;
    std::unordered_map<SymbolicExprId, const SymbolicExpr*> byId_;
    std::unordered_multimap<std::uint64_t, SymbolicExprId> byHash_;
};

/// A table derived from the library's that leaves the storage to it.
class DerivedTable final : public SymbolicExprTable {
public:
    const SymbolicExpr* get(SymbolicExprId id) const override { return SymbolicExprTable::get(id); }
};

/// A table of any kind, with what is known of how it numbers its nodes.
class NumberedTable {
public:
    explicit NumberedTable(SymbolicExprTable* table) : table_(table), host_(dynamic_cast<HostTable*>(table)) {}

    SymbolicExprTable& table() { return *table_; }

    /// The identifier of the node that was or will be added at a position.
    [[nodiscard]] SymbolicExprId idAt(std::size_t position) const { return host_ ? host_->idAt(position) : position; }

    [[nodiscard]] std::size_t count() const { return host_ ? host_->count() : table_->size(); }

    /// Whether the library keeps the nodes.
    [[nodiscard]] bool isOrdered() const { return host_ == nullptr; }

private:
    std::unique_ptr<SymbolicExprTable> table_;
    const HostTable* host_;
};

/// One empty table of each kind.
inline std::vector<std::unique_ptr<NumberedTable>> tablesOfEachKind() {
    using Numbering = HostTable::Numbering;
    std::vector<std::unique_ptr<NumberedTable>> tables;
    tables.push_back(std::make_unique<NumberedTable>(new SymbolicExprTable));
    tables.push_back(std::make_unique<NumberedTable>(new DerivedTable));
    for (const auto numbering : {Numbering::Dense, Numbering::Descending, Numbering::Far})
        tables.push_back(std::make_unique<NumberedTable>(new HostTable(numbering)));
    return tables;
}

/// Fills a table with so many random nodes of all classes.  Some operands name no node, their own node or a later one
/// among these.
inline void addBrokenGraph(std::mt19937_64& random, NumberedTable& into, std::size_t nodes) {
    const std::vector<double> reals{0.5, -0.0, 2, std::numeric_limits<double>::quiet_NaN()};
    while (into.count() < nodes) {
        const bool leaf = into.count() == 0 || random() % 3 == 0;
        const auto op = static_cast<SymbolicOp>(leaf ? random() % 3 : 3 + random() % (operatorCount - 3));
        NodeParts parts{
            std::string(1, "abcxyz"[random() % 6]), static_cast<int>(random() % 4), reals[random() % 4], {}};
        for (std::size_t left = operandCount(op).value_or(random() % 4); left > 0; --left) {
            const std::size_t kind = random() % 16;
            parts.inputs.push_back(kind == 0   ? invalidId
                                   : kind == 1 ? into.idAt(into.count() + 100'000)
                                   : kind < 4  ? into.idAt(into.count() + random() % (nodes - into.count()))
                                               : into.idAt(random() % into.count()));
        }
        makeAny(into.table(), op, parts);
    }
}

/// Calls `check(table, ids)` for random graphs of so many nodes in tables of each kind.
template <class Check>
void forBrokenGraphs(std::uint64_t seed, int rounds, std::size_t nodes, Check check) {
    std::mt19937_64 random(seed);
    for (int round = 0; round < rounds; ++round) {
        for (const auto& table : tablesOfEachKind()) {
            addBrokenGraph(random, *table, nodes);
            std::vector<SymbolicExprId> ids;
            for (std::size_t position = 0; position < table->count(); ++position)
                ids.push_back(table->idAt(position));
            check(*table, ids);
            if (::testing::Test::HasFailure())
                return;
        }
    }
}

/// A walk by recursion: calls `visit(node)` for every occurrence of a node below and including one, and `missing()` for
/// every operand that is missing.  False where there are more than so many occurrences.
template <class Visit, class Missing>
class Recursion {
public:
    Recursion(NumberedTable& table, bool bottomUp, Visit visit, Missing missing, std::size_t most = 2000)
        : table_(table),
          bottomUp_(bottomUp),
          visit_(visit),
          missing_(missing),
          left_(most) {}

    bool operator()(SymbolicExprId id) { // NOLINT(misc-no-recursion): small trees only
        const SymbolicExpr& node = *table_.table().get(id);
        if (left_ == 0)
            return false;
        --left_;
        path_.push_back(id);
        if (!bottomUp_)
            visit_(node);
        for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
            const SymbolicExprId operand = node.getInput(i);
            const bool refused = table_.isOrdered() ? operand >= id : std::ranges::count(path_, operand) > 0;
            if (table_.table().get(operand) == nullptr || refused)
                missing_();
            else if (!(*this)(operand))
                return false;
        }
        if (bottomUp_)
            visit_(node);
        path_.pop_back();
        return true;
    }

private:
    NumberedTable& table_;
    bool bottomUp_;
    Visit visit_;
    Missing missing_;
    std::size_t left_;
    std::vector<SymbolicExprId> path_;
};

} // namespace VT::Testing
