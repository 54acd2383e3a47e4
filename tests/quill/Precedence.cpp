// Random expressions against another reading of them: one that splits a list of tokens at its loosest operator.
#include "tests/quill/TreeText.hpp"

#include <gtest/gtest.h>

#include <map>
#include <random>

namespace VT::Testing {
namespace {

/// A token, or a group in brackets that counts as an operand and whose reading is known.
struct Item {
    std::string text;
    std::string tree = {};
};

// NOLINTBEGIN(misc-no-recursion): seventeen operands at most

using Items = std::span<const Item>;

struct Infix {
    std::string text;
    int code;
};

/// Infix operators, loosest first.
const std::vector<std::vector<Infix>> levels = {
    {{"||", 130}},
    {{"&&", 136}},
    {{"|", 132}},
    {{"&", 134}},
    {{"==", 103}, {"~=", 104}, {"!=", 104}},
    {{"<", 99}, {"<=", 100}, {">", 101}, {">=", 102}},
    {{":", 0}},
    {{"+", 49}, {"-", 50}},
    {{"*", 90}, {"/", 92}, {"\\", 94}, {".*", 91}, {"./", 93}, {".\\", 95}},
    {{"^", 76}, {".^", 77}},
};
constexpr std::size_t rangeLevel = 6;
constexpr std::size_t powerLevel = 9;
const std::map<std::string, int> prefixes = {{"-", 44}, {"~", 46}, {"!", 46}, {"+", 0}};
const std::map<std::string, int> postfixes = {{"'", 78}, {".'", 79}};

int codeAt(const std::vector<Infix>& level, const std::string& text) {
    for (const Infix& infix : level)
        if (infix.text == text)
            return infix.code;
    return -1;
}

bool endsOperand(const Item& item) {
    return !item.tree.empty() || postfixes.contains(item.text);
}

std::string rule(int code, const std::string& first, const std::string& second = "") {
    return "(" + std::to_string(code) + " " + first + (second.empty() ? "" : " " + second) + ")";
}

std::string oracle(Items items);

/// a:b:c takes three, and the result takes the next ones.
std::string rangeOf(Items items, const std::vector<std::size_t>& colons) {
    std::vector<std::string> bounds;
    std::size_t from = 0;
    for (const std::size_t colon : colons) {
        bounds.push_back(oracle(items.subspan(from, colon - from)));
        from = colon + 1;
    }
    bounds.push_back(oracle(items.subspan(from)));
    std::string result = bounds[0];
    std::size_t next = 1;
    for (; next + 1 < bounds.size(); next += 2)
        result = rule(305, result, bounds[next] + " " + bounds[next + 1]);
    return next < bounds.size() ? rule(304, result, bounds[next]) : result;
}

std::string oracle(Items items) {
    for (std::size_t level = 0; level < powerLevel; ++level) {
        std::vector<std::size_t> places;
        for (std::size_t i = 1; i < items.size(); ++i)
            if (items[i].tree.empty() && endsOperand(items[i - 1]) && codeAt(levels[level], items[i].text) >= 0)
                places.push_back(i);
        if (places.empty())
            continue;
        if (level == rangeLevel)
            return rangeOf(items, places);
        const std::size_t last = places.back();
        return rule(codeAt(levels[level], items[last].text), oracle(items.first(last)),
                    oracle(items.subspan(last + 1)));
    }
    if (!endsOperand(items.front())) {
        const int code = prefixes.at(items.front().text);
        const std::string operand = oracle(items.subspan(1));
        return code == 0 ? operand : rule(code, operand);
    }
    if (postfixes.contains(items.back().text))
        return rule(postfixes.at(items.back().text), oracle(items.first(items.size() - 1)));
    for (std::size_t i = items.size(); i-- > 1;) {
        if (items[i].tree.empty() && endsOperand(items[i - 1]))
            return rule(codeAt(levels[powerLevel], items[i].text), oracle(items.first(i)),
                        oracle(items.subspan(i + 1)));
    }
    return items.front().tree;
}

// NOLINTEND(misc-no-recursion)

/// Operators, signs and postfixes around operands whose readings are known.
std::vector<Item> randomItems(std::mt19937_64& random, std::size_t operands) {
    static const std::vector<Item> stock = {{"a", "a"},
                                            {"b", "b"},
                                            {"1.5", "1.5"},
                                            {"(-c)", "(43 (44 c))"},
                                            {"f(x,1)", "(85 f (303 x 1))"},
                                            {"[1 -2]", "(27 (302 1 (44 2)))"},
                                            {"{a;b}", "(301 (302 a) (302 b))"},
                                            {"a.f{2}", "(300 (83 a f) (303 2))"},
                                            {"(@(p)p)", "(43 (306 (307 p) p))"}};
    static const std::vector<std::string> signs = {"-", "~", "!", "+"};
    const auto below = [&](std::size_t bound) { return static_cast<std::size_t>(random() % bound); };
    std::vector<Item> items;
    for (std::size_t i = 0; i < operands; ++i) {
        if (i > 0) {
            const auto& level = levels[below(levels.size())];
            items.push_back({level[below(level.size())].text});
        }
        while (below(4) == 0)
            items.push_back({signs[below(signs.size())]});
        items.push_back(stock[below(stock.size())]);
        while (below(5) == 0)
            items.push_back({below(2) == 0 ? "'" : ".'"});
    }
    return items;
}

/// White space may stand everywhere but before a quote, and must stand where tokens would grow together.
std::string written(const std::vector<Item>& items, std::mt19937_64& random) {
    static const std::vector<std::string> blanks = {" ", "\t", "\n", "% c\n", "... c\n", "  "};
    std::string text;
    for (std::size_t i = 0; i < items.size(); ++i) {
        const std::string& token = items[i].text;
        const bool grows = i > 0 && (token == "~" || token == "!" || token[0] == '=');
        if (token != "'" && (grows || random() % 3 == 0))
            text += blanks[random() % blanks.size()];
        text += token;
    }
    return text;
}

TEST(QuillPrecedence, RandomExpressionsReadAsTheirSplitting) {
    QuillReading reading;
    std::mt19937_64 random(7);
    for (std::size_t round = 0; round < 6000; ++round) {
        const std::vector<Item> items = randomItems(random, 1 + round % 17);
        const std::string text = written(items, random);
        ASSERT_EQ(reading.answer(text), oracle(items)) << text;
        ASSERT_EQ(shapeError(*reading.read(text), text), "") << text;
    }
}

} // namespace
} // namespace VT::Testing
