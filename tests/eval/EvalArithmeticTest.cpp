// Every operator on every pair of corner values, and expressions in every way of evaluation, against arithmetic written
// down again over wide integers.
#include "base/eval/ColumnLoops.hpp"
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/WideArithmetic.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <functional>
#include <limits>
#include <map>
#include <random>
#include <set>
#include <span>

namespace VT::Testing {
namespace {

std::string shown(const SymbolicScalar& value) {
    return std::string(1, "bid"[value.index()]) + ":" + std::to_string(value.toDouble());
}

TEST(Arithmetic, AgreesWithWideIntegersOnEveryPairOfCornerValues) {
    SymbolicExprTable table;
    const SymbolicExprId a = Trees{table}.name("a"), b = Trees{table}.name("b");
    std::vector<SymbolicExprId> literals;
    for (const SymbolicScalar& value : cornerScalars())
        literals.push_back(scalarLiteral(table, value));
    std::size_t operators = 0;
    for (const OperatorInfo& row : operatorTable()) {
        if (row.op <= SymbolicOp::DoubleValue || row.op == SymbolicOp::MemberValue || dimensionOps.contains(row.op))
            continue;
        const SymbolicExprId id = makeNode(table, row.op, {a, b, b});
        const SymbolicExprEval evaluator(table);
        if (scalarRuleIndex(row.op) == ScalarRuleIndex::None) {
            EXPECT_THROW(static_cast<void>(evaluator.eval(id)), HostDiagnostic) << row.name;
            EXPECT_THROW(static_cast<void>(evaluator.prepare(id)), HostDiagnostic) << row.name;
            continue;
        }
        const std::size_t operands = operandCount(row.op).value();
        ++operators;
        PreparedExpr prepared = evaluator.prepare(id);
        for (std::size_t i = 0; i < cornerScalars().size(); ++i)
            for (std::size_t j = 0; j < (operands == 1 ? 1 : cornerScalars().size()); ++j) {
                const SymbolicScalar &left = cornerScalars()[i], &right = cornerScalars()[j];
                const SymbolicScalar wanted = visibleScalar(expectedScalar(row.op, left, right));
                table.registerValueId(a, literals[i]);
                table.registerValueId(b, literals[j]);
                prepared.set(0, left);
                if (operands == 2)
                    prepared.set(1, right);
                const SymbolicScalar answer = evaluator.eval(id).scalar();
                ASSERT_EQ(answer, wanted) << shown(left) << " " << row.name << " " << shown(right) << " is "
                                          << shown(answer) << ", not " << shown(wanted);
                ASSERT_EQ(prepared.run().scalar(), wanted) << shown(left) << " " << row.name << " " << shown(right);
            }
    }
    EXPECT_EQ(operators, scalarRules.size());
}

/// What an expression is worth, or the key of what is reported about it.
struct Outcome {
    std::string error;
    bool isVector = false;
    std::vector<SymbolicScalar> values = {};

    bool operator==(const Outcome&) const = default;

    friend std::ostream& operator<<(std::ostream& stream, const Outcome& outcome) {
        for (const SymbolicScalar& value : outcome.values)
            stream << shown(value) << " ";
        return stream << outcome.error;
    }
};

/// The value of an expression by recursion over the tree; expressions are small.
class Model {
public:
    explicit Model(const SymbolicExprTable& table) : table_(table) {}

    Outcome of(SymbolicExprId id) { // NOLINT(misc-no-recursion)
        const SymbolicExpr& node = *table_.get(id);
        const SymbolicOp op = node.op();
        if (op == SymbolicOp::IntValue)
            return scalar(static_cast<const SymbolicIntValue&>(node).getValue());
        if (op == SymbolicOp::DoubleValue)
            return scalar(static_cast<const SymbolicDoubleValue&>(node).getValue());
        if (op == SymbolicOp::String || op == SymbolicOp::MemberValue)
            return ofSymbol(id, node);
        const bool isList = dimensionOps.contains(op);
        if (!isList && scalarRuleIndex(op) == ScalarRuleIndex::None)
            return {"NotEvaluable"};
        std::vector<Outcome> operands;
        for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
            if (node.getInput(i) >= id)
                return {"NotEvaluable"};
            operands.push_back(of(node.getInput(i)));
            if (!operands.back().error.empty())
                return operands.back();
        }
        return isList ? listed(operands) : combined(op, operands.front(), operands.back());
    }

private:
    static Outcome scalar(SymbolicScalar value) { return {"", false, {value}}; }

