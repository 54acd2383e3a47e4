#include "benchmarks/Comparison.hpp"

#include <malloc.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <deque>
#include <map>
#include <vector>

namespace VT::Benchmarks {

namespace {

std::deque<Comparison>& comparisons() {
    static std::deque<Comparison> all;
    return all;
}

std::string& sideName() {
    static std::string name;
    return name;
}

/// A number with three digits that count; nothing for 0.
std::string number(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.3g", value);
    return value > 0 ? text : "";
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
    explicit RatioTable(bool json) : json_(json) {}

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
        for (const Comparison& row : comparisons()) {
            const auto library = times_.find(row.name + "/vtsym");
            const auto floor = times_.find(row.name + "/floor");
            if (library == times_.end() || (row.floor != nullptr && floor == times_.end()))
                continue;
            const Times* const least = row.floor != nullptr ? &floor->second : nullptr;
            if (json_)
                printObject(row, library->second, least);
            else
                printLine(row, library->second, least);
        }
    }

private:
    static void printLine(const Comparison& row, const Times& library, const Times* floor) {
        const auto target = [](double ratio, double seconds) {
            return seconds > 0 ? readable(seconds) : number(ratio);
        };
        std::printf("%-58s %9s %9s %7s %7s %8s %8s", (row.name + ", per " + row.unit).c_str(),
                    readable(library.median() / row.items).c_str(),
                    floor == nullptr ? "" : readable(floor->median() / row.items).c_str(),
                    floor == nullptr ? "" : number(library.median() / floor->median()).c_str(),
                    floor == nullptr ? "" : number(library.least() / floor->least()).c_str(),
                    target(row.mark, row.markSeconds).c_str(), target(row.goal, row.goalSeconds).c_str());
        for (const auto& [name, figure] : library.figures) {
            std::printf("  %.4g %s", figure.value, name.c_str());
            if (floor != nullptr)
                if (const auto other = floor->figures.find(name); other != floor->figures.end())
                    std::printf(", floor %.4g", other->second.value);
        }
        std::printf("\n");
    }

    /// One object a line.  No name has a character that JSON escapes.
    static void printObject(const Comparison& row, const Times& library, const Times* floor) {
        std::printf(R"({"work":"%s","unit":"%s","seconds":%.4g)", row.name.c_str(), row.unit,
                    library.median() / row.items);
        if (floor != nullptr)
            std::printf(R"(,"floorSeconds":%.4g,"ratio":%.4g,"leastRatio":%.4g)", floor->median() / row.items,
                        library.median() / floor->median(), library.least() / floor->least());
        const std::pair<const char*, double> targets[] = {{"markRatio", row.mark},
                                                          {"goalRatio", row.goal},
                                                          {"markSeconds", row.markSeconds},
                                                          {"goalSeconds", row.goalSeconds}};
        for (const auto& [name, value] : targets)
            if (value > 0)
                std::printf(R"(,"%s":%.4g)", name, value);
        for (const auto& [name, figure] : library.figures)
            std::printf(R"(,"%s":%.4g)", name.c_str(), figure.value);
        std::printf("}\n");
    }

    bool json_;
    std::map<std::string, Times> times_;
};

} // namespace

bool compare(const Comparison& comparison) {
    comparisons().push_back(comparison);
    const std::pair<const char*, Side> sides[] = {{"/vtsym", comparison.library}, {"/floor", comparison.floor}};
    for (const auto& [suffix, side] : sides) {
        if (side == nullptr)
            continue;
        const std::string name = comparison.name + suffix;
        const std::string counted = number(comparison.items) + '\t' + comparison.unit + '\t' + name;
        benchmark::RegisterBenchmark(name.c_str(), [run = side, size = comparison.size,
                                                    counted](benchmark::State& state) {
            sideName() = counted;
            run(state, size);
        })->UseManualTime();
    }
    return true;
}

const std::string& currentSide() {
    return sideName();
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
    bool json = false;
    bool headed = false;
    const auto isOurs = [&](const char* argument) {
        json |= std::strcmp(argument, "--json") == 0;
        headed |= std::strcmp(argument, "--headed") == 0;
        return std::strcmp(argument, "--json") == 0 || std::strcmp(argument, "--headed") == 0;
    };
    // Options of the caller come last, so they win.
    std::vector<char*> arguments{argv[0], repetitions.data(), interleaved.data(), shortRuns.data()};
    std::copy_if(argv + 1, argv + argc, std::back_inserter(arguments),
                 [&](const char* argument) { return !isOurs(argument); });
    int count = static_cast<int>(arguments.size());
    benchmark::Initialize(&count, arguments.data());
    if (benchmark::ReportUnrecognizedArguments(count, arguments.data()))
        return 2;
    if (headed && !json)
        std::printf("%-58s %9s %9s %7s %7s %8s %8s\n", "median of repetitions, per item", "vtsym", "floor", "ratio",
                    "least", "mark", "goal");
    VT::Benchmarks::RatioTable table(json);
    benchmark::RunSpecifiedBenchmarks(&table);
    return 0;
}
