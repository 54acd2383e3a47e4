// A prepared expression over columns of values.
#pragma once

#include "base/eval/ColumnLoops.hpp"
#include "base/eval/Prepared.hpp"

#include <span>
#include <vector>

namespace VT {

/// Runs the operations of an expression over blocks of rows.  The expression is settled for the types of the columns,
/// is not a vector, and outlives the object, as do the columns.
class PreparedExprColumns {
public:
    PreparedExprColumns(const PreparedExpr& expression, std::span<const ValueColumn> columns);

    [[nodiscard]] ScalarType resultType() const noexcept;

    /// Writes the result of each row.  Throws std::range_error as PreparedExpr::runMany() does.
    void run(std::size_t rows, void* results);

private:
    /// An operation on buffers.
    struct Line {
        detail::ColumnLoop loop;
        std::uint32_t left; ///< cells
        std::uint32_t right;
        std::uint32_t result;
    };

    /// A column and the cell of its slot.
    struct Source {
        const ValueColumn* column;
        std::uint32_t cell;
        bool isDirect; ///< operators can read it where it is
    };

    /// A cell without a buffer.
    static constexpr std::uint32_t none = ~std::uint32_t{0};

    void placeColumns(std::span<const ValueColumn> columns);
    void placeOperations();
    std::uint32_t takeBuffer();
    void fillConstants();
    void read(const Source& source, std::size_t first, std::size_t rows);
    [[nodiscard]] std::byte* buffer(std::uint32_t number) noexcept;

    const PreparedExpr& expression_;
    detail::Registers registers_ = detail::widestRegisters();
    std::vector<Source> sources_;
    std::vector<Line> lines_;
    std::vector<std::uint32_t> buffers_;   ///< numbers, by cell
    std::vector<const void*> values_;      ///< of the block, by cell
    std::vector<std::uint32_t> constants_; ///< cells with one value for all rows
    std::vector<std::uint32_t> free_;
    std::uint32_t bufferCount_ = 0;

    /// A piece of storage that every loop's values are aligned in.
    struct alignas(64) Line64 {
        std::byte bytes[64];
    };

    std::size_t blockRows_ = 0;
    /// Of a buffer: an odd number, so that equal rows of no two buffers are as far apart as a page or half of it, which
    /// a processor takes for one place when it compares loads with the stores before them.
    std::size_t bufferLines_ = 0;
    std::vector<Line64> storage_;
};

} // namespace VT