    Outcome ofSymbol(SymbolicExprId id, const SymbolicExpr& node) { // NOLINT(misc-no-recursion)
        const bool isMember = node.op() == SymbolicOp::MemberValue;
        const std::string name = isMember ? "" : static_cast<const SymbolicString&>(node).getName();
        if (name == "true" || name == "false")
            return scalar(name == "true");
        const SymbolicExprId value = table_.getValueId(id);
        if (value == invalidId)
            return {isMember ? "NotEvaluable" : "UnboundSymbol"};
        if (!open_.insert(id).second)
            return {"CyclicValue"};
        const Outcome outcome = of(value);
        open_.erase(id);
        return outcome;
    }

    static Outcome listed(const std::vector<Outcome>& elements) {
        Outcome list{"", true, {}};
        for (const Outcome& element : elements) {
            if (element.isVector)
                return {"NotEvaluable"};
            list.values.push_back(element.values.front());
        }
        return list;
    }

    static Outcome combined(SymbolicOp op, const Outcome& a, const Outcome& b) {
        if (a.isVector && b.isVector && a.values.size() != b.values.size())
            return {"SizeMismatch"};
        Outcome result{"", a.isVector || b.isVector, {}};
        const std::size_t count = a.isVector ? a.values.size() : b.values.size();
        for (std::size_t i = 0; i < count; ++i)
            result.values.push_back(expectedScalar(op, a.values[a.isVector ? i : 0], b.values[b.isVector ? i : 0]));
        return result;
    }

    const SymbolicExprTable& table_;
    std::set<SymbolicExprId> open_;
};

template <class Evaluate>
Outcome outcomeOf(Evaluate evaluate) {
    try {
        const SymbolicValue value = evaluate();
        return value.isVector() ? Outcome{"", true, value.elements()} : Outcome{"", false, {value.scalar()}};
    } catch (const HostDiagnostic& diagnostic) {
        return {diagnostic.messageId().substr(diagnostic.messageId().rfind(':') + 1)};
    }
}

/// The model's outcome with what of it is visible.
Outcome modelled(const SymbolicExprTable& table, SymbolicExprId id) {
    Outcome outcome = Model(table).of(id);
    std::ranges::transform(outcome.values, outcome.values.begin(), visibleScalar);
    return outcome;
}

/// Operators over corner values, symbols and members.  In a wild graph some operators have no value and some operands
/// are missing.
class Graph {
public:
    Graph(unsigned seed, bool isWild) : random_(seed) {
        for (const char* const symbol :
             {"a", "b", "s", "true", "MemberValue(a,x)", "MemberValue(s,x)", "MemberValue(MemberValue(a,x),x)"})
            symbols.push_back(readTree(table, symbol));
        nodes = symbols;
        for (int i = 0; i < 8; ++i)
            nodes.push_back(scalarLiteral(table, anyScalar()));
        while (nodes.size() < 50) {
            const SymbolicOp op = isWild && below(30) == 0 ? operatorTable()[below(operatorTable().size())].op
                                  : below(15) == 0         ? SymbolicOp::DimsND
                                                           : scalarRules[below(scalarRules.size())].op;
            std::vector<SymbolicExprId> inputs(operandCount(op).value_or(below(4)));
            for (SymbolicExprId& input : inputs)
                input = isWild && below(200) == 0 ? table.size() + below(3)
                        : isWild && below(300) == 0
                            ? invalidId
                            : nodes[nodes.size() - 1 - below(std::min<std::size_t>(20, nodes.size()))];
            if (op > SymbolicOp::DoubleValue)
                nodes.push_back(makeNode(table, op, inputs));
        }
    }

    std::size_t below(std::size_t bound) { return random_() % bound; }

    SymbolicScalar anyScalar() { return cornerScalars()[below(cornerScalars().size())]; }

    /// Gives a symbol a number or a list of numbers, and answers it.
    SymbolicValue rebind(SymbolicExprId symbol) {
        SymbolicValue::Elements elements;
        std::vector<SymbolicExprId> literals;
        for (std::size_t i = below(2) == 0 ? 2 : below(4); i > 0; --i) {
            elements.push_back(anyScalar());
            literals.push_back(scalarLiteral(table, elements.back()));
        }
        const bool isList = elements.empty() || below(6) == 0;
        table.registerValueId(symbol, isList ? SymbolicNDExpr(table, literals).getId(table) : literals.front());
        return isList ? SymbolicValue(elements) : SymbolicValue(elements.front());
    }

