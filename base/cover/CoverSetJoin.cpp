// Writes a union of sets as few products.
//
// The union's intervals are pieces; neighbouring pieces with one integer between them may be shorter as one product
// with a hole.  A piece that consists of points alone is written as points.
// Cost: sorting the intervals.
#include "base/cover/Cover.hpp"

#include <algorithm>

namespace VT {

namespace {

using Interval = IntegerSet::Interval;

/// An interval of a union, with what it takes to write it and whether it was made of points alone.
struct Piece {
    Interval interval;
    bool points;

    [[nodiscard]] std::size_t comparisons() const {
        const IntegerSet set(interval.low, interval.high);
        return points ? static_cast<std::size_t>(interval.high - interval.low) + 1 : set.comparisons();
    }
};

std::vector<Piece> pieces(const std::vector<IntegerSet>& sets) {
    std::vector<Interval> all;
    std::vector<Interval> wide; // what is more than a point
    for (const IntegerSet& set : sets) {
        all.insert(all.end(), set.intervals().begin(), set.intervals().end());
        for (const Interval& interval : set.intervals())
            if (interval.low != interval.high || set.intervals().size() > 1)
                wide.push_back(interval);
    }
    std::ranges::sort(wide);
    std::vector<Piece> result;
    auto next = wide.begin();
    const IntegerSet whole = IntegerSet::of(std::move(all));
    for (const Interval& interval : whole.intervals()) {
        while (next != wide.end() && next->low < interval.low)
            ++next;
        const bool points = next == wide.end() || next->low > interval.high;
        result.push_back({interval, points});
    }
    return result;
}

void appendPiece(const Piece& piece, std::vector<IntegerSet>& out) {
    if (!piece.points) {
        out.emplace_back(piece.interval.low, piece.interval.high);
        return;
    }
    for (std::int64_t value = piece.interval.low; value <= piece.interval.high; ++value)
        out.push_back(IntegerSet::point(value));
}

} // namespace

std::vector<IntegerSet> joinSets(const std::vector<IntegerSet>& sets) {
    const std::vector<Piece> parts = pieces(sets);
    std::vector<IntegerSet> result;
    for (std::size_t first = 0; first < parts.size();) {
        // A run of pieces with single points missing between them may be shorter as one product.
        std::size_t end = first + 1;
        while (end < parts.size() && parts[end].interval.low - parts[end - 1].interval.high == 2)
            ++end;
        std::size_t separate = 0;
        bool points = true;
        std::vector<Interval> run;
        for (std::size_t i = first; i < end; ++i) {
            separate += parts[i].comparisons();
            points = points && parts[i].points;
            run.push_back(parts[i].interval);
        }
        IntegerSet joined = IntegerSet::of(run);
        if (end - first > 1 && !points && joined.comparisons() < separate)
            result.push_back(std::move(joined));
        else
            for (std::size_t i = first; i < end; ++i)
                appendPiece(parts[i], result);
        first = end;
    }
    return result;
}

} // namespace VT
