// Works on many items at once, with the results in the order of the items.
//
// The threads are those of a library, which InOrder.cpp alone includes; where there are none, another source takes its
// place and works on one item after another.
#pragma once

#include <cstddef>
#include <functional>

namespace vtsym {

/// Work in three steps, on items in slots that are used again once their item is finished.  An exception of any step
/// ends the work after the items before it, as it would one item after another.
struct OrderedWork {
    /// Puts the next item into a slot; false at the end.  Items are asked for in order, by one thread at a time.
    std::function<bool(std::size_t slot)> next;
    /// Works on an item, beside others.  Workers are numbered from 0; none works on two items at once.
    std::function<void(std::size_t slot, std::size_t worker)> work;
    /// Uses a result.  Is called in the order of the items, by one thread at a time.
    std::function<void(std::size_t slot)> finish;
};

/// How many workers --jobs may ask for.
inline constexpr std::size_t mostJobs = 1024;

/// The processors that this process may use.
std::size_t processors();

/// Slots that so many workers need to have work while an item takes longer than others.
constexpr std::size_t slotsFor(std::size_t jobs) {
    return jobs == 1 ? 1 : 32 * jobs;
}

/// Works on all items with so many workers and slotsFor() them; on a single item, with one worker, or where the system
/// refuses threads, in this thread.
void runInOrder(std::size_t jobs, const OrderedWork& work);

/// The same one item after another, in slot 0.
inline void runOneByOne(const OrderedWork& work) {
    while (work.next(0)) {
        work.work(0, 0);
        work.finish(0);
    }
}

} // namespace vtsym
