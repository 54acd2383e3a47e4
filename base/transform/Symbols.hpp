// The symbols that an expression mentions.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/util/IdMap.hpp"

#include <string>
#include <vector>

namespace VT {

/// Collects symbols of one table in the order of their first occurrence, operands from left to right.  Every identifier
/// is a symbol, the names of functions and the constants "true" and "false" too; the names of members are not.
///
/// A collector remembers what it visited: a further call adds only what the calls before did not meet.  When a call
/// throws, the list is as it was and the collector is of no further use.  The table outlives it.
class VTSYM_API SymbolsOfSymbolicExpr {
public:
    explicit SymbolsOfSymbolicExpr(const SymbolicExprTable& table) : table_(table) {}

    SymbolsOfSymbolicExpr(const SymbolsOfSymbolicExpr&) = delete;
    SymbolsOfSymbolicExpr& operator=(const SymbolsOfSymbolicExpr&) = delete;
    virtual ~SymbolsOfSymbolicExpr();

    /// Appends the names of the symbols below and including `id`; none for an identifier that is not of the table.
    /// Linear in the number of edges between distinct nodes.
    virtual void getSymbols(SymbolicExprId id, std::vector<std::string>& names);
    /// The same as identifiers.
    virtual void getSymbolIds(SymbolicExprId id, std::vector<SymbolicExprId>& ids);

protected:
    [[nodiscard]] const SymbolicExprTable& table() const noexcept { return table_; }

    /// Takes note of a node; whether it is met for the first time.
    bool enter(SymbolicExprId id);

private:
    const SymbolicExprTable& table_;
    IdMap<bool> visited_;
};

/// Collects the symbols of expressions of one table, each call for itself.
class VTSYM_API SymbolicExprSymbols {
public:
    /// The table outlives the driver.
    explicit SymbolicExprSymbols(const SymbolicExprTable& table) : table_(table) {}

    SymbolicExprSymbols(const SymbolicExprSymbols&) = delete;
    SymbolicExprSymbols& operator=(const SymbolicExprSymbols&) = delete;
    virtual ~SymbolicExprSymbols();

    /// Appends the names of the symbols of an expression, each once; see SymbolsOfSymbolicExpr.
    virtual void operator()(SymbolicExprId id, std::vector<std::string>& names) const;
    /// The same as identifiers.
    void operator()(SymbolicExprId id, std::vector<SymbolicExprId>& ids) const;

private:
    const SymbolicExprTable& table_;
};

} // namespace VT
