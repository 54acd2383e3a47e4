// Runs the tests against each mutant that was compiled in:
// vtsym_mutants MUTANTS EXPLAINED [--minutes M] [--seed S] [--seconds S] [--jobs J].
//
// Each test runs once without a mutant, which gives its time and the mutants that it evaluates.  A mutant is then
// judged by the tests that evaluate it, each in a forked process with a bound of time and memory, first those that are
// quick and have found mutants of the same source; the first that fails kills it.  Mutants are taken in random order,
// so that a run that is cut short has judged a sample.
#include "tests/mutation/Mutants.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <fstream>
#include <iostream>
#include <map>
#include <numeric>
#include <random>
#include <set>
#include <span>
#include <string>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace VT::Mutation {

int active = 0;
unsigned char* reached = nullptr;

namespace {

struct Mutant {
    std::string source;
    std::string change; ///< what and where, without the line, as EXPLAINED has it
    std::string line;
};

struct Test {
    std::string name;
    std::string suite;
    double seconds = 0;
    std::vector<unsigned char> reaches;
};

enum Verdict : int {
    NotRun = 0,
    Survived = -1,
    Unreached = -2
}; // otherwise the number of the test that killed it, from 1

template <class Entry>
Entry* shared(std::size_t count) {
    void* const place =
        mmap(nullptr, count * sizeof(Entry) + 1, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (place == MAP_FAILED)
        throw std::bad_alloc();
    return static_cast<Entry*>(place);
}

std::vector<Mutant> readMutants(const char* path) {
    std::vector<Mutant> mutants(1);
    std::ifstream table(path);
    for (std::string number; std::getline(table, number, '\t');) {
        Mutant mutant;
        std::string rest;
        std::getline(table, mutant.source, '\t');
        std::getline(table, mutant.line, '\t');
        std::getline(table, rest);
        mutant.change = mutant.source + "\t" + rest;
        mutants.push_back(std::move(mutant));
    }
    return mutants;
}

/// The changes that EXPLAINED says a reason for: lines of source, change, text and reason, between tabs.
std::set<std::string> readExplained(const char* path) {
    std::set<std::string> explained;
    std::ifstream table(path);
    for (std::string line; std::getline(table, line);)
        if (!line.starts_with('#') && line.find('\t') != std::string::npos)
            explained.insert(line.substr(0, line.rfind('\t')));
    return explained;
}

std::vector<Test> allTests() {
    std::vector<Test> tests;
    const testing::UnitTest& all = *testing::UnitTest::GetInstance();
    for (int i = 0; i < all.total_test_suite_count(); ++i)
        for (int k = 0; k < all.GetTestSuite(i)->total_test_count(); ++k) {
            const testing::TestInfo& info = *all.GetTestSuite(i)->GetTestInfo(k);
            std::string folder = info.file();
            folder.erase(folder.rfind('/'));
            tests.push_back(
                {std::string(info.test_suite_name()) + "." + info.name(), folder.substr(folder.rfind('/') + 1), 0, {}});
        }
    return tests;
}

/// Runs a test in a process of its own, for at most so many seconds; whether it passed, and how long it took.
std::pair<bool, double> passes(const Test& test, int mutant, double limit) {
    const pid_t child = fork();
    if (child == 0) {
        const int nowhere = open("/dev/null", O_WRONLY);
        dup2(nowhere, 1);
        dup2(nowhere, 2);
        const auto seconds = static_cast<rlim_t>(limit) + 1;
        const rlimit time{seconds, seconds};
        const rlimit memory{rlim_t{4} << 30U, rlim_t{4} << 30U};
        const rlimit core{0, 0};
        setrlimit(RLIMIT_CPU, &time);
        setrlimit(RLIMIT_AS, &memory);
        setrlimit(RLIMIT_CORE, &core);
        alarm(static_cast<unsigned>(30 * seconds)); // one that waits uses no processor
        active = mutant;
        testing::GTEST_FLAG(filter) = test.name;
        testing::GTEST_FLAG(break_on_failure) = mutant != 0;
        _exit(RUN_ALL_TESTS());
    }
    int status = 0;
    rusage used{};
    wait4(child, &status, 0, &used);
    const double seconds = static_cast<double>(used.ru_utime.tv_sec) + static_cast<double>(used.ru_utime.tv_usec) / 1e6;
    return {WIFEXITED(status) && WEXITSTATUS(status) == 0, seconds};
}

struct Options {
    double minutes = 1e9;
    double seconds = 1e9; ///< of tests for a mutant
    unsigned long seed = 1;
    unsigned jobs = std::max(1U, std::thread::hardware_concurrency());
};

/// Calls with the numbers below `count`, each in one of several processes.
template <class Call>
void inProcesses(unsigned jobs, std::size_t count, Call makeCall) {
    auto* const next = shared<std::atomic<std::size_t>>(1);
    std::vector<pid_t> children;
    for (unsigned i = 0; i < jobs; ++i) {
        const pid_t child = fork();
        if (child == 0) {
            auto call = makeCall();
            for (std::size_t at = (*next)++; at < count && call(at); at = (*next)++) {
            }
            _exit(0);
        }
        children.push_back(child);
    }
    for (const pid_t child : children)
        waitpid(child, nullptr, 0);
}

/// Runs every test without a mutant; drops those that fail, which cannot judge.
void learn(std::vector<Test>& tests, std::size_t mutants, unsigned jobs) {
    auto* const rows = shared<unsigned char>(tests.size() * mutants);
    auto* const seconds = shared<double>(tests.size()); // negative for one that failed
    inProcesses(jobs, tests.size(), [&] {
        return [&](std::size_t i) {
            reached = rows + i * mutants;
            const auto [passed, taken] = passes(tests[i], 0, 300);
            seconds[i] = passed ? taken : -1;
            return true;
        };
    });
    for (std::size_t i = 0; i < tests.size(); ++i) {
        tests[i].seconds = seconds[i];
        tests[i].reaches.assign(rows + i * mutants, rows + (i + 1) * mutants);
        if (seconds[i] < 0)
            std::cout << "left out, since it fails here without a mutant: " << tests[i].name << std::endl;
    }
    std::erase_if(tests, [](const Test& test) { return test.seconds < 0; });
}

class Worker {
public:
    Worker(const std::vector<Mutant>& mutants, const std::vector<Test>& tests, double seconds, int* verdicts)
        : mutants_(mutants),
          tests_(tests),
          seconds_(seconds),
          verdicts_(verdicts) {}

    void judge(int mutant) {
        const auto number = static_cast<std::size_t>(mutant);
        std::vector<std::size_t> order;
        for (std::size_t i = 0; i < tests_.size(); ++i)
            if (tests_[i].reaches[number] != 0)
                order.push_back(i);
        std::map<std::size_t, int>& kills = kills_[mutants_[number].source];
        const auto cost = [&](std::size_t i) { return (tests_[i].seconds + 0.002) / (1 + kills[i]); };
        std::ranges::stable_sort(order, {}, cost);
        double left = seconds_;
        for (const std::size_t i : order)
            if ((left -= tests_[i].seconds) > 0 && !passes(tests_[i], mutant, 5 * tests_[i].seconds + 1).first) {
                ++kills[i];
                verdicts_[mutant] = static_cast<int>(i) + 1;
                return;
            }
        verdicts_[mutant] = order.empty() ? Unreached : Survived;
        const Mutant& whole = mutants_[number];
        const std::string line = (order.empty() ? "not evaluated\t" : "survived\t") + std::to_string(mutant) + "\t" +
                                 whole.line + "\t" + whole.change + "\n";
        static_cast<void>(!write(STDOUT_FILENO, line.data(), line.size())); // whole, whichever process writes
    }

private:
    const std::vector<Mutant>& mutants_;
    const std::vector<Test>& tests_;
    double seconds_;
    int* verdicts_;
    std::map<std::string, std::map<std::size_t, int>> kills_;
};

int report(const std::vector<Mutant>& mutants, const std::vector<Test>& tests, const std::set<std::string>& explained,
           std::span<const int> verdicts, unsigned long seed) {
    std::map<std::string, int> bySuite;
    int killed = 0;
    int reasoned = 0;
    int survived = 0;
    int unreached = 0;
    for (std::size_t i = 1; i < mutants.size(); ++i) {
        if (verdicts[i] > 0) {
            ++killed;
            ++bySuite[tests[static_cast<std::size_t>(verdicts[i] - 1)].suite];
        } else if (verdicts[i] != NotRun && explained.contains(mutants[i].change)) {
            ++reasoned;
        } else if (verdicts[i] != NotRun) {
            ++(verdicts[i] == Survived ? survived : unreached);
        }
    }
    for (const auto& [suite, count] : bySuite)
        std::cout << "killed first by tests/" << suite << ": " << count << "\n";
    const int judged = killed + reasoned + survived + unreached;
    std::cout << "mutation: " << judged << " of " << mutants.size() - 1 << " mutants judged, " << killed << " killed, "
              << survived << " survived, " << unreached << " evaluated by no test, " << reasoned << " explained, score "
              << (judged == reasoned ? 0 : 100.0 * killed / (judged - reasoned)) << " %, seed " << seed << std::endl;
    return judged > 0 ? 0 : 1;
}

} // namespace

} // namespace VT::Mutation

