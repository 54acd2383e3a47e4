#include "benchmarks/Comparison.hpp"

#include <malloc.h>

#include <algorithm>
#include <cstdio>
#include <deque>
#include <map>
#include <vector>

namespace VT::Benchmarks {

namespace {

std::deque<Comparison>& comparisons() {
    static std::deque<Comparison> all;
    return all;
}

struct Times {
    std::vector<double> seconds;
    benchmark::UserCounters figures = {}; ///< what else the side measured

    [[nodiscard]] double least() const { return *std::ranges::min_element(seconds); }

    [[nodiscard]] double median() const {
        std::vector<double> sorted = seconds;
        std::ranges::sort(sorted);
        return sorted[sorted.size() / 2];
    }
};

std::string readable(double seconds) {
    const char* unit = "s";
    for (const char* smaller : {"ms", "us", "ns"})
        if (seconds < 1) {
            seconds *= 1000;
            unit = smaller;
        }
    char text[32];
    std::snprintf(text, sizeof text, "%.*f %s", seconds < 100 ? 1 : 0, seconds, unit);
    return text;
}

/// Keeps the repetitions and prints one line for each comparison at the end.
class RatioTable final : public benchmark::BenchmarkReporter {
public:
    bool ReportContext(const Context&) override { return true; }

    void ReportRuns(const std::vector<Run>& runs) override {
        for (const Run& run : runs) {
            if (run.run_type != Run::RT_Iteration)
                continue;
            if (run.error_occurred) {
                std::fprintf(stderr, "%s: %s\n", run.benchmark_name().c_str(), run.error_message.c_str());
                continue;
            }
            // The name is followed by the options of the measurement, such as /manual_time.
            Times& times = times_[run.run_name.function_name];
            times.seconds.push_back(run.real_accumulated_time / static_cast<double>(run.iterations));
            times.figures = run.counters;
        }
    }

    void Finalize() override {
        std::printf("%-44s %10s %10s %7s %7s %6s\n", "median of repetitions, per item", "vtsym", "floor", "ratio",
                    "least", "mark");
        for (const Comparison& row : comparisons()) {
            const auto library = times_.find(row.name + "/vtsym");
            const auto floor = times_.find(row.name + "/floor");
            if (library == times_.end() || floor == times_.end())
                continue;
            print(row, library->second, floor->second);
        }
    }

private:
    static void print(const Comparison& row, const Times& library, const Times& floor) {
        std::string mark;
        if (row.mark > 0) {
            mark.resize(16);
            mark.resize(static_cast<std::size_t>(std::snprintf(mark.data(), mark.size(), "%.3g", row.mark)));
        }
        std::printf("%-44s %10s %10s %7.2f %7.2f %6s", (row.name + ", per " + row.unit).c_str(),
                    readable(library.median() / row.items).c_str(), readable(floor.median() / row.items).c_str(),
                    library.median() / floor.median(), library.least() / floor.least(), mark.c_str());
        for (const auto& [name, figure] : library.figures) {
            std::printf("  %.4g %s", figure.value, name.c_str());
            if (const auto other = floor.figures.find(name); other != floor.figures.end())
                std::printf(", floor %.4g", other->second.value);
        }
        std::printf("\n");
    }

    std::map<std::string, Times> times_;
};

} // namespace

bool compare(const Comparison& comparison) {
    comparisons().push_back(comparison);
    const std::pair<const char*, Side> sides[] = {{"/vtsym", comparison.library}, {"/floor", comparison.floor}};
    for (const auto& [suffix, side] : sides)
        benchmark::RegisterBenchmark((comparison.name + suffix).c_str(), side, comparison.size)->UseManualTime();
    return true;
}

std::size_t bytesInUse() {
    const struct mallinfo2 all = mallinfo2();
    return all.uordblks + all.hblkhd;
}

} // namespace VT::Benchmarks

int main(int argc, char** argv) {
    std::string repetitions = "--benchmark_repetitions=9";
    std::string interleaved = "--benchmark_enable_random_interleaving=true";
    std::string shortRuns = "--benchmark_min_time=0.05";
    // Options of the caller come last, so they win.
    std::vector<char*> arguments{argv[0], repetitions.data(), interleaved.data(), shortRuns.data()};
    arguments.insert(arguments.end(), argv + 1, argv + argc);
    int count = static_cast<int>(arguments.size());
    benchmark::Initialize(&count, arguments.data());
    if (benchmark::ReportUnrecognizedArguments(count, arguments.data()))
        return 2;
    VT::Benchmarks::RatioTable table;
    benchmark::RunSpecifiedBenchmarks(&table);
    return 0;
}
