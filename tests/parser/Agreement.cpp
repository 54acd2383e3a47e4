// The grammar against an independent hand-written parser and against a writer that brackets everything.
#include "base/VTSymbolicExpr.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/OracleParser.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

struct Infix {
    const char* text;
    SymbolicOp op;
};

constexpr Infix infixes[] = {{"+", SymbolicOp::Plus},
                             {"-", SymbolicOp::Minus},
                             {"*", SymbolicOp::Multiply},
                             {"/", SymbolicOp::Divide},
                             {"%", SymbolicOp::Modulo},
                             {"==", SymbolicOp::Equal},
                             {"!=", SymbolicOp::NotEqual},
                             {"<", SymbolicOp::LessThan},
                             {"<=", SymbolicOp::LessThanEqual},
                             {">", SymbolicOp::GreaterThan},
                             {">=", SymbolicOp::GreaterThanEqual},
                             {"&&", SymbolicOp::And},
                             {"||", SymbolicOp::Or},
                             {"&", SymbolicOp::BitAnd},
                             {"|", SymbolicOp::BitOr},
                             {"^", SymbolicOp::BitXOr},
                             {"<<", SymbolicOp::ShiftLeft},
                             {">>", SymbolicOp::ShiftRight}};

/// What is wrong where the two parsers differ on a text; empty where they agree.
std::string difference(SymbolicExprTable& table, const std::string& text, bool cOperators, bool keywords) {
    const ParseAnswer answer = parse(table, text, cOperators, keywords);
    const OracleResult expected = oracleParse(table, text, {cOperators, keywords});
    if (answer.id == expected.id && answer.stop(text) == expected.stop)
        return {};
    return "`" + text + "`: " + treeText(table, answer.id) + " at " + std::to_string(answer.stop(text)) +
           " instead of " + treeText(table, expected.id) + " at " + std::to_string(expected.stop);
}

std::string difference(const std::string& text) {
    SymbolicExprTable table;
    std::string all;
    for (const bool cOperators : {false, true})
        for (const bool keywords : {false, true})
            all += difference(table, text, cOperators, keywords);
    return all;
}

/// Texts of tokens, most of them no conditions.
rc::Gen<std::string> tokenTexts() {
    const auto token = rc::gen::element<std::string>(
        "a", "b1", "f", "f(", "f()", "g(a", "1", "23", "-4", "5.", ".5", "1.5e3", "2147483648", "(", "(", ")", ")", "[",
        "]", ",", ".", "(sim)", "(codegen)", "||", "&&", "|", "&", "^", "==", "!=", "~=", "<", "<=", ">", ">=", "<<",
        ">>", "+", "-", "*", "/", "%", "!", "~", "=", " ", " ", "\t", "\n", "$");
    return rc::gen::map(rc::gen::container<std::vector<std::string>>(token),
                        [](const std::vector<std::string>& tokens) {
                            std::string text;
                            for (const std::string& each : tokens)
                                text += each;
                            return text;
                        });
}

/// A text and the node that it must become, made together from a sequence of choices.  Every operand is in brackets.
class Writer {
public:
    Writer(SymbolicExprTable& table, const std::vector<std::uint8_t>& choices) : table_(table), choices_(choices) {}

    // NOLINTBEGIN(misc-no-recursion): at most nine levels
    SymbolicExprId write(int depth = 0) {
        const unsigned kind = depth > 8 ? choose(4) : choose(12);
        switch (kind) {
        case 0:
        case 1:
            return leaf<SymbolicString>(std::string(1, static_cast<char>('a' + choose(6))));
        case 2:
            return leaf<SymbolicIntValue>(static_cast<int>(choose(256)) * 65537 - 999);
        case 3:
            return real(choose(256));
        case 4:
            return prefix<SymbolicUnaryMinusExpr>("-", depth);
        case 5:
            return prefix<SymbolicNotExpr>("!", depth);
        case 6:
            return call(depth);
        case 7:
            return list(depth);
        case 8:
            return member();
        default:
            return infix(depth);
        }
    }

    [[nodiscard]] const std::string& text() const { return text_; }

private:
    unsigned choose(unsigned count) { return next_ < choices_.size() ? choices_[next_++] % count : 0; }

    template <class Node, class Value>
    SymbolicExprId leaf(const Value& value) {
        if constexpr (std::is_same_v<Value, int>)
            put(std::to_string(value));
        else
            put(value);
        return Node(table_, value).getId(table_);
    }

    SymbolicExprId real(unsigned value) {
        put(std::to_string(value) + ".5");
        return SymbolicDoubleValue(table_, value + 0.5).getId(table_);
    }

    template <class Node>
    SymbolicExprId prefix(const char* op, int depth) {
        put(op);
        const SymbolicExprId operand = bracketed(depth);
        return Node(table_, operand).getId(table_);
    }

