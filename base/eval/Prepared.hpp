// An expression made ready for many evaluations.
#pragma once

#include "base/core/Table.hpp"
#include "base/eval/Execute.hpp"
#include "base/eval/Values.hpp"

#include <boost/unordered_map.hpp>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace VT {

/// The values of one slot for many evaluations, one for each row.
struct ValueColumn {
    enum class Type : std::uint8_t { Bool, Int32, Int64, Double };

    std::size_t slot = 0;
    Type type = Type::Int32;
    const void* data =
        nullptr;               ///< the value of row 0: a byte, an integer of 32 or 64 bits, or a double, at any address
    std::ptrdiff_t stride = 0; ///< bytes from the value of a row to that of the next one; any number
};

/// An expression as a list of operations over one array of untagged cells.
///
///     PreparedExpr area = SymbolicExprEval(table).prepare(id);
///     const std::size_t width = area.slotOf("W").value();
///     area.setInt(width, 3);
///     const SymbolicValue value = area.run();
///
/// Every symbol of the expression but "true" and "false", and every member, has a slot.  A slot that is not set takes
/// the value that its symbol has in the table when run() first needs it.  run() returns what SymbolicExprEval::eval()
/// would return with those values bound, bit for bit.
///
/// Types are settled when run() first sees them and then cost nothing.  A value of another type than the slot's last
/// one lets the next run choose all operations by their types anew; a scalar in the place of a vector, or a vector of
/// another length, lets it lay them out anew.  Both are linear in the operations, one for each operator and element.
///
/// A copy is independent.  An object is used by one thread at a time; its table outlives it.
class VTSYM_API PreparedExpr {
public:
    /// Number of slots; they are numbered from 0 in the order in which their symbols first occur.
    [[nodiscard]] std::size_t slotCount() const noexcept { return symbols_.size(); }

    /// The symbol, or member, of a slot.
    [[nodiscard]] SymbolicExprId symbol(std::size_t slot) const { return symbols_.at(slot); }

    /// The slot of a symbol or member; nothing where the expression has no such symbol.  O(1) on average.
    [[nodiscard]] std::optional<std::size_t> slotOf(SymbolicExprId symbol) const;
    /// The slot of a symbol by its name.
    [[nodiscard]] std::optional<std::size_t> slotOf(const std::string& name) const;

    /// Sets the value of a slot.  Throws std::out_of_range for a number that is not a slot's.
    void setBool(std::size_t slot, bool value) { setScalar(slot, value); }

    void setInt(std::size_t slot, std::int32_t value) { setScalar(slot, value); }

    void setDouble(std::size_t slot, double value) { setScalar(slot, value); }

    void set(std::size_t slot, const SymbolicValue& value);

    /// The value of the expression.  Throws "Vantor:SymbolicDims:UnboundSymbol" or ":CyclicValue" for a slot that was
    /// not set and cannot take a value from the table, ":SizeMismatch" and ":NotEvaluable" where vectors do not fit,
    /// and std::length_error beyond limits::evaluatedElements.  After an exception the slots are as
    /// before: those that were not set ask the table again.  Of several faults it may name another one than
    /// SymbolicExprEval::eval().
    [[nodiscard]] SymbolicValue run();

    /// Receives the type of the results and returns room for one of each row, aligned for it: bytes that become 0 or 1,
    /// integers of 32 bits, or doubles.
    using ResultRoom = std::function<void*(ScalarType type)>;

    /// The values of the expression for many rows: what run() would return with the values of each row set.  A slot
    /// without a column has the same value in all rows: the one that it holds, or that of its symbol in the table.  Of
    /// two columns of a slot the later one counts.
    ///
    /// Columns are read where they are.  Works on blocks of rows that fit the processor's cache, operator by operator;
    /// beside the results it takes limits::blockBytes, or what an expression with very many values at once needs for
    /// blocks of a few rows.
    ///
    /// Throws what run() throws; std::out_of_range for a column without a slot, std::invalid_argument for an expression
    /// that is a vector, and std::range_error for an integer beyond 32 bits, after which the results are unspecified.
    /// The slots hold what they held, in any case.
    void runMany(std::span<const ValueColumn> columns, std::size_t rows, const ResultRoom& room);

private:
    friend class SymbolicExprEval;
    friend class PreparedExprLayout;
    friend class PreparedExprColumns;

    PreparedExpr(const SymbolicExprTable& table, SymbolicExprId id);

    /// What a slot holds: a scalar (numbered like ScalarType), a vector, or nothing.
    enum class Holding : std::uint8_t { Bool, Int, Double, Vector, Nothing };

    /// Where a value comes from: a slot, a constant or a step, by number.
    struct Source {
        enum class Kind : std::uint8_t { Slot, Constant, Step } kind = Kind::Constant;
        std::uint32_t number = 0;
    };

    /// An operator or a list in the order of evaluation; its operands are `count` sources from `first` on.
    struct Step {
        SymbolicExprId id;
        std::uint32_t first;
        std::uint32_t count;
        ScalarRuleIndex rule; ///< None for a list
    };

    /// Where a value is: the cell of a scalar, or where the list of a vector's cells begins.
    struct Place {
        std::uint32_t at = 0;
        std::uint32_t length = 0;
        bool isVector = false;
    };

    template <class T>
    void setScalar(std::size_t slot, T value) {
        constexpr ScalarType type = detail::typeOf<T>;
        if (slot >= holdings_.size() || holdings_[slot] != static_cast<Holding>(type)) [[unlikely]]
            hold(slot, static_cast<Holding>(type));
        cells_[slot] = detail::cellOf(value);
    }

    void hold(std::size_t slot, Holding holding);
    void setVector(std::size_t slot, const SymbolicValue::Elements& elements);
    [[nodiscard]] Source sourceOf(SymbolicExprId id, const SymbolicExpr& node);
    [[nodiscard]] std::vector<std::size_t> emptySlots() const;
    void takeValues(const std::vector<std::size_t>& slots);
    void giveUpValues(const std::vector<std::size_t>& slots) noexcept;
    [[nodiscard]] SymbolicValue runFirst();
    [[nodiscard]] SymbolicValue compute();
    void settle();
    void settleTypes();
    [[nodiscard]] SymbolicValue result() const;

    const SymbolicExprTable* table_;

    // The expression, whatever its symbols hold.
    std::vector<SymbolicExprId> symbols_;
    boost::unordered_map<SymbolicExprId, std::size_t> slots_;
    std::vector<SymbolicScalar> constants_;
    std::vector<Source> operands_;
    std::vector<Step> steps_;
    Source root_;

    // The slots.
    std::vector<Holding> holdings_;
    std::vector<SymbolicValue::Elements> vectors_; ///< what slots with a vector hold; empty while there was none
    bool complete_ = false;                        ///< no slot holds nothing

    // The operations for the shapes and types of what the slots hold.
    bool laidOut_ = false;
    bool settled_ = false;
    std::vector<ScalarCell> cells_; ///< of the slots, of constants and elements, and of the results
    std::vector<ScalarType> types_; ///< of the cells
    std::vector<detail::Operation> operations_;
    std::size_t firstResult_ = 0;
    std::vector<Place> slotPlaces_;
    std::vector<std::uint32_t> vectorCells_; ///< of vectors, one after the other
    Place rootPlace_;
};

} // namespace VT
