// Runs the operations of a prepared expression over blocks of rows.
//
// Method: the rows are taken in blocks, and each operation runs over a whole block before the next one does
// (ColumnLoops).  Its results are in a buffer that is free again after their last use, so that the buffers in use are
// as few as for a register allocation in one pass, and all of them stay in the cache.  Columns that lie like an array
// are read where they are, others are copied block by block. Cost: linear in the rows times the operations.
#include "base/eval/PreparedColumns.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <bit>
#include <cstring>
#include <stdexcept>
#include <string>

namespace VT {

namespace {

constexpr std::size_t bytesOf(ScalarType type) {
    return type == ScalarType::Bool ? sizeof(bool) : type == ScalarType::Int ? sizeof(std::int32_t) : sizeof(double);
}

/// Values of a column from a row on, at any address.
class Values {
public:
    Values(const ValueColumn& column, std::size_t first)
        : next_(static_cast<const std::byte*>(column.data) + static_cast<std::ptrdiff_t>(first) * column.stride),
          stride_(column.stride) {}

    template <class T>
    T next() {
        T value;
        std::memcpy(&value, next_, sizeof value);
        next_ += stride_;
        return value;
    }

private:
    const std::byte* next_;
    std::ptrdiff_t stride_;
};

template <class T>
void copyValues(const ValueColumn& column, std::size_t first, std::size_t rows, void* to) {
    auto* const out = static_cast<T*>(to);
    Values values(column, first);
    for (std::size_t i = 0; i < rows; ++i)
        out[i] = values.next<T>();
}

/// Any byte but 0 is true.
void copyTruths(const ValueColumn& column, std::size_t first, std::size_t rows, void* to) {
    auto* const out = static_cast<bool*>(to);
    Values values(column, first);
    for (std::size_t i = 0; i < rows; ++i)
        out[i] = values.next<unsigned char>() != 0;
}

void narrowValues(const ValueColumn& column, std::size_t first, std::size_t rows, void* to) {
    auto* const out = static_cast<std::int32_t*>(to);
    Values values(column, first);
    bool fits = true;
    for (std::size_t i = 0; i < rows; ++i) {
        const auto value = values.next<std::int64_t>();
        out[i] = static_cast<std::int32_t>(value);
        fits &= out[i] == value;
    }
    if (fits)
        return;
    Values again(column, first);
    for (std::size_t row = first;; ++row) {
        const auto value = again.next<std::int64_t>();
        if (static_cast<std::int32_t>(value) != value)
            throw std::range_error("the integer " + std::to_string(value) + " in row " + std::to_string(row) +
                                   " of a column does not fit 32 bits");
    }
}

/// Fills a block with one value.
template <class T>
void fill(std::byte* buffer, std::size_t rows, T value) {
    std::fill_n(reinterpret_cast<T*>(buffer), rows, value);
}

} // namespace

PreparedExprColumns::PreparedExprColumns(const PreparedExpr& expression, std::span<const ValueColumn> columns)
    : expression_(expression),
      buffers_(expression.cells_.size(), none),
      values_(expression.cells_.size()) {
    placeColumns(columns);
    placeOperations();
    constexpr std::size_t lineRows = sizeof(Line64) / sizeof(double);
    std::size_t rowBytes = bufferCount_ * sizeof(double) + bytesOf(resultType());
    for (const Source& source : sources_)
        rowBytes += bytesOf(expression_.types_[source.cell]);
    const std::size_t room = limits::blockBytes / rowBytes;
    blockRows_ = std::max(room / lineRows * lineRows, limits::minimumBlockRows);
    bufferLines_ = blockRows_ / lineRows | 1U;
    storage_.resize(bufferCount_ * bufferLines_);
    fillConstants();
}

ScalarType PreparedExprColumns::resultType() const noexcept {
    return expression_.types_[expression_.rootPlace_.at];
}

/// Finds what is read by the operations, or is the result: columns, and cells with one value for all rows.
void PreparedExprColumns::placeColumns(std::span<const ValueColumn> columns) {
    const std::size_t leaves = expression_.firstResult_;
    std::vector<bool> isRead(std::max<std::size_t>(leaves, 1));
    const auto read = [&](std::uint32_t cell) {
        if (cell < leaves)
            isRead[cell] = true;
    };
    for (const detail::Operation& operation : expression_.operations_) {
        if (operation.code != detail::endCode) {
            read(operation.left);
            read(operation.right);
        }
    }
    read(expression_.rootPlace_.at);
    for (std::size_t i = columns.size(); i > 0; --i) { // the last column of a slot counts
        const ValueColumn& column = columns[i - 1];
        const auto cell = static_cast<std::uint32_t>(column.slot);
        if (!isRead[cell])
            continue;
        isRead[cell] = false;
        const ScalarType type = expression_.types_[cell];
        const bool isArray = (column.type == ValueColumn::Type::Int32 || column.type == ValueColumn::Type::Double) &&
                             column.stride == static_cast<std::ptrdiff_t>(bytesOf(type)) &&
                             std::bit_cast<std::uintptr_t>(column.data) % bytesOf(type) == 0;
        if (!isArray)
            buffers_[cell] = bufferCount_++;
        sources_.push_back({&column, cell, isArray});
    }
    for (std::uint32_t cell = 0; cell < leaves; ++cell) {
        if (isRead[cell]) {
            buffers_[cell] = bufferCount_++;
            constants_.push_back(cell);
        }
    }
}

std::uint32_t PreparedExprColumns::takeBuffer() {
    if (free_.empty())
        return bufferCount_++;
    const std::uint32_t buffer = free_.back();
    free_.pop_back();
    return buffer;
}

/// Gives each operation a buffer for its results, but that of the root, which writes to the caller's room.
void PreparedExprColumns::placeOperations() {
    const auto first = static_cast<std::uint32_t>(expression_.firstResult_);
    const auto count = static_cast<std::uint32_t>(expression_.operations_.size() - 1);
    std::vector<std::uint32_t> lastUses(count);
    for (std::uint32_t i = 0; i < count; ++i) {
        for (const std::uint32_t cell : {expression_.operations_[i].left, expression_.operations_[i].right})
            if (cell >= first)
                lastUses[cell - first] = i;
    }
    const std::uint32_t root = expression_.rootPlace_.at;
    lines_.reserve(count);
    for (std::uint32_t i = 0; i < count; ++i) {
        const detail::Operation& operation = expression_.operations_[i];
        const std::uint32_t result = first + i;
        lines_.push_back({detail::columnLoop(operation.code, registers_), operation.left, operation.right, result});
        if (result != root)
            buffers_[result] = takeBuffer();
        // Only now, so that results never overlap operands.
        for (const std::uint32_t cell : {operation.left, operation.right}) {
            if (cell >= first && lastUses[cell - first] == i) {
                free_.push_back(buffers_[cell]);
                lastUses[cell - first] = none; // both operands may be one
            }
        }
    }
}

std::byte* PreparedExprColumns::buffer(std::uint32_t number) noexcept {
    return reinterpret_cast<std::byte*>(storage_.data() + number * bufferLines_);
}

void PreparedExprColumns::fillConstants() {
    for (std::uint32_t cell = 0; cell < buffers_.size(); ++cell)
        if (buffers_[cell] != none)
            values_[cell] = buffer(buffers_[cell]);
    for (const std::uint32_t cell : constants_) {
        const SymbolicScalar value(expression_.types_[cell], expression_.cells_[cell]);
        std::byte* const to = buffer(buffers_[cell]);
        if (value.type() == ScalarType::Bool)
            fill(to, blockRows_, value.getBool());
        else if (value.type() == ScalarType::Int)
            fill(to, blockRows_, value.getInt());
        else
            fill(to, blockRows_, value.getDouble());
    }
}

/// Makes the values of a column from row `first` on those of its cell.
void PreparedExprColumns::read(const Source& source, std::size_t first, std::size_t rows) {
    const ValueColumn& column = *source.column;
    if (source.isDirect) {
        values_[source.cell] =
            static_cast<const std::byte*>(column.data) + static_cast<std::ptrdiff_t>(first) * column.stride;
        return;
    }
    std::byte* const to = buffer(buffers_[source.cell]);
    switch (column.type) {
    case ValueColumn::Type::Bool:
        return copyTruths(column, first, rows, to);
    case ValueColumn::Type::Int32:
        return copyValues<std::int32_t>(column, first, rows, to);
    case ValueColumn::Type::Int64:
        return narrowValues(column, first, rows, to);
    case ValueColumn::Type::Double:
        return copyValues<double>(column, first, rows, to);
    }
}

void PreparedExprColumns::run(std::size_t rows, void* results) {
    const std::uint32_t root = expression_.rootPlace_.at;
    const ScalarType type = resultType();
    for (std::size_t first = 0; first < rows; first += blockRows_) {
        const std::size_t count = std::min(blockRows_, rows - first);
        std::byte* const out = static_cast<std::byte*>(results) + first * bytesOf(type);
        for (const Source& source : sources_)
            read(source, first, count);
        for (const Line& line : lines_) {
            void* const to = buffers_[line.result] == none ? out : buffer(buffers_[line.result]);
            line.loop(values_[line.left], values_[line.right], to, count);
        }
        if (root < expression_.firstResult_) // no operation
            std::memcpy(out, values_[root], count * bytesOf(type));
        if (type == ScalarType::Double)
            detail::makeVisible(reinterpret_cast<double*>(out), count, registers_);
    }
}

namespace {

ScalarType scalarTypeOf(ValueColumn::Type type) {
    switch (type) {
    case ValueColumn::Type::Bool:
        return ScalarType::Bool;
    case ValueColumn::Type::Double:
        return ScalarType::Double;
    default:
        return ScalarType::Int;
    }
}

} // namespace

void PreparedExpr::runMany(std::span<const ValueColumn> columns, std::size_t rows, const ResultRoom& room) {
    for (const ValueColumn& column : columns)
        if (column.slot >= slotCount())
            throw std::out_of_range("prepared expression: no such slot");
    const std::vector<Holding> held = holdings_;
    std::vector<std::size_t> taken;
    const auto restore = [&]() noexcept {
        giveUpValues(taken);
        for (const ValueColumn& column : columns)
            if (holdings_[column.slot] != held[column.slot])
                hold(column.slot, held[column.slot]);
    };
    try {
        for (const ValueColumn& column : columns)
            hold(column.slot, static_cast<Holding>(scalarTypeOf(column.type)));
        taken = emptySlots();
        takeValues(taken);
        settle();
        if (rootPlace_.isVector)
            throw std::invalid_argument("prepared expression: many values of a vector");
        PreparedExprColumns run(*this, columns);
        run.run(rows, room(run.resultType()));
    } catch (...) {
        restore();
        throw;
    }
    restore();
}

} // namespace VT
