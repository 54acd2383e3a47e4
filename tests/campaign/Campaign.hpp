// Long runs of random or enumerated items, each of which is judged by an oracle and can be made again from its number.
#pragma once

#include "fuzz/Targets.hpp"

#include <cstdint>
#include <memory>
#include <random>
#include <span>
#include <string>

namespace VT::Campaign {

using Fuzz::Broken;

/// Judges items; throws Broken about one that breaks a promise.
class Job {
public:
    Job() = default;
    Job(const Job&) = delete;
    Job& operator=(const Job&) = delete;
    virtual ~Job() = default;

    /// Judges the item of a number under a seed.
    virtual void run(std::uint64_t seed, std::uint64_t item) = 0;

    /// What was judged so far, in words: the figure.
    [[nodiscard]] virtual std::string figure() const = 0;

    /// How many items there are; any number unless items are enumerated.
    [[nodiscard]] virtual std::uint64_t items() const { return ~std::uint64_t{0}; }
};

/// A job by its name.
struct Entry {
    std::string name;
    std::string promise;
    std::uint64_t shortItems; ///< of its short form
    std::unique_ptr<Job> (*make)(const std::string& name);
};

/// The random numbers of one item.
inline std::mt19937_64 randomOf(std::uint64_t seed, std::uint64_t item) {
    std::seed_seq mixed{seed, seed >> 32U, item, item >> 32U};
    return std::mt19937_64(mixed);
}

std::unique_ptr<Job> makeRandomInputs(const std::string& name);
std::unique_ptr<Job> makeSolverProofs(const std::string& name);
std::unique_ptr<Job> makeEnumeration(const std::string& name);
std::unique_ptr<Job> makePreprocessorPairs(const std::string& name);
std::unique_ptr<Job> makeFaults(const std::string& name);
std::unique_ptr<Job> makeLibraryMemory(const std::string& name);
std::unique_ptr<Job> makeDeepTrees(const std::string& name);

} // namespace VT::Campaign