    SymbolicExprTable table;
    std::vector<SymbolicExprId> symbols, nodes;

private:
    std::mt19937_64 random_;
};

// Every way of asking answers what the model does.
TEST(Ways, AgreeOnRandomGraphsOfBoundAndMissingParts) {
    std::size_t values = 0, faults = 0;
    for (unsigned seed = 0; seed < 800; ++seed) {
        Graph graph(seed, true);
        for (const SymbolicExprId symbol : graph.symbols)
            if (graph.below(4) != 0)
                graph.table.registerValueId(
                    symbol, graph.nodes[graph.below(3) == 0 ? graph.below(graph.nodes.size()) : graph.symbols.size()]);
        for (const SymbolicExprId id : graph.nodes) {
            const SymbolicExprTable& table = graph.table;
            const Outcome wanted = modelled(table, id);
            SymbolicExprEvalImpl executed(table), accepted(table);
            const SymbolicExprEval evaluator(table);
            ASSERT_EQ(outcomeOf([&] { return evaluator.eval(id); }), wanted) << seed;
            ASSERT_EQ(outcomeOf([&] { return executed.execute(table, id), executed.get(); }), wanted) << seed;
            ASSERT_EQ(outcomeOf([&] { return table.get(id)->accept(table, accepted), accepted.get(); }), wanted)
                << seed;
            const Outcome prepared = outcomeOf([&] { return evaluator.prepare(id).run(); });
            if (wanted.error.empty())
                ASSERT_EQ(prepared, wanted) << seed;
            else // it may come upon another fault first
                ASSERT_NE(prepared.error, "") << seed;
            ++(wanted.error.empty() ? values : faults);
        }
    }
    EXPECT_GT(values, 8000U);
    EXPECT_GT(faults, 8000U);
}

TEST(Prepared, AnswersWhateverItsSlotsAndTheTableHold) {
    std::size_t values = 0, faults = 0, again = 0;
    for (unsigned seed = 0; seed < 2000; ++seed) {
        Graph graph(seed, false);
        const SymbolicExprEval evaluator(graph.table);
        const SymbolicExprId root = graph.nodes.back();
        PreparedExpr prepared = evaluator.prepare(root);
        PreparedExpr early = prepared;
        for (const SymbolicExprId symbol : graph.symbols)
            if (graph.below(4) != 0)
                graph.rebind(symbol);
        const bool failedEarly = !outcomeOf([&] { return early.run(); }).error.empty();
        for (int round = 0; round < 10; ++round) {
            for (const SymbolicExprId symbol : graph.symbols) {
                if (round > 0 && graph.below(2) == 0)
                    continue;
                const SymbolicValue value = graph.rebind(symbol);
                // In the first round some are left to be taken from the table.
                if (const auto slot = prepared.slotOf(symbol); slot && (round > 0 || graph.below(2) == 0))
                    prepared.set(*slot, value);
            }
            const Outcome wanted = modelled(graph.table, root);
            if (round == 0 && failedEarly) {
                ASSERT_EQ(outcomeOf([&] { return early.run(); }), wanted) << "kept from a failed run, seed " << seed;
                ++again;
            }
            for (int time = 0; time < 2; ++time)
                ASSERT_EQ(outcomeOf([&] { return prepared.run(); }), wanted) << "seed " << seed << ", round " << round;
            ++(wanted.error.empty() ? values : faults);
            if (graph.below(3) == 0) { // a copy goes on alone
                PreparedExpr copy = prepared;
                prepared = copy;
                if (copy.slotCount() > 0)
                    copy.set(0, SymbolicValue::Elements{1, 2, 3});
                static_cast<void>(outcomeOf([&] { return copy.run(); }));
            }
        }
    }
    EXPECT_GT(values, 8000U);
    EXPECT_GT(faults, 1000U);
    EXPECT_GT(again, 300U);
}

/// A column of values of one type, packed or with gaps, in either direction, at any address.
class Column {
public:
    Column(Graph& graph, ValueColumn::Type type, std::size_t rows) : type_(type) {
        const auto size = static_cast<std::ptrdiff_t>(type == ValueColumn::Type::Bool    ? 1
                                                      : type == ValueColumn::Type::Int32 ? 4
                                                                                         : 8);
        const std::array<std::ptrdiff_t, 4> strides{size, size + 3, -size, 2 * size};
        stride_ = strides.at(graph.below(strides.size()));
        bytes_.resize((rows + 2) * static_cast<std::size_t>(size + std::abs(stride_)));
        first_ = bytes_.data() + graph.below(2) * 4 + (stride_ < 0 ? static_cast<std::ptrdiff_t>(rows) * size : 0);
        while (values_.size() < rows) {
            const SymbolicScalar value = graph.anyScalar();
            std::byte* const to = first_ + static_cast<std::ptrdiff_t>(values_.size()) * stride_;
            const auto integer = expectedScalar(SymbolicOp::BitOr, value, 0).getInt();
            const std::int64_t wide = integer;
            const double real = value.toDouble();
            const unsigned char byte = integer == 0 ? 0 : graph.below(2) == 0 ? 1 : 255;
            if (type == ValueColumn::Type::Bool) {
                std::memcpy(to, &byte, 1);
                values_.emplace_back(byte != 0);
            } else if (type == ValueColumn::Type::Double) {
                std::memcpy(to, &real, 8);
                values_.emplace_back(real);
            } else {
                type == ValueColumn::Type::Int32 ? std::memcpy(to, &integer, 4) : std::memcpy(to, &wide, 8);
                values_.emplace_back(integer);
            }
        }
    }

