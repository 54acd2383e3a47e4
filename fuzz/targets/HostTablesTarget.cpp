// Tables as hosts derive them, with any nodes: missing operands, later ones, circles, and calls against a model of
// maps.
#include "base/decide/Decider.hpp"
#include "base/eval/Eval.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Symbols.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/HostTables.hpp"

#include <array>
#include <map>

namespace VT::Fuzz {

namespace {

using Testing::NumberedTable;

/// A node as the model knows it; one structure has one identifier.
using Structure = std::tuple<SymbolicOp, std::string, int, double, std::vector<SymbolicExprId>>;

/// Every operation that walks an expression; none of them may follow what is not there.
void useEverything(NumberedTable& numbered, SymbolicExprId id) {
    SymbolicExprTable& table = numbered.table();
    try {
        static_cast<void>(SymbolicExprPrinter(table, true, false)(id));
        static_cast<void>(SymbolicExprPrinter(table, false, true)(id));
    } catch (const std::out_of_range&) { // an operand is missing
    } catch (const std::length_error&) { // more text than there may be
    }
    std::vector<std::string> symbols;
    const SymbolicExprSymbols collect(table);
    collect(id, symbols);
    try {
        static_cast<void>(SymbolicExprEval(table).eval(id));
    } catch (const HostDiagnostic&) { // it has no value
    }
    Decider decider(table, {.steps = 20'000});
    static_cast<void>(decider.canHold(id));
    SymbolicExprTable plain;
    const SymbolicExprId copied = SymbolicExprCopy(table, plain)(id);
    demand(plain.has(copied), "a copy of a node is a node");
    const std::size_t before = numbered.count();
    const SymbolicExprId converted = SymbolicExprQ2C(table)(SymbolicExprC2Q(table)(id));
    demand(table.get(converted) != nullptr && numbered.count() >= before, "a conversion of a node is a node");
    std::uint64_t passes = 0;
    static_cast<void>(SymbolicExprSimplify(table).simplify(id, passes));
}

} // namespace

void fuzzHostTables(Input input) {
    Choices choices(input);
    const std::size_t kind = choices.below(5);
    auto tables = Testing::tablesOfEachKind();
    NumberedTable& numbered = *tables[kind];
    SymbolicExprTable& table = numbered.table();
    std::map<Structure, SymbolicExprId> known;
    static const std::array<std::string, 6> words{"a", "b", "(sim)", "rem", "defined", "true"};
    static constexpr std::array reals{0.5, -0.0, 2.0, 1e9};
    while (!choices.areUsedUp() && known.size() < 40) {
        const std::size_t which = choices.byte();
        const bool isLeaf = known.empty() || which >= 160;
        const auto op = static_cast<SymbolicOp>(isLeaf ? which % 3 : 3 + which % (operatorCount - 3));
        Testing::NodeParts parts{choices.of(words), static_cast<int>(choices.below(4)), choices.of(reals), {}};
        for (std::size_t left = Testing::operandCount(op).value_or(choices.below(4)); left > 0; --left) {
            const std::size_t operand = choices.byte();
            parts.inputs.push_back(operand == 255 ? invalidId
                                   : operand >= 248
                                       ? numbered.idAt(numbered.count() + operand - 248)
                                       : numbered.idAt(operand % std::max<std::size_t>(1, numbered.count())));
        }
        const std::size_t before = numbered.count();
        const SymbolicExprId id = Testing::makeAny(table, op, parts);
        demand(table.get(id) != nullptr && table.has(id), "a node that was made is there");
        if (table.get(id)->op() !=
            op) { // calls of all classes are equal where callee and arguments are, and so are lists
            const SymbolicOp twin = table.get(id)->op();
            demand((callOps.contains(op) && callOps.contains(twin)) ||
                       (dimensionOps.contains(op) && dimensionOps.contains(twin)),
                   "a node is of its class");
            continue;
        }
        const bool named = op == SymbolicOp::String || op == SymbolicOp::MemberValue;
        const double real = op == SymbolicOp::DoubleValue ? parts.real + 0.0 : 0;
        const Structure structure{op, named ? parts.text : "", op == SymbolicOp::IntValue ? parts.integer : 0, real,
                                  table.get(id)->getNumInputs() > 0 ? parts.inputs : std::vector<SymbolicExprId>{}};
        const auto [entry, isNew] = known.emplace(structure, id);
        demand(entry->second == id && (numbered.count() != before) == isNew, "one structure has one identifier");
        demand(table.lookup(table.get(id)) == id && table.contains(table.get(id)), "a node is found");
        if (which % 16 == 0)
            table.registerValueId(id, parts.inputs.empty() ? id : parts.inputs.front());
    }
    if (!known.empty())
        useEverything(numbered, numbered.idAt(numbered.count() - 1));
}

} // namespace VT::Fuzz
