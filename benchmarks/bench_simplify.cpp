// Simplification, conversion and copies beside the least that any of them does: one walk that interns each node again.
#include "base/VCService.hpp"
#include "base/core/Nodes.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/XForm.hpp"
#include "benchmarks/BenchmarkCorpus.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatMinimiser.hpp"
#include "benchmarks/floors/FlatText.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <array>
#include <memory>
#include <random>

namespace VT::Benchmarks {
namespace {

/// Interns every record up to `root` again.  Operands stand before their operators, so one pass in order will do.
std::uint32_t internAgain(const Floor::FlatTable& source, std::uint32_t root, Floor::FlatTable& target) {
    std::vector<std::uint32_t> copies(root + 1);
    const auto copyOf = [&](std::uint32_t operand) { return operand == Floor::none ? operand : copies[operand]; };
    for (std::uint32_t id = 0; id <= root; ++id) {
        const Floor::Record& record = source[id];
        if (record.kind == Floor::Kind::Name)
            copies[id] = target.name(source.text(record));
        else if (record.kind == Floor::Kind::Integer)
            copies[id] = target.intern(record.kind, record.left, record.right);
        else
            copies[id] = target.intern(record.kind, copyOf(record.left), copyOf(record.right));
    }
    return copies[root];
}

/// An expression twice: as nodes and as records.
struct Subject {
    SymbolicExprTable table;
    Floor::FlatTable records;
    SymbolicExprId id = invalidId;
    std::uint32_t record = 0;
};

using Build = std::unique_ptr<Subject> (*)(std::int64_t size);

/// Builds the same expression both ways.  `Nodes` has intern(op, a, b), name(text) and integer(value).
struct NodeWriter {
    SymbolicExprTable& table;

    SymbolicExprId name(const std::string& text) const { return SymbolicString(table, text).getId(table); }

    SymbolicExprId integer(int value) const { return SymbolicIntValue(table, value).getId(table); }

    SymbolicExprId intern(SymbolicOp op, SymbolicExprId a, SymbolicExprId b) const {
        switch (op) {
        case SymbolicOp::And:
            return SymbolicAndExpr(table, a, b).getId(table);
        case SymbolicOp::Or:
            return SymbolicOrExpr(table, a, b).getId(table);
        case SymbolicOp::Plus:
            return SymbolicPlusExpr(table, a, b).getId(table);
        case SymbolicOp::Divide:
            return SymbolicDivideExpr(table, a, b).getId(table);
        case SymbolicOp::Equal:
            return SymbolicEqualExpr(table, a, b).getId(table);
        case SymbolicOp::NotEqual:
            return SymbolicNotEqualExpr(table, a, b).getId(table);
        case SymbolicOp::LessThan:
            return SymbolicLessThanExpr(table, a, b).getId(table);
        default:
            return SymbolicGreaterThanExpr(table, a, b).getId(table);
        }
    }
};

struct RecordWriter {
    Floor::FlatTable& table;

    std::uint32_t name(const std::string& text) const { return table.name(text); }

    std::uint32_t integer(int value) const {
        return table.intern(Floor::Kind::Integer, static_cast<std::uint32_t>(value), Floor::none);
    }

