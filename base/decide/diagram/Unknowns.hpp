// The unknowns of conditions, and the quantities that comparisons restrict.
//
// Witnesses list unknowns in the order of their texts.  That order of free unknowns is kept in a tree (one text
// comparison for each level when an unknown is met for the first time) with labels of 64 bits that leave gaps, so that
// two unknowns are compared as numbers; when a gap is full the labels around it are dealt anew, which changes no order.
//
// Numbers of unknowns and quantities depend on what was read before; nothing but equality may be concluded from them.
#pragma once

#include "base/core/Table.hpp"
#include "base/integer/RationalForm.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/util/IdMap.hpp"

#include <boost/unordered_map.hpp>

#include <cstdint>
#include <set>
#include <utility>
#include <vector>

namespace VT {

/// Something that a comparison restricts: an unknown, or the difference of two.
using Quantity = std::uint32_t;

inline constexpr Unknown noUnknown = ~Unknown{0};

enum class UnknownKind : std::uint8_t {
    Simulation, ///< the variant keywords in force: 1 in simulation, 0 in generated code
    Free,       ///< a symbol, a call, a member
    Term,       ///< arithmetic whose value follows from other unknowns
    Sum,        ///< a sum of multiples of unknowns
    Floor,      ///< a sum divided by a constant and rounded toward minus infinity, or a sum with large numbers
};

/// The whole part of form / divisor; the form is of integers, the divisor positive.
struct FloorOf {
    WideForm form;
    BigInteger divisor;
    bool operator==(const FloorOf&) const = default;
};

struct UnknownInfo {
    UnknownKind kind;
    SymbolicExprId node;                            ///< of a free unknown or a term
    LinearParts sum;                                ///< of a sum: no common divisor, the first part positive
    std::int64_t low;                               ///< no value of the unknown is below
    std::int64_t high;                              ///< or above
    std::uint64_t label = 0;                        ///< of a free one or the keywords: grows in the order of texts
    Quantity quantity = 0;                          ///< the unknown as a quantity
    std::shared_ptr<const FloorOf> floor = nullptr; ///< of a floor

    /// Whether the value follows from those of free unknowns.
    [[nodiscard]] bool isComputed() const noexcept { return kind >= UnknownKind::Term; }
};

struct QuantityInfo {
    Unknown plus;
    Unknown minus; ///< subtracted, or noUnknown
    std::int64_t low;
    std::int64_t high;
    UnknownKind kind = UnknownKind::Free; ///< of `plus` where nothing is subtracted

    /// Whether the value depends on those of other quantities.
    [[nodiscard]] bool dependsOnOthers() const noexcept { return isDifference() || kind >= UnknownKind::Term; }

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

    /// The sum of the parts, which have no common divisor, and whether it is the opposite of the sum as given.
    std::pair<Unknown, bool> sum(const LinearParts& parts);
    Unknown floor(FloorOf meaning);
    /// a - b, or b - a and true.
    std::pair<Quantity, bool> difference(Unknown a, Unknown b);

    [[nodiscard]] const UnknownInfo& operator[](Unknown unknown) const { return unknowns_[unknown]; }

    [[nodiscard]] const QuantityInfo& quantity(Quantity quantity) const { return quantities_[quantity]; }

    /// Whether a free unknown, or the keywords, comes before another by text.
    [[nodiscard]] bool before(Unknown a, Unknown b) const { return unknowns_[a].label < unknowns_[b].label; }

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

    struct HashOfFloor {
        std::size_t operator()(const FloorOf& floor) const noexcept;
    };

    [[nodiscard]] int compare(Unknown a, Unknown b) const;
    [[nodiscard]] std::pair<std::int64_t, std::int64_t> rangeOf(const LinearParts& parts) const;
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
    boost::unordered_map<FloorOf, Unknown, HashOfFloor> floors_;
    boost::unordered_map<std::pair<Unknown, Unknown>, Quantity> differences_;
    Unknown simulation_ = noUnknown;
};

} // namespace VT
