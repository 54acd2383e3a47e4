// The program beside the least that does the same: its start, lines of standard input beside calls of the library, a
// scan beside counting lines, two processors beside one.
//
// Times of programs are what the system counted for the child process, but for those of several processors, which are
// by the clock and need an idle machine.
#include "base/service/VCService.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"

#include <chrono>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <spawn.h>
#include <stdexcept>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VT::Benchmarks {
namespace {

namespace fs = std::filesystem;

/// Files that are removed at the end.
class Scratch {
public:
    Scratch() {
        std::string pattern = (fs::temp_directory_path() / "vtsym-bench-XXXXXX").string();
        if (mkdtemp(pattern.data()) == nullptr)
            throw std::runtime_error("no folder for files");
        path_ = pattern;
        std::ofstream lines(path_ / "lines");
        const std::vector<std::string> conditions = readableLines();
        for (std::size_t i = 0; i < lineCount; ++i)
            lines << conditions[i % conditions.size()] << '\n';
        fs::create_directory(path_ / "src");
        for (int file = 0; file < 400; ++file) {
            std::ofstream source(path_ / "src" / (std::to_string(file) + ".c"));
            for (int line = 0; line < 2000; ++line)
                source << (line % 20 == 0 ? "/* a comment */\n"
                                          : "    result += table[index].value(\"text\", 'c', 0x10) * 3;\n");
        }
        fs::create_directory(path_ / "branches");
        for (std::size_t file = 0; file < 400; ++file) {
            std::ofstream source(path_ / "branches" / (std::to_string(file) + ".c"));
            for (std::size_t i = 0; i < 100; ++i)
                source << "#if " << conditions[(file * 37 + i) % conditions.size()] << "\nint x;\n#endif\n";
        }
    }

    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;

    ~Scratch() { fs::remove_all(path_); }

    [[nodiscard]] std::string path(const char* name) const { return (path_ / name).string(); }

    static constexpr std::size_t lineCount = 1'000'000;

private:
    fs::path path_;
};

const Scratch& scratch() {
    static const Scratch files;
    return files;
}

/// Runs a program with a file as its input; returns its processor seconds, or those of the clock.
double run(const std::vector<std::string>& command, bool byClock = false, const std::string& input = "/dev/null") {
    std::vector<char*> words;
    std::vector<std::string> copies = command;
    for (std::string& word : copies)
        words.push_back(word.data());
    words.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, input.c_str(), O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
    const auto begin = std::chrono::steady_clock::now();
    pid_t child = 0;
    const int error = posix_spawnp(&child, words.front(), &actions, nullptr, words.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    int status = 0;
    rusage used{};
    if (error != 0 || wait4(child, &status, 0, &used) != child || !WIFEXITED(status) || WEXITSTATUS(status) > 1)
        throw std::runtime_error("cannot run " + command.front());
    const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - begin;
    const auto seconds = [](const timeval& time) {
        return static_cast<double>(time.tv_sec) + 1e-6 * static_cast<double>(time.tv_usec);
    };
    return byClock ? elapsed.count() : seconds(used.ru_utime) + seconds(used.ru_stime);
}

/// Times an action that returns its seconds.
template <class Action>
void measureSeconds(benchmark::State& state, Action action) {
    for (auto iteration : state) {
        static_cast<void>(iteration);
        state.SetIterationTime(action());
    }
}

void start(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] { return run({VTSYM_PROGRAM, "simplify", "A > 1 && A > 2"}); });
}

void startFloor(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] { return run({"true"}); });
}

void convertLines(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] {
        return run({VTSYM_PROGRAM, "convert", "--to", "quill", "--jobs", "1"}, false, scratch().path("lines"));
    });
}

void convertCalls(benchmark::State& state, std::int64_t) {
    std::vector<std::string> lines;
    std::ifstream file(scratch().path("lines"));
    for (std::string line; std::getline(file, line);)
        lines.push_back(line);
    measure(
        state, [] { return std::make_unique<VCService>(); },
        [&](auto& service) {
            std::string out;
            for (const std::string& line : lines)
                out.append(service->printQExprWithConversion(service->parseC(line))).append("\n");
            benchmark::DoNotOptimize(out.data());
        });
}

void scanCode(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] { return run({VTSYM_PROGRAM, "scan", "--jobs", "1", scratch().path("src")}); });
}

void countLines(benchmark::State& state, std::int64_t) {
    std::vector<std::string> command{"wc", "-l"};
    for (const auto& entry : fs::directory_iterator(scratch().path("src")))
        command.push_back(entry.path().string());
    measureSeconds(state, [&] { return run(command); });
}

void scanWithJobs(benchmark::State& state, std::int64_t jobs) {
    measureSeconds(state, [&] {
        return run({VTSYM_PROGRAM, "scan", "--jobs", std::to_string(jobs), scratch().path("branches")}, true);
    });
}

void scanOneJob(benchmark::State& state, std::int64_t) {
    scanWithJobs(state, 1);
}

void scanCached(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] {
        return run(
            {VTSYM_PROGRAM, "scan", "--jobs", "1", "--cache", scratch().path("cache"), scratch().path("branches")});
    });
}

void scanUncached(benchmark::State& state, std::int64_t) {
    measureSeconds(state, [] { return run({VTSYM_PROGRAM, "scan", "--jobs", "1", scratch().path("branches")}); });
}

const bool registered =
    compare({.name = "start and answer one text (floor: start a program that does nothing)",
             .library = start,
             .floor = startFloor}) &&
    compare({.name = "convert 1,000,000 lines (floor: calls of the library)",
             .library = convertLines,
             .floor = convertCalls,
             .items = static_cast<double>(Scratch::lineCount),
             .unit = "line",
             .mark = 2}) &&
    compare({.name = "scan 800,000 lines of code (floor: wc -l)",
             .library = scanCode,
             .floor = countLines,
             .items = 800'000,
             .unit = "line",
             .mark = 8}) &&
    compare({.name = "scan on two processors, by the clock (floor: on one)",
             .library = scanWithJobs,
             .floor = scanOneJob,
             .size = 2,
             .mark = 1 / 1.8}) &&
    compare({.name = "scan files again with a cache (floor: without)", .library = scanCached, .floor = scanUncached});

} // namespace
} // namespace VT::Benchmarks
