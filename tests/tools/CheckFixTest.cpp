// Models that the program mended, compared with what they were by brute force.
#include "base/choices/BlockConditions.hpp"
#include "base/core/Table.hpp"
#include "host/embedded/ModelFile.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"
#include "tests/tools/Program.hpp"

#include <algorithm>
#include <gtest/gtest.h>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

constexpr int least = -3; // values of names, one beyond all constants
constexpr int greatest = 4;

/// A block with a policy and some choices, some of which are such blocks again.
std::string randomBlock(std::mt19937_64& random, const std::string& name, int depth) { // NOLINT(misc-no-recursion)
    static const char* const policies[] = {"unique", "first", "collect"};
    std::string text = R"({"name": ")" + name + R"(", "policy": ")" + policies[belowOf(random, 3)] + "\"";
    if (belowOf(random, 2) == 0)
        text += R"(, "condition": ")" + randomCondition(random, 1 + belowOf(random, 2)) + "\"";
    text += ",\n \"choices\": [";
    const std::size_t choices = 1 + belowOf(random, 5);
    const std::size_t byDefault = belowOf(random, 2 * choices);
    for (std::size_t i = 0; i < choices; ++i) {
        text += i == 0 ? "\n  " : ",\n  ";
        const std::string own = "c" + std::to_string(i);
        if (depth > 0 && belowOf(random, 4) == 0)
            text += randomBlock(random, own, depth - 1);
        else
            text += R"({"name": ")" + own + R"(", "condition": ")" +
                    (i == byDefault ? "(default)" : randomCondition(random, 1 + belowOf(random, 4))) + "\"}";
    }
    return text + "]}";
}

/// A model, and which of its blocks are active.
class Model {
public:
    explicit Model(const std::string& text) {
        table_.addBoolSymbols();
        Embedded::readModel(text, root_);
        for (const VTBlock& block : root_.blocks()) {
            const std::string& condition = block.variantCondition();
            const bool isPlain = !condition.empty() && !BlockConditions::isDefault(block);
            conditions_.emplace_back(table_,
                                     isPlain ? SymbolicExprParser(table_, true, true)(condition) : table_.getIdTRUE());
        }
    }

    std::set<std::string> activeFor(const Assignment& values) {
        std::set<std::string> active;
        std::set<const VTBlock*> decided; // blocks of which no further choice is active
        std::vector<const VTBlock*> byDefault;
        std::size_t position = 0;
        const auto isInside = [&](const VTBlock& block) {
            return block.parent() == nullptr || active.contains(block.parent()->path());
        };
        for (const VTBlock& block : root_.blocks()) {
            const bool holds = conditions_[position++].under(values).value() != 0;
            if (BlockConditions::isDefault(block)) {
                byDefault.push_back(&block);
                continue;
            }
            const bool isFirst = block.isChoice() && block.parent()->choiceRule() == Embedded::ChoiceRule::First;
            if (!holds || !isInside(block) || (isFirst && decided.contains(block.parent())))
                continue;
            active.insert(block.path());
            if (block.isChoice())
                decided.insert(block.parent());
        }
        for (const VTBlock* const block : byDefault) // they have no blocks inside
            if (isInside(*block) && !decided.contains(block->parent()))
                active.insert(block->path());
        return active;
    }

private:
    VTRootBD root_;
    SymbolicExprTable table_;
    std::vector<Truth> conditions_; ///< by block
};

TEST(CheckFix, KeepsWhatIsActive) {
    std::mt19937_64 random(85);
    constexpr std::size_t models = 120;
    const TemporaryFolder place;
    std::vector<std::string> before;
    for (std::size_t i = 0; i < models; ++i) {
        before.push_back("{\"blocks\": [" + randomBlock(random, "B", 2) + "]}\n");
        place.write("m" + std::to_string(i), before.back());
    }
    EXPECT_EQ(runScript(place, "vtsym check --fix m*").err, "");
    std::size_t changed = 0;
    std::size_t active = 0;
    for (std::size_t i = 0; i < models; ++i) {
        const std::string after = place.read("m" + std::to_string(i));
        changed += after != before[i] ? 1U : 0U;
        Model old(before[i]);
        Model fixed(after);
        for (int a = least; a <= greatest; ++a)
            for (int b = least; b <= greatest; ++b)
                for (int c = least; c <= greatest; ++c) {
                    const Assignment values{{"A", a}, {"B", b}, {"C", c}};
                    const std::set<std::string> wanted = old.activeFor(values);
                    active += wanted.size();
                    ASSERT_EQ(fixed.activeFor(values), wanted) << before[i] << after << a << " " << b << " " << c;
                }
    }
    EXPECT_GT(changed, models / 3);
    EXPECT_GT(active, models * 512);
}

} // namespace
} // namespace VT::Testing
