// Families of growing input: what a text of twice the length costs in nodes and in steps stays within bounds that no
// machine changes.
#include "base/VCService.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>

namespace VT::Testing {
namespace {

std::string number(std::size_t i) {
    return std::to_string(i);
}

/// So many parts joined by an operator.
std::string joined(std::size_t n, const std::string& by, const std::function<std::string(std::size_t)>& part) {
    std::string text;
    for (std::size_t i = 0; i < n; ++i)
        text += (i > 0 ? by : "") + part(i);
    return text;
}

/// Brackets around brackets: open(0) open(1) ... core ... close.
std::string nested(std::size_t n, const std::function<std::string(std::size_t)>& open, const std::string& core) {
    return joined(n, "", open) + core + std::string(n, ')');
}

struct Family {
    const char* name;
    std::function<std::string(std::size_t)> text;
    std::size_t scale = 1; ///< of the sizes 50, 100 and 200
    int nodes = 1;         ///< the power of the size that nodes grow with
    int steps = 1;         ///< and steps
};

const std::vector<Family> families{
    {"and", [](std::size_t n) { return joined(n, "&&", [](std::size_t i) { return "A" + number(i) + "==1"; }); }, 4},
    {"or", [](std::size_t n) { return joined(n, "||", [](std::size_t i) { return "A" + number(i) + ">1"; }); }, 4},
    {"sum of products",
     [](std::size_t n) {
         return joined(n, "||", [](std::size_t i) { return "A" + number(i) + "&&B" + number(i % 7); });
     }},
    {"product of sums",
     [](std::size_t n) {
         return joined(n, "&&", [](std::size_t i) { return "(A" + number(i) + "||B" + number(i) + ")"; });
     }},
    {"alternation in brackets",
     [](std::size_t n) {
         return nested(
             n, [](std::size_t i) { return "A" + number(i) + (i % 2 == 0 ? "&&(" : "||("); }, "Z");
     },
     1, 2, 2},
    {"ranges under Not",
     [](std::size_t n) {
         return "!(" +
                joined(n, "||", [](std::size_t i) { return "A>" + number(3 * i) + "&&A<" + number(3 * i + 2); }) + ")";
     },
     4},
    {"points", [](std::size_t n) { return joined(n, "||", [](std::size_t i) { return "A==" + number(2 * i); }); }, 4},
    {"links",
     [](std::size_t n) {
         return joined(n, "&&", [](std::size_t i) { return "A" + number(i) + "<A" + number(i + 1); });
     },
     1, 1, 3},
    {"negations", [](std::size_t n) { return std::string(n, '!') + "A"; }},
    {"brackets",
     [](std::size_t n) {
         return nested(
             n, [](std::size_t) { return "("; }, "A==1");
     }},
    {"calls in calls",
     [](std::size_t n) {
         return nested(
                    n, [](std::size_t) { return "f("; }, "A") +
                "==1";
     }},
    {"sum", [](std::size_t n) { return joined(n, "+", [](std::size_t i) { return "A" + number(i); }) + "==3"; }, 4, 1,
     2},
    {"product",
     [](std::size_t n) { return joined(n, "*", [](std::size_t i) { return "(A+" + number(i) + ")"; }) + "==0"; }},
    {"quotients",
     [](std::size_t n) { return "A" + joined(n, "", [](std::size_t i) { return "/" + number(i + 2); }) + ">1"; }, 1, 1,
     2},
    {"shifts",
     [](std::size_t n) {
         return "A" + joined(n, "", [](std::size_t i) { return (i % 2 == 0 ? "<<" : ">>") + number(i % 5); }) + ">1";
     }},
    {"masks",
     [](std::size_t n) { return joined(n, "&&", [](std::size_t i) { return "(F&" + number(i + 1) + ")!=0"; }); }, 1, 1,
     3},
    {"truth values as numbers",
     [](std::size_t n) { return joined(n, "+", [](std::size_t i) { return "(A" + number(i) + ">B)"; }) + ">=2"; }, 1, 1,
     2},
    {"pairs in another order",
     [](std::size_t n) {
         return joined(n, "||", [n](std::size_t i) { return "A" + number(n - i) + "==1&&B" + number(i) + "==1"; });
     }},
};

struct Cost {
    std::size_t nodes = 0;   ///< interned by reading, simplifying and shortening
    std::uint64_t steps = 0; ///< of deciding
};

Cost costOf(const std::string& text) {
    const VCServiceHandle service;
    const SymbolicExprId id = service->parseC(text);
    const SymbolicExprId simple = service->simplify(id, false).id();
    EXPECT_EQ(service->simplify(simple, false).id(), simple) << text.substr(0, 80);
    Cost cost{service->table().size(), 0};
    Decider decider(service->table());
    static_cast<void>(decider.classify(id, simple));
    cost.steps = decider.stepsTaken();
    return cost;
}

/// Whether a cost grows no faster than a power of the size, which is four times as large; some is spent whatever the
/// size.
bool isWithin(int power, double small, double large) {
    return large <= 1.45 * std::pow(4, power) * small + 1000;
}

TEST(Growth, OfNodesAndStepsIsBounded) {
    for (const Family& family : families) {
        std::vector<Cost> costs;
        for (const std::size_t n : {50U, 100U, 200U})
            costs.push_back(costOf(family.text(n * family.scale)));
        const Cost& small = costs.front();
        const Cost& large = costs.back();
        EXPECT_TRUE(isWithin(family.nodes, static_cast<double>(small.nodes), static_cast<double>(large.nodes)))
            << family.name << ": " << small.nodes << " nodes, then " << large.nodes;
        EXPECT_TRUE(isWithin(family.steps, static_cast<double>(small.steps), static_cast<double>(large.steps)))
            << family.name << ": " << small.steps << " steps, then " << large.steps;
        for (const Cost& cost : costs)
            EXPECT_LE(cost.steps, 3 * limits::decisionSteps) << family.name;
    }
}

} // namespace
} // namespace VT::Testing
