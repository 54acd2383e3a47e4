// Graphs of operators of evaluation over chosen scalars: every way to evaluate them against wide integers.
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/WideArithmetic.hpp"

#include <bit>

namespace VT::Fuzz {

namespace {

using Testing::Trees;

SymbolicScalar chosenScalar(Choices& choices) {
    const std::size_t kind = choices.below(64);
    if (kind < Testing::cornerScalars().size())
        return Testing::cornerScalars()[kind];
    if (kind % 2 == 0)
        return choices.integer();
    const auto high = static_cast<std::uint64_t>(static_cast<std::uint32_t>(choices.integer()));
    return visibleScalar(std::bit_cast<double>(high << 32U | static_cast<std::uint32_t>(choices.integer())));
}

/// The bytes of results by their type, as scalars.
SymbolicScalar resultOf(ScalarType type, const std::vector<double>& room, std::size_t row) {
    if (type == ScalarType::Double)
        return room[row];
    if (type == ScalarType::Int)
        return reinterpret_cast<const std::int32_t*>(room.data())[row];
    return reinterpret_cast<const unsigned char*>(room.data())[row] == 1;
}

/// Many rows of integers in one column, each as run() has it.
void demandRows(PreparedExpr& prepared, Choices& choices) {
    std::vector<std::int32_t> rows(3 + choices.below(140));
    for (std::size_t i = 0; i < rows.size(); ++i)
        rows[i] = i % 8 == 0 ? choices.integer() : static_cast<std::int32_t>(i) - 9;
    std::vector<double> room(rows.size());
    ScalarType type{};
    const ValueColumn column{0, ValueColumn::Type::Int32, rows.data(), sizeof(std::int32_t)};
    prepared.runMany({&column, 1}, rows.size(), [&](ScalarType settled) {
        type = settled;
        return room.data();
    });
    for (std::size_t row = 0; row < rows.size(); ++row) {
        prepared.setInt(0, rows[row]);
        demand(prepared.run().scalar() == resultOf(type, room, row), "a row is what one run with its values is");
    }
}

} // namespace

void fuzzEvaluate(Input input) {
    Choices choices(input);
    SymbolicExprTable table;
    const Trees tree{table};

    struct Value {
        SymbolicExprId id;
        SymbolicScalar wanted;
    };

    std::vector<Value> values;
    for (const char* const name : {"a", "b", "c", "d"}) {
        const SymbolicScalar value = chosenScalar(choices);
        values.push_back({tree.name(name), value});
        table.registerValueId(values.back().id, Testing::scalarLiteral(table, value));
    }
    const std::size_t symbols = values.size();
    while (!choices.areUsedUp() && values.size() < 64) {
        if (choices.below(8) == 0) {
            const SymbolicScalar value = chosenScalar(choices);
            values.push_back({Testing::scalarLiteral(table, value), value});
            continue;
        }
        const SymbolicOp op = choices.of(scalarRules).op;
        const Value& left = values[values.size() - 1 - choices.byte() % values.size()];
        const Value& right = values[values.size() - 1 - choices.byte() % values.size()];
        const bool isUnary = Testing::operandCount(op) == 1;
        const SymbolicExprId id = isUnary ? tree(op, left.id) : tree(op, left.id, right.id);
        values.push_back({id, visibleScalar(Testing::expectedScalar(op, left.wanted, right.wanted))});
    }
    const Value& root = values.back();
    const SymbolicExprEval evaluator(table);
    const SymbolicScalar wanted = visibleScalar(root.wanted);
    demand(evaluator.eval(root.id).scalar() == wanted, "evaluation is arithmetic");
    SymbolicExprEvalImpl visitor(table);
    visitor.execute(table, root.id);
    demand(visitor.get().scalar() == wanted, "a visitor evaluates as evaluation does");
    PreparedExpr prepared = evaluator.prepare(root.id);
    demand(prepared.run().scalar() == wanted, "a prepared expression takes values from the table");
    for (std::size_t i = 0; i < symbols; ++i)
        if (const auto slot = prepared.slotOf(values[i].id))
            prepared.set(*slot, values[i].wanted);
    demand(prepared.run().scalar() == wanted, "a prepared expression computes with what its slots hold");
    if (prepared.slotCount() > 0)
        demandRows(prepared, choices);
}

} // namespace VT::Fuzz
