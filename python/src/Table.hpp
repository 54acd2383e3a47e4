// The tables that Python objects name conditions and expressions of, and their exclusive use.
#pragma once

#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "base/decide/DimensionProofs.hpp"
#include "base/util/IdMap.hpp"

#include <pybind11/pybind11.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace vtsym::python {

namespace py = pybind11;
using VT::SymbolicExprId;

/// A table with a service of its own.  Python objects hold the table and an identifier, so that it lives as long as
/// they do.  Every member but the mutex is used under Brief or Lengthy.
///
/// Nodes are never freed.  A table that is full makes no more of them by combining: the caller goes on with the
/// successor, which knows the same assumptions, and the full one goes with the last object that holds it.
class Table {
public:
    Table(bool bits32, std::size_t capacity);

    [[nodiscard]] VT::VCService& service() noexcept { return service_; }

    [[nodiscard]] VT::SymbolicExprTable& nodes() noexcept { return service_.table(); }

    /// The identifier of a node.  Throws std::out_of_range for one that is not of the table.
    [[nodiscard]] SymbolicExprId checked(SymbolicExprId id);

    /// Whether nodes and kept decisions exceed the capacity.
    [[nodiscard]] bool isFull() noexcept { return nodes().size() + decisions_ > capacity_; }

    /// Counts decisions that the service keeps.
    void countDecisions(std::size_t count) noexcept { decisions_ += count; }

    /// A hash of the structure, the same in every table; equal expressions have equal hashes.  Linear in the
    /// distinct nodes that were not hashed before.
    std::uint64_t hashOf(SymbolicExprId id);

    /// What proves claims about dimensions; it assumes what the service does.
    VT::DimensionProofs& dimensionProofs();

    /// Assumes a condition in the service and in proofs of dimensions.
    void assume(SymbolicExprId condition);

    /// Adopts expressions of another table in this one; the mutexes of both are held.
    std::vector<SymbolicExprId> adopt(Table& source, std::span<const SymbolicExprId> ids);
    /// The table to go on with, with room for what is copied to it.  `mutex` is held.
    std::shared_ptr<Table> successor(SymbolicExprId first);

    std::mutex mutex;

private:
    struct Dimensions {
        explicit Dimensions(Table& table);

        VT::Decider decider;
        VT::Assumptions assumptions;
        VT::DimensionProofs proofs;
    };

    bool bits32_;
    std::size_t capacity_;
    std::size_t decisions_ = 0;
    VT::VCService service_;
    std::optional<Dimensions> dimensions_;
    VT::IdMap<std::uint64_t> hashes_;
    std::shared_ptr<Table> successor_; ///< until that one is full
};

/// Uses a table for a moment; Python waits.
class Brief {
public:
    explicit Brief(Table& table) : lock_(table.mutex, std::try_to_lock) {
        if (lock_.owns_lock())
            return;
        // Whoever has the table may need Python's lock to let it go.
        const py::gil_scoped_release release;
        lock_.lock();
    }

private:
    std::unique_lock<std::mutex> lock_;
};

/// Uses a table while other threads run Python.  No Python object may be touched.
class Lengthy {
public:
    explicit Lengthy(Table& table) : lock_(table.mutex) {}

private:
    py::gil_scoped_release release_;
    std::unique_lock<std::mutex> lock_;
};

} // namespace vtsym::python
