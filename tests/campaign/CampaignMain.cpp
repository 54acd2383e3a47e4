// Runs one job: vtsym_campaign NAME [--minutes M | --count N | --short] [--seed S] [--first I].  The last line is its
// figure.
#include "tests/campaign/Campaign.hpp"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <vector>

namespace {

using namespace VT::Campaign;

std::vector<Entry> entries() {
    std::vector<Entry> all{
        {"solver", "conditions equal their normal and their short form, proven by Z3 over the integers", 400,
         makeSolverProofs},
        {"vectors", "the same over vectors of 32 bits, where no form can overflow", 250, makeSolverProofs},
        {"enumeration", "every condition of at most 3 operators is printed, read, simplified and decided consistently",
         4000, makeEnumeration},
        {"pairs", "every pair of conditions of at most 1 operator is compared as a table of truth values is, then of 2",
         4000, makeEnumeration},
        {"preprocessor", "conditions and their normal and short forms are decided alike by cpp and clang", 2,
         makePreprocessorPairs},
        {"stack", "trees of a million levels need no more than 256 KiB of stack", 16, makeDeepTrees},
        {"system-calls", "each open, read, write, close and rename of the program fails once", 250, makeFaults},
        {"program-memory", "each allocation of the program fails, once and from then on", 250, makeFaults},
        {"library-memory", "each allocation of calls of the library fails, once and from then on", 4000,
         makeLibraryMemory},
    };
    for (const VT::Fuzz::Target& target : VT::Fuzz::targets())
        all.push_back({target.name, "a fuzz target with random inputs, at full speed; a failing one is minimised", 300,
                       makeRandomInputs});
    return all;
}

struct Request {
    double minutes = 0;
    std::uint64_t count = ~std::uint64_t{0};
    std::uint64_t seed = 1;
    std::uint64_t first = 0;
};

/// Runs the job; whether no promise was broken.
bool run(const Entry& entry, const Request& request) {
    using Clock = std::chrono::steady_clock;
    const auto begin = Clock::now();
    const auto seconds = [&] { return std::chrono::duration<double>(Clock::now() - begin).count(); };
    const std::unique_ptr<Job> job = entry.make(entry.name);
    std::uint64_t item = request.first;
    for (std::uint64_t done = 0; done < request.count && item < job->items(); ++done, ++item) {
        if (request.minutes > 0 && seconds() > request.minutes * 60)
            break;
        try {
            job->run(request.seed, item);
        } catch (const Broken& broken) {
            std::cout << broken.what() << "\nagain: vtsym_campaign " << entry.name << " --seed " << request.seed
                      << " --first " << item << " --count 1" << std::endl;
            return false;
        }
    }
    std::cout << entry.name << ": " << job->figure() << ", seed " << request.seed << ", " << item - request.first
              << " items in " << static_cast<int>(seconds()) << " s, 0 differences" << std::endl;
    return true;
}

} // namespace

int main(int argc, char** argv) {
    const std::vector<std::string> words(argv + 1, argv + argc);
    const std::vector<Entry> all = entries();
    if (words.empty() || words[0] == "--list") {
        for (const Entry& entry : all)
            std::cout << entry.name << "\t" << entry.promise << "\n";
        return words.empty() ? 2 : 0;
    }
    for (const Entry& entry : all) {
        if (entry.name != words[0])
            continue;
        Request request;
        for (std::size_t i = 1; i < words.size(); ++i) {
            const char* const value = i + 1 < words.size() ? words[i + 1].c_str() : "";
            if (words[i] == "--short")
                request.count = entry.shortItems;
            else if (words[i] == "--minutes")
                request.minutes = std::strtod(value, nullptr);
            else if (words[i] == "--count")
                request.count = std::strtoull(value, nullptr, 10);
            else if (words[i] == "--seed")
                request.seed = std::strtoull(value, nullptr, 10);
            else if (words[i] == "--first")
                request.first = std::strtoull(value, nullptr, 10);
        }
        return run(entry, request) ? 0 : 1;
    }
    std::cerr << "'" << words[0] << "' is not a job; --list names them\n";
    return 2;
}