    std::uint32_t intern(SymbolicOp op, std::uint32_t a, std::uint32_t b) const {
        switch (op) {
        case SymbolicOp::And:
            return table.intern(Floor::Kind::And, a, b);
        case SymbolicOp::Or:
            return table.intern(Floor::Kind::Or, a, b);
        case SymbolicOp::Plus:
            return table.intern(Floor::Kind::Plus, a, b);
        case SymbolicOp::Divide:
            return table.intern(Floor::Kind::Divide, a, b);
        case SymbolicOp::Equal:
            return table.intern(Floor::Kind::Equal, a, b);
        case SymbolicOp::NotEqual:
            return table.intern(Floor::Kind::NotEqual, a, b);
        case SymbolicOp::LessThan:
            return table.intern(Floor::Kind::Less, a, b);
        default:
            return table.intern(Floor::Kind::Greater, a, b);
        }
    }
};

/// A left-deep chain of comparisons in random order: ten symbols, so that many operands meet.
template <SymbolicOp Op, class Writer>
auto chainOf(const Writer& writer, std::int64_t operands) {
    std::mt19937 random(17);
    constexpr bool isAnd = Op == SymbolicOp::And;
    constexpr SymbolicOp apart = isAnd ? SymbolicOp::NotEqual : SymbolicOp::Equal;
    constexpr SymbolicOp above = isAnd ? SymbolicOp::LessThan : SymbolicOp::GreaterThan;
    constexpr SymbolicOp below = isAnd ? SymbolicOp::GreaterThan : SymbolicOp::LessThan;
    const std::array ops{apart, above, below, apart};
    decltype(writer.name("")) chain = 0;
    for (std::int64_t i = 0; i < operands; ++i) {
        const SymbolicOp op = ops[random() % ops.size()];
        const int near = static_cast<int>(random() % 1000);
        const int constant = op == above ? 2000 + near : op == below ? near : 1000 + near;
        const auto term =
            writer.intern(op, writer.name("Symbol_" + std::to_string(random() % 10)), writer.integer(constant));
        chain = i == 0 ? term : writer.intern(Op, chain, term);
    }
    return chain;
}

template <class Writer>
auto conjunction(const Writer& writer, std::int64_t operands) {
    return chainOf<SymbolicOp::And>(writer, operands);
}

template <class Writer>
auto disjunction(const Writer& writer, std::int64_t operands) {
    return chainOf<SymbolicOp::Or>(writer, operands);
}

/// The same over as many symbols as operands, so that few operands meet.
template <class Writer>
auto conditions(const Writer& writer, std::int64_t operands) {
    std::mt19937 random(20);
    const std::array ops{SymbolicOp::NotEqual, SymbolicOp::LessThan, SymbolicOp::GreaterThan, SymbolicOp::Equal};
    decltype(writer.name("")) chain = 0;
    for (std::int64_t i = 0; i < operands; ++i) {
        const auto term = writer.intern(ops[random() % ops.size()], writer.name("Symbol_" + std::to_string(i)),
                                        writer.integer(static_cast<int>(random() % 1000)));
        chain = i == 0 ? term : writer.intern(SymbolicOp::And, chain, term);
    }
    return chain;
}

/// A left-deep sum of symbols, some of them again, and constants.
template <class Writer>
auto sum(const Writer& writer, std::int64_t terms) {
    std::mt19937 random(18);
    auto chain = writer.name("first");
    for (std::int64_t i = 1; i < terms; ++i) {
        const auto term = random() % 8 == 0 ? writer.integer(static_cast<int>(random() % 100))
                                            : writer.name("Symbol_" + std::to_string(random() % 5000));
        chain = writer.intern(SymbolicOp::Plus, chain, term);
    }
    return chain;
}

/// x+x, its double, the double of that: nodes in the number of levels, paths in two to that power.
template <class Writer>
auto doubling(const Writer& writer, std::int64_t levels) {
    auto node = writer.intern(SymbolicOp::Divide, writer.name("x"), writer.name("y"));
    for (std::int64_t i = 0; i < levels; ++i)
        node = writer.intern(SymbolicOp::Plus, node, node);
    return node;
}

#define BUILD_BOTH(function, size)                                                                                     \
    auto subject = std::make_unique<Subject>();                                                                        \
    subject->table.addBoolSymbols();                                                                                   \
    subject->id = function(NodeWriter{subject->table}, size);                                                          \
    subject->record = function(RecordWriter{subject->records}, size);                                                  \
    return subject

std::unique_ptr<Subject> conjunctionOf(std::int64_t size) {
    BUILD_BOTH(conjunction, size);
}

std::unique_ptr<Subject> disjunctionOf(std::int64_t size) {
    BUILD_BOTH(disjunction, size);
}

std::unique_ptr<Subject> conditionsOf(std::int64_t size) {
    BUILD_BOTH(conditions, size);
}

std::unique_ptr<Subject> sumOf(std::int64_t size) {
    BUILD_BOTH(sum, size);
}

std::unique_ptr<Subject> doublingOf(std::int64_t size) {
    BUILD_BOTH(doubling, size);
}

#undef BUILD_BOTH

template <Build build>
void simplifyLibrary(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& subject) {
            std::uint64_t passes = 0;
            benchmark::DoNotOptimize(SymbolicExprSimplify(subject->table).simplify(subject->id, passes));
        });
}