int main(int argc, char** argv) {
    using namespace VT::Mutation;
    testing::InitGoogleTest(&argc, argv);
    Options options;
    for (int i = 3; i + 1 < argc; i += 2) {
        const std::string_view name = argv[i];
        const double value = std::strtod(argv[i + 1], nullptr);
        if (name == "--minutes")
            options.minutes = value;
        else if (name == "--seconds")
            options.seconds = value;
        else if (name == "--seed")
            options.seed = static_cast<unsigned long>(value);
        else if (name == "--jobs")
            options.jobs = static_cast<unsigned>(value);
    }
    const std::vector<Mutant> mutants = readMutants(argv[1]);
    std::vector<Test> tests = allTests();
    learn(tests, mutants.size(), options.jobs);
    reached = shared<unsigned char>(mutants.size());
    int* const verdicts = shared<int>(mutants.size());
    std::vector<int> order(mutants.size() - 1);
    std::iota(order.begin(), order.end(), 1);
    std::ranges::shuffle(order, std::mt19937_64(options.seed));

    const auto end = std::chrono::steady_clock::now() + std::chrono::duration<double>(60 * options.minutes);
    inProcesses(options.jobs, order.size(), [&] {
        return [&, worker = Worker(mutants, tests, options.seconds, verdicts)](std::size_t at) mutable {
            worker.judge(order[at]);
            return std::chrono::steady_clock::now() < end;
        };
    });
    return report(mutants, tests, readExplained(argv[2]), {verdicts, mutants.size()}, options.seed);
}
