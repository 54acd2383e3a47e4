// Works on items with oneTBB.
//
// Method: a pipeline of three filters, the first and the last in order.  As many items are under way as there are
// slots, so that the item of a slot is finished before the slot is used again.  An exception waits in its slot until
// the items before it are finished.  Where the system refuses threads, this one does all of the work.
// Relies on: threads of an arena have numbers below its size.
#include "tools/vtsym/io/InOrder.hpp"

#include <oneapi/tbb/global_control.h>
#include <oneapi/tbb/info.h>
#include <oneapi/tbb/parallel_pipeline.h>
#include <oneapi/tbb/task_arena.h>

#include <atomic>
#include <cstdlib>
#include <exception>
#include <latch>
#include <optional>
#include <semaphore>
#include <thread>
#include <utility>
#include <vector>

namespace vtsym {

namespace {

/// Bytes of a worker's stack: as many as the first thread of a process usually has, for which the depth of texts is
/// bounded.
constexpr std::size_t stackBytes = std::size_t{8} << 20U;

/// What one thread does after another.  The library orders them; a race detector that does not see into it sees this.
class Turn {
public:
    explicit Turn(std::atomic<unsigned>& turns) : turns_(turns) { static_cast<void>(turns_.load()); }

    Turn(const Turn&) = delete;
    Turn& operator=(const Turn&) = delete;

    ~Turn() { ++turns_; }

private:
    std::atomic<unsigned>& turns_;
};

/// One run with several workers.
class OrderedRun {
public:
    OrderedRun(std::size_t jobs, const OrderedWork& work)
        : work_(work),
          errors_(slotsFor(jobs)),
          ofSlot_(errors_.size()),
          ofWorker_(jobs) {}

    /// Goes on with the first two items, which are in their slots.
    void run() {
        namespace tbb = oneapi::tbb;
        constexpr auto inOrder = tbb::filter_mode::serial_in_order;
        ++ofNext_;
        tbb::parallel_pipeline(
            errors_.size(),
            tbb::make_filter<void, std::size_t>(inOrder, [this](tbb::flow_control& control) {
                const std::optional<std::size_t> slot = next();
                if (!slot)
                    control.stop();
                return slot.value_or(0);
            }) & tbb::make_filter<std::size_t, std::size_t>(tbb::filter_mode::parallel, [this](std::size_t slot) {
                workOn(slot);
                return slot;
            }) & tbb::make_filter<std::size_t, void>(inOrder, [this](std::size_t slot) { finish(slot); }));
    }

    ~OrderedRun() { // after all threads
        const Turn next(ofNext_);
        const Turn finish(ofFinish_);
        for (auto* const turns : {&ofSlot_, &ofWorker_})
            for (std::atomic<unsigned>& each : *turns)
                const Turn turn(each);
    }

    OrderedRun(const OrderedRun&) = delete;
    OrderedRun& operator=(const OrderedRun&) = delete;

private:
    /// The slot of the next item; nothing at the end.
    std::optional<std::size_t> next() {
        const Turn turn(ofNext_);
        const std::size_t slot = items_ % errors_.size();
        const Turn turnOfSlot(ofSlot_[slot]);
        bool isThere = !ended_;
        try {
            isThere = isThere && (items_ < 2 || work_.next(slot));
        } catch (...) {
            ended_ = true;
            errors_[slot] = std::current_exception();
        }
        ++items_;
        return isThere ? std::optional(slot) : std::nullopt;
    }

    void workOn(std::size_t slot) {
        const auto worker = static_cast<std::size_t>(oneapi::tbb::this_task_arena::current_thread_index());
        const Turn turn(ofSlot_[slot]);
        const Turn turnOfWorker(ofWorker_[worker]);
        try {
            if (!errors_[slot])
                work_.work(slot, worker);
        } catch (...) {
            errors_[slot] = std::current_exception();
        }
    }

    void finish(std::size_t slot) {
        const Turn turn(ofFinish_);
        const Turn turnOfSlot(ofSlot_[slot]);
        if (const std::exception_ptr error = std::exchange(errors_[slot], nullptr))
            std::rethrow_exception(error);
        work_.finish(slot);
    }

    const OrderedWork& work_;
    std::vector<std::exception_ptr> errors_; ///< by slot
    std::vector<std::atomic<unsigned>> ofSlot_;
    std::vector<std::atomic<unsigned>> ofWorker_;
    std::atomic<unsigned> ofNext_ = 0;
    std::atomic<unsigned> ofFinish_ = 0;
    std::size_t items_ = 0;
    bool ended_ = false; ///< by an exception
};

/// Puts the second item into its slot.  Where that fails, the first one is finished nevertheless.
bool nextOrFirst(const OrderedWork& work) {
    try {
        return work.next(1);
    } catch (...) {
        work.work(0, 0);
        work.finish(0);
        throw;
    }
}

/// Whether the system has threads for so many workers, and memory for what each takes first.  oneTBB ends the program
/// where it is refused a thread, so as many are started before, and ended.
bool grantsThreads(std::size_t workers) {
    std::latch end(1);
    std::binary_semaphore started(0);
    std::vector<std::thread> threads;
    threads.reserve(workers);
    bool isGranted = true;
    try {
        while (threads.size() + 1 < workers) {
            threads.emplace_back([&] {
                void* const volatile room = std::malloc(1); // NOLINT: takes an arena of the allocator
                std::free(room);                            // NOLINT
                started.release();
                end.wait();
            });
            started.acquire();
        }
    } catch (const std::exception&) {
        isGranted = false;
    }
    end.count_down();
    for (std::thread& thread : threads)
        thread.join();
    return isGranted;
}

/// Does all work in this thread.  The first two items are in their slots.
void goOnOneByOne(const OrderedWork& work) {
    for (const std::size_t slot : {0U, 1U}) {
        work.work(slot, 0);
        work.finish(slot);
    }
    runOneByOne(work);
}

} // namespace

std::size_t processors() {
    return static_cast<std::size_t>(oneapi::tbb::info::default_concurrency());
}

void runInOrder(std::size_t jobs, const OrderedWork& work) {
    if (jobs == 1) {
        runOneByOne(work);
        return;
    }
    if (!work.next(0))
        return;
    if (!nextOrFirst(work)) {
        work.work(0, 0);
        work.finish(0);
        return;
    }
    if (!grantsThreads(jobs))
        return goOnOneByOne(work);
    const oneapi::tbb::global_control stack(oneapi::tbb::global_control::thread_stack_size, stackBytes);
    const oneapi::tbb::global_control threads(oneapi::tbb::global_control::max_allowed_parallelism, jobs);
    oneapi::tbb::task_arena arena(static_cast<int>(jobs));
    arena.execute([&] { OrderedRun(jobs, work).run(); });
}

} // namespace vtsym