template <Build build>
void copyLibrary(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& subject) {
            SymbolicExprTable target;
            benchmark::DoNotOptimize(SymbolicExprXFormVisitor(target).rebuild(subject->table, subject->id));
        });
}

template <Build build>
void convertLibrary(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& subject) { benchmark::DoNotOptimize(SymbolicExprC2Q(subject->table)(subject->id)); });
}

template <Build build>
void copyFloor(benchmark::State& state, std::int64_t size) {
    measure(
        state, [&] { return build(size); },
        [](auto& subject) {
            Floor::FlatTable target;
            benchmark::DoNotOptimize(internAgain(subject->records, subject->record, target));
        });
}

void corpusLibrary(benchmark::State& state, std::int64_t) {
    struct Parsed {
        SymbolicExprTable table;
        std::vector<SymbolicExprId> ids;
    };

    measure(
        state,
        [] {
            auto parsed = std::make_unique<Parsed>();
            parsed->table.addBoolSymbols();
            for (const std::string& line : readableLines())
                parsed->ids.push_back(SymbolicExprParser(parsed->table, true, false)(line));
            return parsed;
        },
        [](auto& parsed) {
            const SymbolicExprSimplify simplifier(parsed->table);
            std::uint64_t passes = 0;
            for (const SymbolicExprId id : parsed->ids)
                benchmark::DoNotOptimize(simplifier.simplify(id, passes));
        });
}

/// The corpus in a service of its own.
struct ServiceCorpus {
    ServiceCorpus() {
        for (const std::string& line : readableLines())
            ids.push_back(service->parseC(line));
    }

    VCServiceHandle service;
    std::vector<SymbolicExprId> ids;
};

void shortestLibrary(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<ServiceCorpus>(); },
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->ids)
                benchmark::DoNotOptimize(corpus->service->shortestCondition(id, false));
        });
}

void shortestFloor(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<ServiceCorpus>(); },
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->ids)
                benchmark::DoNotOptimize(corpus->service->simplify(id, false));
        });
}

constexpr std::size_t randomConditions = 5000;

/// Conditions of 3 to 12 comparisons over three symbols.
const std::vector<std::string>& randomTexts() {
    static const std::vector<std::string> texts = [] {
        std::mt19937_64 random(19);
        std::vector<std::string> all;
        for (std::size_t i = 0; i < randomConditions; ++i)
            all.push_back(Testing::randomCondition(random, 3 + i % 10, {.lowest = -1, .highest = 2}));
        return all;
    }();
    return texts;
}

/// The random conditions in a service of its own, and what they become.
struct RandomCorpus {
    RandomCorpus() {
        for (const std::string& text : randomTexts())
            given.push_back(service->parseC(text));
    }

    /// Reports how many of the given comparisons are left, and how many results are proven smallest.
    void report(benchmark::State& state) const {
        const SymbolicExprTable& table = service->table();
        std::size_t before = 0;
        std::size_t after = 0;
        for (const SymbolicExprId id : given)
            before += Testing::countComparisons(table, id);
        for (const SymbolicExprId id : results)
            after += id == table.getIdTRUE() || id == table.getIdFALSE() ? 0 : Testing::countComparisons(table, id);
        state.counters["of the comparisons kept"] = static_cast<double>(after) / static_cast<double>(before);
        if (smallest > 0)
            state.counters["proven smallest"] = static_cast<double>(smallest) / static_cast<double>(results.size());
    }

    VCServiceHandle service;
    std::vector<SymbolicExprId> given;
    std::vector<SymbolicExprId> results;
    std::size_t smallest = 0;
};

std::unique_ptr<RandomCorpus> randomCorpus() {
    return std::make_unique<RandomCorpus>();
}

void randomNormalForms(benchmark::State& state, std::int64_t) {
    measure(
        state, randomCorpus,
        [](auto& corpus) {
            SymbolicExprTable& table = corpus->service->table();
            const SymbolicExprSimplify simplifier(table);
            for (const SymbolicExprId id : corpus->given) {
                SymbolicExprSimplifyVisitor visitor(table, true, simplifier.printer());
                std::uint64_t passes = 0;
                corpus->results.push_back(simplifier.simplify(id, passes, visitor));
                corpus->smallest += visitor.isSmallest(corpus->results.back()) ? 1 : 0;
            }
        },
        [&](const auto& corpus) { corpus->report(state); });
}