    [[nodiscard]] ValueColumn of(std::size_t slot) const { return {slot, type_, first_, stride_}; }

    [[nodiscard]] const SymbolicScalar& operator[](std::size_t row) const { return values_[row]; }

private:
    ValueColumn::Type type_;
    std::ptrdiff_t stride_;
    std::vector<std::byte> bytes_;
    std::byte* first_;
    std::vector<SymbolicScalar> values_;
};

/// The values of a run over columns, or the key of what is reported.
Outcome manyOf(PreparedExpr& prepared, std::span<const ValueColumn> columns, std::size_t rows) {
    std::vector<double> room(rows + 1);
    ScalarType type = ScalarType::Bool;
    try {
        prepared.runMany(columns, rows, [&](ScalarType settled) {
            type = settled;
            return room.data();
        });
    } catch (const std::invalid_argument&) {
        return {"vector"};
    } catch (const HostDiagnostic& diagnostic) {
        return {diagnostic.messageId().substr(diagnostic.messageId().rfind(':') + 1)};
    }
    Outcome outcome;
    for (std::size_t row = 0; row < rows; ++row)
        if (type == ScalarType::Double)
            outcome.values.emplace_back(room[row]);
        else if (type == ScalarType::Int)
            outcome.values.emplace_back(reinterpret_cast<const std::int32_t*>(room.data())[row]);
        else
            outcome.values.emplace_back(reinterpret_cast<const unsigned char*>(room.data())[row] == 1);
    return outcome;
}

// Every row is what one run with its values is, for every operator, type, stride and block.
TEST(Prepared, RunsManyRowsAsItRunsEach) {
    std::size_t values = 0, faults = 0;
    for (unsigned seed = 0; seed < 1500; ++seed) {
        Graph graph(seed, false);
        for (const SymbolicExprId symbol : graph.symbols)
            if (graph.below(20) != 0)
                graph.table.registerValueId(symbol, scalarLiteral(graph.table, graph.anyScalar()));
        PreparedExpr prepared = SymbolicExprEval(graph.table).prepare(graph.nodes[graph.nodes.size() - 1 - seed % 3]);
        const std::size_t rows = graph.below(10) == 0 ? 2100 + graph.below(300) : graph.below(70);
        std::vector<Column> columns;
        std::vector<ValueColumn> given;
        for (std::size_t slot = 0; slot < prepared.slotCount(); ++slot)
            if (graph.below(4) != 0) {
                columns.emplace_back(graph, static_cast<ValueColumn::Type>(graph.below(4)), rows);
                given.push_back(columns.back().of(slot));
            } else if (graph.below(2) == 0) {
                prepared.set(slot, graph.anyScalar());
            }
        const PreparedExpr before = prepared;
        const Outcome many = manyOf(prepared, given, rows);
        ASSERT_EQ(manyOf(prepared, given, rows), many);
        PreparedExpr each = before;
        for (std::size_t row = 0; row < std::max<std::size_t>(rows, 1); ++row) {
            for (std::size_t i = 0; i < given.size(); ++i)
                each.set(given[i].slot, rows == 0 ? SymbolicScalar(1) : columns[i][row]);
            const Outcome one = outcomeOf([&] { return each.run(); });
            ASSERT_EQ(many.error, one.isVector ? "vector" : one.error) << seed;
            if (one.isVector || !one.error.empty() || rows == 0)
                break;
            ASSERT_EQ(many.values[row], one.values.front())
                << seed << ", row " << row << ": " << shown(many.values[row]) << " " << shown(one.values.front());
        }
        ++(many.error.empty() ? values : faults);
        PreparedExpr after = prepared, same = before; // the slots hold what they held
        ASSERT_EQ(outcomeOf([&] { return after.run(); }), outcomeOf([&] { return same.run(); })) << seed;
    }
    EXPECT_GT(values, 700U);
    EXPECT_GT(faults, 100U);
}

// The loops for wide registers leave the same bytes as those for every processor.
TEST(ColumnLoops, AreTheSameForWideRegisters) {
    const detail::Registers most = detail::widestRegisters();
    if (most == detail::Registers::Plain)
        GTEST_SKIP() << "this processor has no wide registers";
    constexpr std::size_t rows = 1000;
    std::array<std::vector<double>, scalarTypes> columns; // room for each type
    std::mt19937_64 random(1);
    for (std::size_t type = 0; type < scalarTypes; ++type) {
        columns.at(type).resize(2 * rows);
        for (std::size_t i = 0; i < 2 * rows; ++i) {
            const SymbolicScalar value = cornerScalars()[random() % cornerScalars().size()];
            if (type == 0)
                reinterpret_cast<bool*>(columns[0].data())[i] = value.toDouble() > 0;
            else if (type == 1)
                reinterpret_cast<std::int32_t*>(columns[1].data())[i] =
                    expectedScalar(SymbolicOp::BitOr, value, 0).getInt();
            else
                columns[2][i] = visibleScalar(value.toDouble()).getDouble();
        }
    }
    for (std::uint32_t code = 0; code < detail::endCode; ++code) {
        const void* const left = columns.at(code % detail::typePairs / scalarTypes).data();
        const auto& operand = columns.at(code % scalarTypes);
        const ScalarRule& rule = scalarRules.at(static_cast<std::size_t>(detail::ruleOfCode(code)));
        const bool isReal =
            rule.by[code % detail::typePairs / scalarTypes][code % scalarTypes].result == ScalarType::Double;
        const auto answers = [&](detail::Registers registers) {
            std::vector<double> all(rows);
            detail::columnLoop(code, registers)(left, operand.data(), all.data(), rows);
            if (isReal)
                detail::makeVisible(all.data(), rows, registers);
            return all;
        };
        const std::vector<double> plain = answers(detail::Registers::Plain);
        for (const detail::Registers registers : {detail::Registers::Wide, detail::Registers::Widest})
            if (registers <= most) {
                ASSERT_EQ(std::memcmp(plain.data(), answers(registers).data(), rows * sizeof(double)), 0) << code;
            }
    }
}

TEST(Prepared, RefusesColumnsThatDoNotFit) {
    SymbolicExprTable table;
    PreparedExpr prepared = SymbolicExprEval(table).prepare(readTree(table, "Plus(a,1)"));
    std::vector<std::int64_t> wide(5000, 7);
    const ValueColumn column{0, ValueColumn::Type::Int64, wide.data(), 8};
    std::vector<std::int32_t> room(wide.size());
    const auto toRoom = [&](ScalarType) { return room.data(); };
    prepared.runMany({&column, 1}, wide.size(), toRoom);
    EXPECT_EQ(room, std::vector<std::int32_t>(wide.size(), 8));
    wide[4321] = 2147483648;
    try {
        prepared.runMany({&column, 1}, wide.size(), toRoom);
        ADD_FAILURE() << "an integer beyond 32 bits";
    } catch (const std::range_error& error) {
        EXPECT_STREQ(error.what(), "the integer 2147483648 in row 4321 of a column does not fit 32 bits");
    }
    const ValueColumn elsewhere{1, ValueColumn::Type::Int64, wide.data(), 8};
    EXPECT_THROW(prepared.runMany({&elsewhere, 1}, 1, toRoom), std::out_of_range);
    prepared.setInt(0, 4);
    EXPECT_EQ(prepared.run(), SymbolicValue(5));
}

} // namespace
} // namespace VT::Testing
