// Reading and printing: the corpus, and one long text.
#include "base/VCService.hpp"
#include "base/core/Nodes.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/FloorText.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <memory>

namespace VT::Benchmarks {
namespace {

/// A sum of so many terms over a thousand names, about five bytes a term.
std::string longText(std::int64_t terms) {
    std::string text = "n0";
    for (std::int64_t i = 1; i < terms; ++i)
        text += (i % 2 != 0 ? "+n" : "-n") + std::to_string(i * 7919 % 1000);
    return text;
}

/// The texts of a measurement: the corpus for size 0, one long text otherwise.
std::vector<std::string> texts(std::int64_t size) {
    return size == 0 ? readableLines() : std::vector<std::string>{longText(size)};
}

void parseLibrary(benchmark::State& state, std::int64_t size) {
    const auto lines = texts(size);
    measure(
        state, [] { return std::make_unique<SymbolicExprTable>(); },
        [&](auto& table) {
            SymbolicExprParser parser(*table, true, false);
            for (const std::string& line : lines)
                benchmark::DoNotOptimize(parser(line));
        });
}

void parseFloor(benchmark::State& state, std::int64_t size) {
    const auto lines = texts(size);
    bool read = true;
    measure(
        state, [] { return std::make_unique<RecordTable>(); },
        [&](auto& table) {
            for (const std::string& line : lines)
                read &= readRecords(*table, line).has_value();
        });
    if (!read)
        state.SkipWithError("the floor does not read what the library reads");
}

/// The corpus in Quill, and the same conditions in C as the printer writes them.
std::vector<std::string> printedLines(bool quill) {
    const VCServiceHandle service;
    std::vector<std::string> lines;
    for (const std::string& line : readableLines())
        lines.push_back(service->convertExprBetweenQandC(line, false, quill));
    return lines;
}

void parseQuill(benchmark::State& state, std::int64_t) {
    const auto lines = printedLines(true);
    measure(
        state, [] { return std::make_unique<SymbolicExprTable>(); },
        [&](auto& table) {
            VTSymbolicExprErrorCheckerBlockVariants checker;
            SymbolicExprFromQParseTreeBlockVariants read(*table, checker);
            for (const std::string& line : lines)
                benchmark::DoNotOptimize(read(line));
        });
}

void parseGrammar(benchmark::State& state, std::int64_t) {
    const auto lines = printedLines(false);
    measure(
        state, [] { return std::make_unique<SymbolicExprTable>(); },
        [&](auto& table) {
            SymbolicExprParser parser(*table, true, false);
            for (const std::string& line : lines)
                benchmark::DoNotOptimize(parser(line));
        });
}

void printLibrary(benchmark::State& state, std::int64_t size) {
    SymbolicExprTable table;
    std::vector<SymbolicExprId> ids;
    for (const std::string& line : texts(size))
        ids.push_back(SymbolicExprParser(table, true, false)(line));
    measure(
        state, [&] { return SymbolicExprPrinter(table, false); },
        [&](const SymbolicExprPrinter& printer) {
            for (const SymbolicExprId id : ids)
                benchmark::DoNotOptimize(printer(id));
        });
}

void printFloor(benchmark::State& state, std::int64_t size) {
    RecordTable table;
    std::vector<std::uint32_t> ids;
    for (const std::string& line : texts(size))
        ids.push_back(readRecords(table, line).value());
    measure(
        state, [] { return 0; },
        [&](int) {
            for (const std::uint32_t id : ids) {
                std::string text;
                writeRecord(table, id, text);
                benchmark::DoNotOptimize(text);
            }
        });
}

const bool registered = [] {
    const auto lines = static_cast<double>(readableLines().size());
    compare({.name = "parse the corpus",
             .library = parseLibrary,
             .floor = parseFloor,
             .items = lines,
             .unit = "line",
             .mark = 4});
    compare({.name = "parse the corpus in Quill, beside C",
             .library = parseQuill,
             .floor = parseGrammar,
             .items = lines,
             .unit = "line",
             .mark = 1.5});
    compare({.name = "print the corpus",
             .library = printLibrary,
             .floor = printFloor,
             .items = lines,
             .unit = "line",
             .mark = 3});
    for (const std::int64_t terms : {100000, 200000}) {
        const auto items = static_cast<double>(terms);
        const std::string text = std::to_string(terms) + " terms";
        compare({.name = "parse " + text,
                 .library = parseLibrary,
                 .floor = parseFloor,
                 .size = terms,
                 .items = items,
                 .unit = "term",
                 .mark = 4});
        // The floor recurses; the left spine of so many terms would overflow the stack.
    }
    for (const std::int64_t terms : {1000, 20000}) {
        const auto items = static_cast<double>(terms);
        compare({.name = "print " + std::to_string(terms) + " terms",
                 .library = printLibrary,
                 .floor = printFloor,
                 .size = terms,
                 .items = items,
                 .unit = "term",
                 .mark = 3});
    }
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
