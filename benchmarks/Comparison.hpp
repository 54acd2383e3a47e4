// Measurements beside their floors: what the library does and the least that any program would do for it, in one run.
#pragma once

#include <benchmark/benchmark.h>

#include <ctime>
#include <string>

namespace VT::Benchmarks {

/// The two sides of a comparison.  A side calls measure() once.
using Side = void (*)(benchmark::State& state, std::int64_t size);

struct Comparison {
    std::string name;
    Side library;
    Side floor;
    std::int64_t size = 0;     ///< handed to both sides
    double items = 1;          ///< what a time is divided by
    const char* unit = "call"; ///< what an item is
    double mark = 0;           ///< the ratio that is to be reached; 0 where none was set
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

/// Times `run(subject)` for a fresh `subject` from `prepare()` in each iteration; making and destroying it is not
/// timed, and neither is `report(subject)`.
template <class Prepare, class Run, class Report>
void measure(benchmark::State& state, Prepare prepare, Run run, Report report) {
    for (auto iteration : state) {
        static_cast<void>(iteration);
        auto subject = prepare();
        const double start = threadSeconds();
        run(subject);
        state.SetIterationTime(threadSeconds() - start);
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
