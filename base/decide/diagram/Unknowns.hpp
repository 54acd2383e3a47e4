// The unknowns of conditions, the quantities that comparisons restrict, and their order.
//
// A diagram must not depend on what was interned or asked before, so quantities are ordered by text, never by number.
// The order of unknowns is kept in a tree (one text comparison for each level when an unknown is met for the first
// time) with labels of 64 bits that leave gaps, so that two quantities are compared as numbers; when a gap is full the
// labels around it are dealt anew, which changes no order.
#pragma once

#include "base/core/Table.hpp"
#include "base/integer/LinearForm.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/util/IdMap.hpp"

#include <boost/unordered_map.hpp>

#include <cstdint>
#include <set>
#include <utility>
#include <vector>

namespace VT {

/// Something that a diagram branches on: an unknown, or the difference of two.
using Quantity = std::uint32_t;

inline constexpr Unknown noUnknown = ~Unknown{0};

enum class UnknownKind : std::uint8_t {
    Simulation, ///< the variant keywords in force: 1 in simulation, 0 in generated code
    Free,       ///< a symbol, a call, a member
    Term,       ///< arithmetic whose value follows from other unknowns
    Sum,        ///< a sum of multiples of unknowns
};

struct UnknownInfo {
    UnknownKind kind;
    SymbolicExprId node; ///< of a free unknown or a term
    LinearParts sum;     ///< of a sum: no common divisor, the first part by text positive
    std::int64_t low;    ///< no value of the unknown is below
    std::int64_t high;   ///< or above
    std::int64_t mask;   ///< every value is made of these bits; 0 where nothing is known
    std::uint64_t label; ///< grows in the order of unknowns
    Quantity quantity;   ///< the unknown as a quantity

    /// Whether the value follows from those of free unknowns.
    [[nodiscard]] bool isComputed() const noexcept { return kind == UnknownKind::Term || kind == UnknownKind::Sum; }
};

struct QuantityInfo {
    Unknown plus;
    Unknown minus; ///< subtracted, or noUnknown; comes before `plus`
    std::int64_t low;
    std::int64_t high;

    [[nodiscard]] bool isDifference() const noexcept { return minus != noUnknown; }
};

class Unknowns {
public:
    /// @param low,high  what every free unknown is bounded to
    Unknowns(const SymbolicExprTable& table, const SymbolicExprPrinter& printer, std::int64_t low, std::int64_t high);

    Unknown simulation();
    Unknown free(SymbolicExprId node);
    /// @param low,high  bounds that hold for every value of the term
    Unknown term(SymbolicExprId node, std::int64_t low, std::int64_t high);

    /// Tells that every value of a term is made of the bits of a mask.
    void setMask(Unknown term, std::int64_t mask) { unknowns_[term].mask = mask; }

    /// The sum of the parts, which have no common divisor, and whether it is the sum as given or its opposite.
    std::pair<Unknown, bool> sum(const LinearParts& parts);
    /// a - b, or b - a and true: the one that comes later by text minus the other.
    std::pair<Quantity, bool> difference(Unknown a, Unknown b);

    [[nodiscard]] const UnknownInfo& operator[](Unknown unknown) const { return unknowns_[unknown]; }

    [[nodiscard]] const QuantityInfo& quantity(Quantity quantity) const { return quantities_[quantity]; }

    /// Whether an unknown comes before another.
    [[nodiscard]] bool before(Unknown a, Unknown b) const { return unknowns_[a].label < unknowns_[b].label; }

    /// The order of quantities: a difference stands right behind the later of its unknowns.
    using Key = std::pair<std::uint64_t, std::uint64_t>;

    [[nodiscard]] Key key(Quantity quantity) const {
        const QuantityInfo& info = quantities_[quantity];
        return {unknowns_[info.plus].label, info.isDifference() ? unknowns_[info.minus].label : 0};
    }

    [[nodiscard]] std::size_t size() const noexcept { return unknowns_.size(); }

    void clear();

private:
    struct ByText {
        const Unknowns* all;

        bool operator()(Unknown a, Unknown b) const { return all->compare(a, b) < 0; }
    };

    struct HashOfParts {
        std::size_t operator()(const LinearParts& parts) const noexcept;
    };

    [[nodiscard]] int compare(Unknown a, Unknown b) const;
    [[nodiscard]] int compareSums(const LinearParts& a, const LinearParts& b) const;
    [[nodiscard]] LinearParts byText(const LinearParts& parts) const;
    Unknown add(UnknownInfo info);

    const SymbolicExprTable& table_;
    const SymbolicExprPrinter& printer_;
    std::int64_t low_;
    std::int64_t high_;
    std::vector<UnknownInfo> unknowns_;
    std::vector<QuantityInfo> quantities_;
    std::set<Unknown, ByText> order_;
    IdMap<Unknown> byNode_;
    boost::unordered_map<LinearParts, Unknown, HashOfParts> sums_;
    boost::unordered_map<std::pair<Unknown, Unknown>, Quantity> differences_;
    Unknown simulation_ = noUnknown;
};

} // namespace VT
