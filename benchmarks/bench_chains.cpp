// Simplification, conversion and copies of chains and graphs beside the least that any of them does: one walk that
// interns each node again.
#include "base/core/Nodes.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/XForm.hpp"
#include "benchmarks/Comparison.hpp"
#include "benchmarks/floors/FlatTable.hpp"

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

const bool registered = [] {
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
