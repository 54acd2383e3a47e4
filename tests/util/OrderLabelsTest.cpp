// Labels grow along the sequence and few of them change, in whatever order elements are inserted.
#include "base/util/OrderLabels.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <functional>
#include <list>
#include <random>

namespace VT::Testing {
namespace {

TEST(OrderLabels, GrowAlongTheSequenceAndSeldomChange) {
    using List = std::list<std::uint64_t>;
    std::mt19937_64 random(3);
    const std::pair<const char*, std::function<List::iterator(List&, std::size_t)>> places[] = {
        {"last", [](List& list, std::size_t) { return list.end(); }},
        {"first", [](List& list, std::size_t) { return list.begin(); }},
        {"before the last", [](List& list, std::size_t) { return std::prev(list.end(), list.empty() ? 0 : 1); }},
        {"after the first", [](List& list, std::size_t) { return std::next(list.begin(), list.empty() ? 0 : 1); }},
        {"both ends", [](List& list, std::size_t i) { return i % 2 == 0 ? list.begin() : list.end(); }},
        {"near the middle",
         [middle = List::iterator()](List& list, std::size_t i) mutable {
             return i == 0 ? list.end() : i == 1 ? middle = list.begin() : i % 2 == 0 ? middle : std::next(middle);
         }},
        {"anywhere near the front",
         [&](List& list, std::size_t i) {
             return std::next(list.begin(), static_cast<std::ptrdiff_t>(random() % (std::min<std::size_t>(i, 50) + 1)));
         }},
    };
    for (const auto& [name, place] : places) {
        for (const std::size_t size : {1000U, 4000U, 16000U, 64000U}) {
            List list;
            std::size_t changed = 0;
            for (std::size_t i = 0; i < size; ++i) {
                const auto at = list.insert(place(list, i), 0);
                changed += labelInserted(
                    list.begin(), list.end(), at, [](std::uint64_t & label) -> auto& { return label; });
            }
            EXPECT_NE(list.front(), 0U) << name;
            EXPECT_EQ(std::adjacent_find(list.begin(), list.end(), std::greater_equal()), list.end()) << name;
            EXPECT_LE(changed, size * static_cast<std::size_t>(std::bit_width(size))) << name << " " << size;
        }
    }
}

} // namespace
} // namespace VT::Testing
