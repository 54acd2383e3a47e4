// Measurements beside their floors: what the library does and the least that any program would do for it, in one run.
#pragma once

#include <benchmark/benchmark.h>

#include <ctime>
#include <string>

#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#else // no counts of instructions
#define CALLGRIND_START_INSTRUMENTATION static_cast<void>(0)
#define CALLGRIND_STOP_INSTRUMENTATION static_cast<void>(0)
#define CALLGRIND_DUMP_STATS_AT(name) static_cast<void>(name)
#endif

namespace VT::Benchmarks {

/// One side of a comparison.  It calls measure() once.
using Side = void (*)(benchmark::State& state, std::int64_t size);

struct Comparison {
    std::string name;
    Side library;
    Side floor;                ///< nullptr where a time is all that counts
    std::int64_t size = 0;     ///< handed to both sides
    double items = 1;          ///< what a time is divided by
    const char* unit = "call"; ///< what an item is
    double mark = 0;           ///< the ratio that is to be reached; 0 where none was set
    double goal = 0;           ///< the ratio beyond which little can be won; 0 where none was set
    double markSeconds = 0;    ///< the same as times of an item, where a time is to be reached
    double goalSeconds = 0;
};

/// Registers both sides.  The repetitions of all sides are run in random order, so that a noisy moment hits no side
/// alone.
bool compare(const Comparison& comparison);

/// Processor seconds of this thread: another process that takes the processor away does not count.
inline double threadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

/// The side that is measured now, and its items: the name under which its instructions are counted.
const std::string& currentSide();

/// Times `run(subject)` for a fresh `subject` from `prepare()` in each iteration; making and destroying it is not
/// timed, and neither is `report(subject)`.
template <class Prepare, class Run, class Report>
void measure(benchmark::State& state, Prepare prepare, Run run, Report report) {
    for (auto iteration : state) {
        static_cast<void>(iteration);
        auto subject = prepare();
        CALLGRIND_START_INSTRUMENTATION; // a few instructions that do nothing, but under callgrind
        const double start = threadSeconds();
        run(subject);
        const double seconds = threadSeconds() - start;
        CALLGRIND_STOP_INSTRUMENTATION;
        CALLGRIND_DUMP_STATS_AT(currentSide().c_str());
        state.SetIterationTime(seconds);
        report(subject);
    }
}

template <class Prepare, class Run>
void measure(benchmark::State& state, Prepare prepare, Run run) {
    measure(state, prepare, run, [](const auto&) {});
}

/// Bytes that the program holds from the allocator.
std::size_t bytesInUse();

} // namespace VT::Benchmarks