    SymbolicExprId call(int depth) {
        const SymbolicExprId name = leaf<SymbolicString>(std::string("f"));
        const std::vector<SymbolicExprId> arguments = elements("(", ")", choose(4), depth);
        if (arguments.empty())
            return SymbolicFcnCall0UExpr(table_, name).getId(table_);
        return SymbolicFcnCallExpr(table_, name, arguments).getId(table_);
    }

    SymbolicExprId list(int depth) {
        return SymbolicNDExpr(table_, elements("[", "]", 1 + choose(3), depth)).getId(table_);
    }

    SymbolicExprId member() {
        SymbolicExprId id = leaf<SymbolicString>(std::string("m"));
        for (unsigned count = 1 + choose(3); count > 0; --count) {
            put(".");
            put("field");
            id = SymbolicMemberValue(table_, id, "field").getId(table_);
        }
        return id;
    }

    SymbolicExprId infix(int depth) {
        const SymbolicExprId left = bracketed(depth);
        const unsigned op = choose(std::size(infixes));
        put(infixes[op].text);
        const SymbolicExprId right = bracketed(depth);
        return makeNode(table_, infixes[op].op, {left, right});
    }

    SymbolicExprId bracketed(int depth) {
        put("(");
        const SymbolicExprId id = write(depth + 1);
        put(")");
        return id;
    }

    std::vector<SymbolicExprId> elements(const char* open, const char* close, unsigned count, int depth) {
        std::vector<SymbolicExprId> ids;
        put(open);
        for (unsigned i = 0; i < count; ++i) {
            if (i > 0)
                put(",");
            ids.push_back(write(depth + 1));
        }
        put(close);
        return ids;
    }

    // NOLINTEND(misc-no-recursion)

    /// A token, now and then with a blank before it.
    void put(const std::string& token) {
        if (next_ < choices_.size() && choices_[next_] % 5 == 0)
            text_ += ' ';
        text_ += token;
    }

    SymbolicExprTable& table_;
    const std::vector<std::uint8_t>& choices_;
    std::size_t next_ = 0;
    std::string text_;
};

RC_GTEST_PROP(Agreement, WrittenTreesAreReadBack, (const std::vector<std::vector<std::uint8_t>>& cases)) {
    for (const std::vector<std::uint8_t>& choices : cases) {
        SymbolicExprTable table;
        Writer writer(table, choices);
        const SymbolicExprId written = writer.write();
        RC_LOG() << writer.text() << std::endl;
        RC_ASSERT(parse(table, writer.text()).id == written);
        RC_ASSERT(parse(table, writer.text(), false, false).id == written);
    }
}

RC_GTEST_PROP(Agreement, OnTokens, ()) {
    for (const std::string& text : *rc::gen::container<std::vector<std::string>>(tokenTexts()))
        RC_ASSERT(difference(text) == "");
}

RC_GTEST_PROP(Agreement, OnBytes, (const std::vector<std::string>& texts)) {
    for (const std::string& text : texts)
        RC_ASSERT(difference(text) == "");
}

TEST(Agreement, OnEveryPairOfOperators) {
    for (const Infix& first : infixes) {
        for (const Infix& second : infixes) {
            const std::string pair = std::string("a ") + first.text + " b " + second.text;
            EXPECT_EQ(difference(pair + "c") + difference(pair + "~=c"), "");
        }
        for (const std::string prefix : {"", "-", "- ", "--", "+-", "!-", "-~", "! ~ "})
            for (const std::string operand : {"x", "3", ".5", "(x)", "f(x)", "x.y"})
                EXPECT_EQ(difference("2" + (first.text + prefix) + operand + first.text + prefix + operand), "");
    }
}

/// Real conditions and, from each of them, one that has lost, doubled or exchanged a few bytes.
TEST(Agreement, OnRealConditions) {
    std::minstd_rand random(1);
    const auto pick = [&](std::size_t count) { return static_cast<std::size_t>(random()) % count; };
    for (const CorpusFile& file : corpusFiles) {
        SymbolicExprTable table;
        std::size_t readable = 0;
        for (std::string line : corpusLines(file.name)) {
            EXPECT_EQ(difference(table, line, true, true), "");
            readable += parse(table, line).error ? 0U : 1U;
            for (std::size_t edits = 1 + pick(3); edits > 0 && !line.empty(); --edits) {
                const std::size_t at = pick(line.size());
                switch (pick(3)) {
                case 0:
                    line.erase(at, 1 + pick(3));
                    break;
                case 1:
                    line.insert(at, line.substr(pick(line.size()), 1 + pick(4)));
                    break;
                default:
                    line[at] = "()!-~&|=<.,1a "[pick(14)];
                }
            }
            EXPECT_EQ(difference(table, line, true, true) + difference(table, line, false, false), "");
        }
        EXPECT_EQ(readable, file.readable) << file.name;
    }
}

} // namespace
} // namespace VT::Testing
