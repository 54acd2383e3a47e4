// Objects that no two threads share work at once: each thread has answers as if it were alone.
#include "base/decide/Decider.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/scan/SourceScan.hpp"
#include "base/service/VCService.hpp"
#include "base/simplify/Simplify.hpp"
#include "host/Diagnostics.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/generators/Corpus.hpp"

#include <gtest/gtest.h>
#include <thread>

namespace VT::Testing {
namespace {

const std::vector<std::string>& conditions() {
    static const std::vector<std::string> lines = [] {
        std::vector<std::string> all = corpusLines("curl-conditions.txt");
        all.resize(200);
        all.insert(all.end(), {"A &&", "x % 2 == 1 && y / 3 > 2", "x*x + y*y == 25", "a.b(1) || f(x)"});
        return all;
    }();
    return lines;
}

std::string askService() {
    VCService service;
    std::string answers;
    for (std::size_t i = 0; i < conditions().size(); ++i) {
        try {
            const std::string& text = conditions()[i];
            answers += service.simplifyCExprFromCCondition(text) + "\n" + service.shortestCExprFromCCondition(text) +
                       "\n" + service.convertExprBetweenQandC(text, false, true) + "\n";
            const Relation relation = service.compare(service.parseC(text), service.parseC(conditions()[i / 2]));
            answers += std::to_string(static_cast<int>(relation.kind)) + "\n";
        } catch (const HostDiagnostic& refused) {
            answers += std::string(refused.what()) + "\n";
        }
    }
    return answers;
}

std::string askParts() {
    SymbolicExprTable table;
    table.addBoolSymbols();
    SymbolicExprParser parser(table, true, true);
    SymbolicExprSimplify simplifier(table);
    const SymbolicExprPrinter printer(table, false);
    Decider decider(table);
    std::string answers;
    for (const std::string& text : conditions()) {
        try {
            const SymbolicExprId condition = parser(text);
            std::uint64_t passes = 0;
            answers +=
                printer(simplifier.simplify(condition, passes)) + (decider.canHold(condition).isYes() ? "\n" : "!\n");
        } catch (const HostDiagnostic& refused) {
            answers += std::string(refused.what()) + "\n";
        }
    }
    return answers;
}

/// The macros of a build are shared.
std::string askScanner(const BuildMacros& build) {
    SourceScanner scanner({.why = true});
    std::string text;
    for (const std::string& condition : conditions())
        text += "#if " + condition + "\n#elif " + condition + "\n#endif\n";
    SourceFile file{text, false, {&build}};
    std::string answers;
    scanner.scan(file, [&](const BranchFinding& found) {
        answers += std::to_string(found.region.line) + found.condition + found.proposed + "\n";
    });
    return answers;
}

TEST(ThreadContract, EachThreadAnswersAsIfAlone) {
    BuildMacros build;
    build.define("HAVE_CONFIG_H");
    build.define("VERSION=3");
    build.addFile("config.h", "#define CURL_DISABLE_FTP 1\n#undef USE_SSL\n", false);
    const auto all = [&] { return askService() + askParts() + askScanner(build); };
    std::vector<std::string> answers(4);
    {
        std::vector<std::jthread> threads; // before anything else ran: what the library makes once is made by them
        for (std::string& each : answers)
            threads.emplace_back([&] { each = all(); });
    }
    const std::string alone = all();
    EXPECT_GT(alone.size(), 10'000U);
    for (const std::string& each : answers)
        EXPECT_EQ(each, alone);
}

/// A table that no thread changes may be read by all.
TEST(ThreadContract, ThreadsReadOneTable) {
    SymbolicExprTable table;
    table.addBoolSymbols();
    SymbolicExprParser parser(table, true, true);
    std::vector<SymbolicExprId> roots;
    for (std::size_t i = 0; i < 100; ++i)
        roots.push_back(parser("A" + std::to_string(i) + " > 2 && (B || C + 1 < 3)"));
    const auto print = [&] {
        const SymbolicExprPrinter printer(table, false);
        std::string all;
        for (const SymbolicExprId root : roots)
            all += printer(root) + "\n";
        return all;
    };
    std::vector<std::string> texts(4);
    {
        std::vector<std::jthread> threads;
        for (std::string& each : texts)
            threads.emplace_back([&] { each = print(); });
    }
    for (const std::string& each : texts)
        EXPECT_EQ(each, print());
}

} // namespace
} // namespace VT::Testing
