// Reading and printing: the corpus, many short texts, and long ones.
#include "base/VCService.hpp"
#include "base/core/Nodes.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatText.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <memory>
#include <random>

namespace VT::Benchmarks {
namespace {

using Texts = std::vector<std::string>;

/// A comparison or sum over a thousand names of 3 to 14 bytes.
std::string randomTerm(std::mt19937_64& random) {
    static const char* const stems[] = {"Gear_", "x", "ENGINE_MODE", "Speed", "CONFIG_", "n"};
    static const char* const operators[] = {" == ", " != ", "<", " >= ", " > ", "<="};
    const auto below = [&](std::uint64_t bound) { return random() % bound; };
    const auto name = [&] { return stems[below(std::size(stems))] + std::to_string(below(170)); };
    const std::string left =
        below(4) == 0 ? name() + (below(2) == 0 ? "*" : " + ") + std::to_string(below(100)) : name();
    return left + operators[below(std::size(operators))] + (below(4) == 0 ? name() : std::to_string(below(1000)));
}

/// Terms joined by && and ||, some of them negated or in groups, of `bytes` bytes or a few more.
std::string randomText(std::mt19937_64& random, std::size_t bytes) {
    std::string text = randomTerm(random);
    bool open = false;
    while (text.size() < bytes) {
        text += random() % 2 == 0 ? " && " : " || ";
        if (!open && random() % 3 == 0) {
            open = true;
            text += random() % 2 == 0 ? "!(" : "(";
        }
        text += randomTerm(random);
        if (open && random() % 3 == 0) {
            open = false;
            text += ")";
        }
    }
    return text + (open ? ")" : "");
}

const Texts& corpus() {
    return readableLines();
}

/// 20,000 texts of 20 to 200 bytes.
const Texts& shortTexts() {
    static const Texts texts = [] {
        std::mt19937_64 random(1);
        Texts all;
        for (int i = 0; i < 20000; ++i)
            all.push_back(randomText(random, 20 + random() % 150));
        return all;
    }();
    return texts;
}

/// One text of 1 MiB.
const Texts& longText() {
    static const Texts texts = [] {
        std::mt19937_64 random(2);
        return Texts{randomText(random, std::size_t{1} << 20U)};
    }();
    return texts;
}

/// A sum over a thousand names, about five bytes a term.
Texts sumOf(std::int64_t terms) {
    std::string text = "n0";
    for (std::int64_t i = 1; i < terms; ++i)
        text += (i % 2 != 0 ? "+n" : "-n") + std::to_string(i * 7919 % 1000);
    return {text};
}

const Texts& shortSum() {
    static const Texts texts = sumOf(1000);
    return texts;
}

const Texts& longSum() {
    static const Texts texts = sumOf(100000);
    return texts;
}

std::size_t bytesOf(const Texts& texts) {
    std::size_t bytes = 0;
    for (const std::string& text : texts)
        bytes += text.size();
    return bytes;
}

using Choice = const Texts& (*)();

template <Choice Chosen>
void parseLibrary(benchmark::State& state, std::int64_t) {
    const Texts& texts = Chosen();
    measure(
        state, [] { return std::make_unique<SymbolicExprTable>(); },
        [&](auto& table) {
            SymbolicExprParser parser(*table, true, false);
            for (const std::string& text : texts)
                benchmark::DoNotOptimize(parser(text));
        });
}

template <Choice Chosen>
void parseFloor(benchmark::State& state, std::int64_t) {
    const Texts& texts = Chosen();
    bool isRead = true;
    measure(
        state, [] { return std::make_unique<Floor::FlatTable>(); },
        [&](auto& table) {
            for (const std::string& text : texts)
                isRead &= Floor::read(*table, text) != Floor::none;
        });
    if (!isRead)
        state.SkipWithError("the floor does not read what the library reads");
}

/// The texts in Quill, and the same conditions in C as the printer writes them.
template <Choice Chosen, bool quill>
const Texts& printedTexts() {
    static const Texts printed = [] {
        const VCServiceHandle service;
        Texts all;
        for (const std::string& text : Chosen())
            all.push_back(service->convertExprBetweenQandC(text, false, quill));
        return all;
    }();
    return printed;
}

template <Choice Chosen>
void parseQuill(benchmark::State& state, std::int64_t) {
    const Texts& texts = printedTexts<Chosen, true>();
    measure(
        state, [] { return std::make_unique<SymbolicExprTable>(); },
        [&](auto& table) {
            VTSymbolicExprErrorCheckerBlockVariants checker;
            SymbolicExprFromQParseTreeBlockVariants read(*table, checker);
            for (const std::string& text : texts)
                benchmark::DoNotOptimize(read(text));
        });
}

/// Texts are printed by a printer that has met none of their nodes.
template <Choice Chosen>
void printLibrary(benchmark::State& state, std::int64_t) {
    SymbolicExprTable table;
    std::vector<SymbolicExprId> ids;
    for (const std::string& text : Chosen())
        ids.push_back(SymbolicExprParser(table, true, false)(text));
    measure(
        state, [&] { return SymbolicExprPrinter(table, false); },
        [&](const SymbolicExprPrinter& printer) {
            for (const SymbolicExprId id : ids)
                benchmark::DoNotOptimize(printer(id));
        });
}

template <Choice Chosen>
void printFloor(benchmark::State& state, std::int64_t) {
    Floor::FlatTable table;
    std::vector<std::uint32_t> ids;
    for (const std::string& text : Chosen())
        ids.push_back(Floor::read(table, text));
    measure(
        state, [] { return Floor::Output(); },
        [&](Floor::Output& output) {
            for (const std::uint32_t id : ids)
                Floor::write(table, id, output);
            benchmark::DoNotOptimize(output.bytes.data());
        });
}

template <Choice Chosen>
void add(const std::string& what) {
    const auto bytes = static_cast<double>(bytesOf(Chosen()));
    compare({.name = "read C, " + what,
             .library = parseLibrary<Chosen>,
             .floor = parseFloor<Chosen>,
             .items = bytes,
             .unit = "byte",
             .mark = 2,
             .goal = 1.5});
    compare({.name = "print what is met first, " + what,
             .library = printLibrary<Chosen>,
             .floor = printFloor<Chosen>,
             .items = bytes,
             .unit = "byte",
             .mark = 2,
             .goal = 1.5});
}

template <Choice Chosen>
void addQuill(const std::string& what) {
    compare({.name = "read Quill (floor: C), " + what,
             .library = parseQuill<Chosen>,
             .floor = parseLibrary<printedTexts<Chosen, false>>,
             .items = static_cast<double>(bytesOf(printedTexts<Chosen, false>())),
             .unit = "byte",
             .mark = 1,
             .goal = 0.8});
}

const bool registered = [] {
    add<corpus>("corpus");
    add<shortTexts>("20,000 texts");
    add<longText>("text of 1 MiB");
    add<shortSum>("sum of 1,000");
    add<longSum>("sum of 100,000");
    addQuill<corpus>("corpus");
    addQuill<shortTexts>("20,000 texts");
    addQuill<longText>("text of 1 MiB");
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
