// One question of a host: the simplified text of a condition, for a text that was asked about before and for a new one.
#include "base/VCService.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"

#include <algorithm>
#include <memory>

namespace VT::Benchmarks {
namespace {

/// The texts of the corpus, each once.
const std::vector<std::string>& distinctLines() {
    static const std::vector<std::string> lines = [] {
        std::vector<std::string> all = readableLines();
        std::ranges::sort(all);
        all.erase(std::unique(all.begin(), all.end()), all.end());
        return all;
    }();
    return lines;
}

void askAll(const VCServiceHandle& service, const std::vector<std::string>& lines) {
    for (const std::string& line : lines)
        benchmark::DoNotOptimize(service->simplifyCExprFromCCondition(line));
}

void newTexts(benchmark::State& state, std::int64_t) {
    const auto& lines = distinctLines();
    measure(
        state, [] { return std::make_unique<VCServiceHandle>(); }, [&](auto& service) { askAll(*service, lines); });
}

/// As many texts as a model's blocks have, again and again.
void knownTexts(benchmark::State& state, std::int64_t size) {
    const auto& all = distinctLines();
    std::vector<std::string> lines;
    for (std::int64_t i = 0; i < size; ++i)
        lines.push_back(all[static_cast<std::size_t>(i) * all.size() / static_cast<std::size_t>(size)]);
    const VCServiceHandle service;
    askAll(service, lines);
    measure(
        state, [&] { return &service; }, [&](const VCServiceHandle* known) { askAll(*known, lines); });
}

const bool registered = [] {
    compare({.name = "service: simplify a new text",
             .library = newTexts,
             .floor = nullptr,
             .items = static_cast<double>(distinctLines().size()),
             .unit = "text"});
    for (const std::int64_t texts : {100, 5000})
        compare({.name = "service: simplify one of " + std::to_string(texts) + " known texts",
                 .library = knownTexts,
                 .floor = nullptr,
                 .size = texts,
                 .items = static_cast<double>(texts),
                 .unit = "text",
                 .markSeconds = 100e-9});
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
