// The floor of normal forms: a sum of products over the truth table of a condition.
#pragma once

#include "benchmarks/floors/FlatTable.hpp"

#include <array>
#include <cstdint>
#include <vector>

namespace Floor {

/// Minimises conditions of comparisons between a name and an integer, joined by && || !.
///
/// The integers of the comparisons cut the values of each name into cells.  The truth table has a bit for each
/// combination of cells.  Each combination that holds and is not covered yet is grown to the largest box of all orders
/// of the names; then boxes that the others cover are dropped.
class FlatMinimiser {
public:
    explicit FlatMinimiser(FlatTable& table) : table_(table) {}

    /// Returns the record of the smaller condition; none where nothing fulfils it, and everything() where all does.
    std::uint32_t run(std::uint32_t condition);

    [[nodiscard]] static std::uint32_t everything() { return none - 1; }

    /// Comparisons in the last result.
    [[nodiscard]] std::size_t comparisons() const { return comparisons_; }

private:
    static constexpr std::size_t mostNames = 4;

    /// One of the integers, or all values between two of them.
    struct Cell {
        std::int64_t value; ///< one of its values
        bool isCut;
    };

    /// A name, its integers and its cells in order.
    struct Axis {
        std::uint32_t name = none;
        std::vector<std::int32_t> cuts;
        std::vector<Cell> cells;
        std::uint32_t stride = 0;
    };

    struct Box {
        std::array<std::uint32_t, mostNames> low{};
        std::array<std::uint32_t, mostNames> high{};
        std::size_t size = 0;
    };

    using Bits = std::vector<std::uint64_t>;

    void collect(std::uint32_t id);
    void layOut();
    void evaluate(std::uint32_t id, Bits& bits);
    void compare(const Record& record, Bits& bits) const;
    [[nodiscard]] std::size_t axisOf(std::uint32_t name);
    [[nodiscard]] bool isIn(const Bits& bits, const Box& box) const;
    [[nodiscard]] Box grown(std::size_t at) const;
    void mark(const Box& box, int change);
    [[nodiscard]] bool isCovered(const Box& box) const;
    [[nodiscard]] std::uint32_t written(const Box& box);
    void join(std::uint32_t& product, std::uint32_t comparison);

    [[nodiscard]] std::uint32_t integer(std::int32_t value) {
        return table_.intern(Kind::Integer, static_cast<std::uint32_t>(value), none);
    }

    template <class Use>
    bool eachRow(const Box& box, Use use) const;

    FlatTable& table_;
    std::array<Axis, mostNames> axes_;
    std::size_t names_ = 0;
    std::size_t points_ = 0;
    Bits holds_;
    std::vector<std::uint8_t> covers_; ///< boxes over each combination
    std::vector<Box> boxes_;
    std::vector<Bits> spare_;
    std::size_t comparisons_ = 0;
};

} // namespace Floor
