// Labels that grow along a sequence into which elements are inserted anywhere.
//
// Method: a new element gets the middle of the gap between its neighbours.  Where there is none, the smallest aligned
// range of labels around it that is sparse enough is dealt anew in even steps (Bender, Cole, Demaine, Farach-Colton,
// Zito, "Two simplified algorithms for maintaining order in a list", 2002).
// Cost: O(log n) labels changed for each insertion on average, whatever the order of the insertions.
#pragma once

#include <cstddef>
#include <cstdint>
#include <iterator>

namespace VT {

/// Labels the element at `at`, whose neighbours in the sequence have labels already, and changes those of others where
/// it must.  `labelOf` yields a reference to the label of an element.  Labels are never 0.
///
/// Returns how many labels were changed.
template <class Iterator, class LabelOf>
std::size_t labelInserted(Iterator begin, Iterator end, Iterator at, LabelOf labelOf) {
    constexpr std::uint64_t appendGap = std::uint64_t{1} << 32U;
    constexpr std::uint64_t highest = ~std::uint64_t{0};
    constexpr double growth = 1.4; ///< elements that a range of doubled size may hold, times as many
    const std::uint64_t below = at == begin ? 0 : labelOf(*std::prev(at));
    const bool isLast = std::next(at) == end;
    if (isLast && below < highest - appendGap) {
        labelOf(*at) = below + appendGap;
        return 1;
    }
    const std::uint64_t above = isLast ? highest : labelOf(*std::next(at));
    if (above - below > 1) {
        labelOf(*at) = below + (above - below) / 2;
        return 1;
    }
    Iterator first = at;
    Iterator last = std::next(at);
    std::size_t count = 1;
    double most = 1;
    for (unsigned bits = 1;; ++bits) {
        const std::uint64_t span = bits >= 64 ? highest : (std::uint64_t{1} << bits) - 1;
        const std::uint64_t low = below & ~span;
        for (; first != begin && labelOf(*std::prev(first)) >= low; ++count)
            --first;
        for (; last != end && labelOf(*last) - low <= span; ++count)
            ++last;
        most *= growth;
        if (static_cast<double>(count) > most && bits < 64)
            continue;
        const std::uint64_t step = span / (count + 1);
        std::uint64_t label = low;
        for (; first != last; ++first)
            labelOf(*first) = label += step;
        return count;
    }
}

} // namespace VT
