// Scans of files beside plainly reading their directives, and how the cost grows with the branches of a file and with
// the length of a chain.
#include "base/scan/DirectiveReader.hpp"
#include "base/scan/SourceScan.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"

#include <random>

namespace VT::Benchmarks {
namespace {

using MakeText = std::string (*)(std::int64_t branches);

/// Real conditions in chains within chains, some lines of code in each branch, names that are defined on the way.
std::string realConditions(std::int64_t branches) {
    static const std::vector<std::string> lines = readableLines();
    std::mt19937 random(7);
    const auto below = [&](std::size_t bound) {
        return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random);
    };
    std::string text;
    std::size_t at = 0;
    std::size_t depth = 0;
    for (std::int64_t i = 0; i < branches; ++i) {
        if (i % 32 == 0)
            at = below(lines.size() - 32); // neighbours come from one file
        const std::size_t choice = below(4);
        if (depth > 0 && choice == 0) {
            text += "#endif\n";
            --depth;
        }
        const bool opens = depth == 0 || (depth < 6 && choice < 3);
        text += (opens ? "#if " : "#elif ") + lines[at + below(32)] + "\n";
        depth += opens ? 1 : 0;
        text += "#define MACRO_" + std::to_string(i) + " (VALUE + " + std::to_string(i) + ")\n";
        for (std::size_t line = below(8); line > 0; --line)
            text += "    result += table[index].value(\"text\", 'c', 0x10) * 3; // as before\n";
    }
    for (; depth > 0; --depth)
        text += "#endif\n";
    return text;
}

/// One chain over one macro.
std::string longChain(std::int64_t branches) {
    std::string text = "#if BOARD == 0\n";
    for (std::int64_t i = 1; i < branches; ++i)
        text += "#elif BOARD == " + std::to_string(i) + "\n";
    return text + "#endif\n";
}

/// Chains that each begin within the one before, over a macro each.
std::string deepNest(std::int64_t branches) {
    std::string text;
    for (std::int64_t i = 0; i < branches; ++i)
        text += "#if LEVEL_" + std::to_string(i) + " > 1 && LEVEL_" + std::to_string(i / 2) + "\n";
    return text;
}

/// A macro and a constant for each branch, every macro between two that are there.
std::string distinctMacros(std::int64_t branches) {
    std::string text = "#ifdef MACRO_Z\n";
    for (std::int64_t i = 0; i < branches; ++i)
        text += "#if MACRO_" + std::to_string(branches + i) + " > " + std::to_string(i) + " && MACRO_Z\n#endif\n";
    return text;
}

template <MakeText Make>
void scanLibrary(benchmark::State& state, std::int64_t branches) {
    const std::string text = Make(branches);
    measure(
        state, [] { return std::make_unique<SourceScanner>(); },
        [&](auto& scanner) {
            std::size_t found = 0;
            scanner->scan(text, false, [&](const BranchFinding&) { ++found; });
            benchmark::DoNotOptimize(found);
        });
}

template <MakeText Make>
void readFloor(benchmark::State& state, std::int64_t branches) {
    const std::string text = Make(branches);
    measure(
        state, [&] { return DirectiveReader(text); },
        [](DirectiveReader& reader) {
            std::size_t tokens = 0;
            for (Directive directive; reader.next(directive);)
                tokens += directive.tokens.size();
            benchmark::DoNotOptimize(tokens);
        });
}

template <MakeText Make>
void add(const std::string& what, std::int64_t branches) {
    compare({.name = "scan " + std::to_string(branches) + " branches" + what + " (floor: read)",
             .library = scanLibrary<Make>,
             .floor = readFloor<Make>,
             .size = branches,
             .items = static_cast<double>(branches),
             .unit = "branch"});
}

const bool registered = [] {
    for (const std::int64_t branches : {100, 1000, 10000, 100000})
        add<realConditions>("", branches);
    for (const std::int64_t branches : {1000, 10000}) {
        add<longChain>(" of one chain", branches);
        add<deepNest>(" within each other", branches);
    }
    for (const std::int64_t branches : {10000, 100000})
        add<distinctMacros>(" of distinct macros", branches);
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
