// What small operations cost in C++, as lines of name and nanoseconds, for python/bench/overhead.py.
#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "base/eval/Eval.hpp"

#include <algorithm>
#include <cstdio>
#include <ctime>

namespace {

double processorSeconds() {
    timespec now{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

/// Prints the least processor time of a call in several rounds.
template <class Call>
void measure(const char* name, Call call) {
    constexpr int calls = 200'000;
    double least = 1;
    for (int round = 0; round < 7; ++round) {
        const double start = processorSeconds();
        for (int i = 0; i < calls; ++i)
            call();
        least = std::min(least, (processorSeconds() - start) / calls);
    }
    std::printf("%s\t%.1f\n", name, least * 1e9);
}

} // namespace

int main() {
    VT::VCService service;
    const VT::SymbolicExprId a = service.parseC("A > 1");
    const VT::SymbolicExprId b = service.parseC("B");
    const VT::SymbolicExprId both = service.parseC("A > 1 && B");
    VT::PreparedExpr prepared = VT::SymbolicExprEval(service.table()).prepare(both);
    const std::size_t slotA = *prepared.slotOf("A");
    const std::size_t slotB = *prepared.slotOf("B");
    volatile std::size_t sink = 0;
    measure("a & b", [&] { sink = service.AND(a, b, false).id(); });
    measure("symbol > 1", [&] {
        VT::SymbolicExprTable& table = service.table();
        const VT::SymbolicExprId one = VT::SymbolicIntValue(table, 1).getId(table);
        sink = VT::SymbolicGreaterThanExpr(table, 0, one).getId(table);
    });
    measure("a == b", [&] { sink = service.isEqual(a, b) ? 1 : 0; });
    measure("parse('A > 1 && B')", [&] { sink = service.parseC("A > 1 && B"); });
    measure("str(condition)", [&] { sink = service.printCExpr(both).size(); });
    measure("simplify() again", [&] { sink = service.simplify(both, false).id(); });
    measure("implies() again", [&] { sink = service.implies(both, a).isYes() ? 1 : 0; });
    measure("evaluate(A=3, B=1)", [&] {
        prepared.setInt(slotA, 3);
        prepared.setInt(slotB, 1);
        sink = prepared.run().scalar().getBool() ? 1 : 0;
    });
}
