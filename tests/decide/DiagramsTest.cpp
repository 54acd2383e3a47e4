// Nodes of diagrams and circuits are found at once, however quantities and bounds grow together.
#include "base/decide/diagram/Diagrams.hpp"
#include "base/core/Nodes.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

TEST(DiagramIndex, FindsNodesAtOnce) {
    constexpr std::int64_t count = 20'000;
    for (const std::int64_t stride : {0, 1, -1, 2, 16, 1024, 1 << 20, 1 << 30}) {
        Steps steps;
        steps.refill(10 * count);
        Diagrams diagrams(steps);
        const std::vector<LevelInfo> levels(count, {0, 0, noUnknown, false, false, minusInfinite, plusInfinite});
        diagrams.begin(levels);
        Diagram before = always;
        for (std::int64_t i = 0; i < count; ++i) {
            const std::int64_t end = i * stride;
            const Diagram diagram = diagrams.comparison(static_cast<Level>(i), std::span(&end, 1));
            diagrams.both(before, diagram);
            before = diagram;
        }
        EXPECT_LE(diagrams.probes(), static_cast<std::uint64_t>(4 * count)) << stride;

        SymbolicExprTable table;
        const SymbolicExprPrinter printer(table, false);
        Unknowns unknowns(table, printer, minusInfinite, plusInfinite);
        steps.refill(10 * count);
        Circuit circuit(unknowns, steps);
        Gate gate = always;
        for (std::int64_t i = 0; i < count; ++i) {
            const Unknown unknown = unknowns.free(SymbolicString(table, "X" + std::to_string(i)).getId(table));
            gate = circuit.nested(circuit.between(unknowns[unknown].quantity, i * stride, plusInfinite), gate);
        }
        EXPECT_LE(circuit.probes(), static_cast<std::uint64_t>(4 * count)) << stride;
    }
}

} // namespace
} // namespace VT::Testing