void randomShortestForms(benchmark::State& state, std::int64_t) {
    measure(
        state, randomCorpus,
        [](auto& corpus) {
            for (const SymbolicExprId id : corpus->given)
                corpus->results.push_back(corpus->service->shortestCondition(id, false).id());
        },
        [&](const auto& corpus) { corpus->report(state); });
}

/// The random conditions as records.
struct RandomRecords {
    RandomRecords() {
        for (const std::string& text : randomTexts())
            given.push_back(Floor::read(table, text));
    }

    Floor::FlatTable table;
    std::vector<std::uint32_t> given;
    std::size_t after = 0;
};

void randomFloor(benchmark::State& state, std::int64_t) {
    measure(
        state, [] { return std::make_unique<RandomRecords>(); },
        [](auto& records) {
            Floor::FlatMinimiser minimiser(records->table);
            for (const std::uint32_t id : records->given) {
                benchmark::DoNotOptimize(minimiser.run(id));
                records->after += minimiser.comparisons();
            }
        },
        [&](const auto& records) {
            std::size_t before = 0;
            for (const std::string& text : randomTexts()) // a name in each comparison
                before +=
                    static_cast<std::size_t>(std::ranges::count_if(text, [](char c) { return c >= 'A' && c <= 'C'; }));
            state.counters["of the comparisons kept"] =
                static_cast<double>(records->after) / static_cast<double>(before);
        });
}

const bool registered = [] {
    compare({.name = "normal forms of random conditions",
             .library = randomNormalForms,
             .floor = randomFloor,
             .items = randomConditions,
             .unit = "condition",
             .mark = 1,
             .goal = 0.5});
    compare({.name = "shortest forms of random conditions",
             .library = randomShortestForms,
             .floor = randomFloor,
             .items = randomConditions,
             .unit = "condition"});
    compare({.name = "normal forms of the corpus",
             .library = corpusLibrary,
             .floor = nullptr,
             .items = static_cast<double>(readableLines().size()),
             .unit = "line",
             .goalSeconds = 2e-6});
    compare({.name = "shortest forms of the corpus (floor: its normal forms)",
             .library = shortestLibrary,
             .floor = shortestFloor,
             .items = static_cast<double>(readableLines().size()),
             .unit = "line"});
    const auto addChain = [](const std::string& name, Side library, Side floor, std::int64_t operands) {
        compare({.name = "simplify " + name + " of " + std::to_string(operands),
                 .library = library,
                 .floor = floor,
                 .size = operands,
                 .items = static_cast<double>(operands),
                 .unit = "operand",
                 .markSeconds = 1e-6,
                 .goalSeconds = 0.3e-6});
    };
    for (const std::int64_t operands : {100, 1000, 10000, 100000}) {
        addChain("And", simplifyLibrary<conjunctionOf>, copyFloor<conjunctionOf>, operands);
        addChain("Or", simplifyLibrary<disjunctionOf>, copyFloor<disjunctionOf>, operands);
        addChain("And, distinct symbols,", simplifyLibrary<conditionsOf>, copyFloor<conditionsOf>, operands);
    }
    for (const std::int64_t terms : {1000, 10000, 100000, 1000000})
        compare({.name = "simplify a sum of " + std::to_string(terms),
                 .library = simplifyLibrary<sumOf>,
                 .floor = copyFloor<sumOf>,
                 .size = terms,
                 .items = static_cast<double>(terms),
                 .unit = "term"});
    const std::int64_t levels = 60;
    const std::string graph = std::to_string(levels) + " doublings";
    compare(
        {.name = "copy " + graph, .library = copyLibrary<doublingOf>, .floor = copyFloor<doublingOf>, .size = levels});
    compare({.name = "convert " + graph,
             .library = convertLibrary<doublingOf>,
             .floor = copyFloor<doublingOf>,
             .size = levels});
    compare({.name = "simplify " + graph,
             .library = simplifyLibrary<doublingOf>,
             .floor = copyFloor<doublingOf>,
             .size = levels});
    compare({.name = "copy a sum of 1000000",
             .library = copyLibrary<sumOf>,
             .floor = copyFloor<sumOf>,
             .size = 1000000,
             .items = 1e6,
             .unit = "term"});
    return true;
}();

} // namespace
} // namespace VT::Benchmarks
