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

class RandomExpression {
public:
    explicit RandomExpression(std::uint64_t seed) : random_(seed) {}

    /// An expression whose text is separated by blanks or by nothing.
    Item make(std::size_t operands, bool blanksSeparate) {
        std::vector<Item> items;
        addOperand(items, operands / 4);
        for (std::size_t i = 1; i < operands; ++i) {
            const auto& level = levels[below(levels.size())];
            items.push_back({level[below(level.size())].text});
            addOperand(items, operands / 4);
        }
        return {written(items, blanksSeparate), oracle(items)};
    }

private:
    std::size_t below(std::size_t bound) { return random_() % bound; }

    void addOperand(std::vector<Item>& items, std::size_t inner) {
        static const std::vector<std::string> signs = {"-", "~", "!", "+"};
        while (below(4) == 0)
            items.push_back({signs[below(signs.size())]});
        items.push_back(operand(inner));
        while (below(5) == 0)
            items.push_back({below(2) == 0 ? "'" : ".'"});
    }

    Item operand(std::size_t inner) {
        const std::string name(1, static_cast<char>('a' + below(26)));
        if (inner == 0)
            return below(2) == 0 ? Item{name, name} : Item{"1.5", "1.5"};
        const auto group = [&](bool blanksSeparate) { return make(1 + below(inner), blanksSeparate); };
        const auto list = [&](bool blanksSeparate) {
            Item items = group(blanksSeparate);
            while (below(2) == 0) {
                const Item next = group(blanksSeparate);
                items.text += (blanksSeparate && below(2) == 0 ? " " : ",") + next.text;
                items.tree += " " + next.tree;
            }
            return items;
        };
        switch (below(7)) {
        case 0: {
            const Item e = group(false);
            return {"(" + e.text + ")", "(43 " + e.tree + ")"};
        }
        case 1: {
            const Item arguments = list(false);
            return {name + "(" + arguments.text + ")", "(85 " + name + " (303 " + arguments.tree + "))"};
        }
        case 2: {
            const Item elements = list(true);
            return {"[" + elements.text + "]", "(27 (302 " + elements.tree + "))"};
        }
        case 3: {
            const Item first = list(true);
            const Item second = list(true);
            return {"{" + first.text + ";" + second.text + "}",
                    "(301 (302 " + first.tree + ") (302 " + second.tree + "))"};
        }
        case 4: {
            const Item body = group(false);
            return {"(@(p)" + body.text + ")", "(43 (306 (307 p) " + body.tree + "))"};
        }
        case 5:
            return {name + ".f{2}", "(300 (83 " + name + " f) (303 2))"};
        default:
            return {name, name};
        }
    }

    /// White space may stand everywhere but before a quote; where it separates elements it may stand on both sides of
    /// an infix operator only.
    std::string written(const std::vector<Item>& items, bool blanksSeparate) {
        static const std::vector<std::string> blanks = {" ", "\t", "\n", "% c\n", "... c\n", "  "};
        const auto blank = [&](bool wanted) { return wanted ? blanks[below(blanks.size())] : std::string(); };
        std::string text;
        for (std::size_t i = 0; i < items.size(); ++i) {
            const bool infix = i > 0 && items[i].tree.empty() && endsOperand(items[i - 1]) && !endsOperand(items[i]);
            const bool quote = items[i].text == "'";
            // 1.5 behind a dot or a name, and a dot behind 5, would be other tokens.
            const bool wide = below(3) == 0 || needsBlank(items, i);
            if (infix && blanksSeparate)
                text += blank(wide) + items[i].text + blank(wide);
            else if (blanksSeparate || quote)
                text += items[i].text;
            else
                text += blank(wide) + items[i].text;
        }
        return text;
    }

    /// Whether the token would grow together with the one before it.
    static bool needsBlank(const std::vector<Item>& items, std::size_t i) {
        return i > 0 && (items[i].text == "~" || items[i].text == "!" || items[i].text[0] == '=');
    }

    std::mt19937_64 random_;
};

// NOLINTEND(misc-no-recursion)

TEST(QuillPrecedence, RandomExpressionsReadAsTheirSplitting) {
    QuillReading reading;
    for (std::uint64_t seed = 0; seed < 6000; ++seed) {
        const Item expected = RandomExpression(seed).make(1 + seed % 17, false);
        ASSERT_EQ(reading.answer(expected.text), expected.tree) << seed << "\n" << expected.text;
        ASSERT_EQ(shapeError(*reading.read(expected.text), expected.text), "") << expected.text;
    }
}

} // namespace
} // namespace VT::Testing
