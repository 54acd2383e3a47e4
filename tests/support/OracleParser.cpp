#include "tests/support/OracleParser.hpp"

#include "tests/support/AnyNode.hpp"

#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

namespace VT::Testing {

namespace {

constexpr int maxDepth = 256;

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

bool isLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

bool isBlank(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

struct Operator {
    std::string_view text;
    int strength = 0; // 0 stands for no operator; a greater number binds tighter
    SymbolicOp op = SymbolicOp::None;
};

/// The longer one of two that begin alike comes first.
constexpr Operator infixes[] = {
    {"||", 1, SymbolicOp::Or},         {"|", 3, SymbolicOp::BitOr},       {"&&", 2, SymbolicOp::And},
    {"&", 5, SymbolicOp::BitAnd},      {"^", 4, SymbolicOp::BitXOr},      {"==", 6, SymbolicOp::Equal},
    {"!=", 6, SymbolicOp::NotEqual},   {"~=", 6, SymbolicOp::NotEqual},   {"<=", 7, SymbolicOp::LessThanEqual},
    {"<<", 8, SymbolicOp::ShiftLeft},  {"<", 7, SymbolicOp::LessThan},    {">=", 7, SymbolicOp::GreaterThanEqual},
    {">>", 8, SymbolicOp::ShiftRight}, {">", 7, SymbolicOp::GreaterThan}, {"+", 9, SymbolicOp::Plus},
    {"-", 9, SymbolicOp::Minus},       {"*", 10, SymbolicOp::Multiply},   {"/", 10, SymbolicOp::Divide},
    {"%", 10, SymbolicOp::Modulo}};

class Oracle {
public:
    Oracle(SymbolicExprTable& table, std::string_view text, OracleOptions options)
        : table_(table),
          begin_(text.data()),
          end_(begin_ + text.size()),
          at_(begin_),
          options_(options) {}

    OracleResult run() {
        SymbolicExprId id = invalidId;
        if (!expression(1, id))
            at_ = begin_;
        else
            skipBlanks();
        if (refused_ != nullptr)
            at_ = refused_;
        return {at_ == end_ && at_ != begin_ && refused_ == nullptr ? id : invalidId, offset(at_)};
    }

private:
    // Every reading function leaves the position as it was where it answers false.
    // NOLINTBEGIN(misc-no-recursion): brackets are at most maxDepth deep

    bool expression(int weakest, SymbolicExprId& left) {
        if (!prefixed(left))
            return false;
        for (;;) {
            const char* before = at_;
            const Operator next = infix();
            SymbolicExprId right = invalidId;
            if (next.strength < weakest || before == givenBack_) {
                at_ = before;
                return true;
            }
            at_ += next.text.size();
            if (!expression(next.strength + 1, right)) {
                at_ = givenBack_ = before;
                return true;
            }
            left = makeNode(table_, next.op, {left, right});
        }
    }

    Operator infix() {
        skipBlanks();
        for (const Operator& each : infixes)
            if (std::string_view(at_, rest()).starts_with(each.text) && (each.text != "~=" || !options_.cOperators))
                return each;
        return {};
    }

    bool prefixed(SymbolicExprId& id) {
        const char* start = at_;
        std::string prefixes;
        for (skipBlanks(); isPrefix(); skipBlanks()) {
            if (prefixes.size() == maxDepth)
                return refuse(at_, start);
            prefixes.push_back(*at_++);
        }
        if (!operand(id)) {
            at_ = start;
            return false;
        }
        for (; !prefixes.empty(); prefixes.pop_back()) {
            if (prefixes.back() == '-')
                id = SymbolicUnaryMinusExpr(table_, id).getId(table_);
            else if (prefixes.back() == '!' || (prefixes.back() == '~' && !options_.cOperators))
                id = SymbolicNotExpr(table_, id).getId(table_);
            else if (prefixes.back() == '~')
                id = SymbolicBitComplExpr(table_, id).getId(table_);
        }
        return true;
    }

    bool isPrefix() const {
        const char c = peek();
        return c == '!' || c == '~' || ((c == '-' || c == '+') && !numberAt(at_ + 1));
    }

    /// At the first character of an operand.
    bool operand(SymbolicExprId& id) {
        const char c = peek();
        if (isLetter(c)) {
            id = name();
            return suffix(id), true;
        }
        if (c == '(')
            return keyword("(sim)", id) || keyword("(codegen)", id) || bracket([&] { return expression(1, id); }, ')');
        if (c == '[') {
            std::vector<SymbolicExprId> elements;
            if (!bracket([&] { return list(elements); }, ']'))
                return false;
            id = SymbolicNDExpr(table_, elements).getId(table_);
            return true;
        }
        return number(id);
    }

    SymbolicExprId name() {
        const char* start = at_;
        while (isLetter(peek()) || isDigit(peek()))
            ++at_;
        name_.assign(start, at_);
        return SymbolicString(table_, name_).getId(table_);
    }

    /// Arguments or members behind a name, where there are any.
    void suffix(SymbolicExprId& id) {
        const char* start = at_;
        skipBlanks();
        if (peek() == '(') {
            std::vector<SymbolicExprId> arguments;
            if (!bracket([&] { return list(arguments) || (skipBlanks(), peek() == ')'); }, ')'))
                at_ = start;
            else if (arguments.empty())
                id = SymbolicFcnCall0UExpr(table_, id).getId(table_);
            else
                id = SymbolicFcnCallExpr(table_, id, arguments).getId(table_);
            return;
        }
        for (; peek() == '.'; skipBlanks()) {
            ++at_;
            skipBlanks();
            if (!isLetter(peek()))
                break;
            name();
            id = SymbolicMemberValue(table_, id, name_).getId(table_);
            start = at_;
        }
        at_ = start;
    }

    bool list(std::vector<SymbolicExprId>& ids) {
        SymbolicExprId id = invalidId;
        if (!expression(1, id))
            return false;
        ids.push_back(id);
        for (;;) {
            const char* before = at_;
            skipBlanks();
            if (peek() != ',' || !(++at_, expression(1, id))) {
                at_ = before;
                return true;
            }
            ids.push_back(id);
        }
    }

    template <class Inner>
    bool bracket(Inner inner, char close) {
        const char* start = at_;
        if (depth_ == maxDepth)
            return refuse(at_, start);
        ++at_;
        ++depth_;
        const bool read = inner() && (skipBlanks(), peek() == close);
        --depth_;
        at_ = read ? at_ + 1 : start;
        return read;
    }

    // NOLINTEND(misc-no-recursion)

    bool keyword(std::string_view text, SymbolicExprId& id) {
        if (!options_.variantKeywords || !std::string_view(at_, rest()).starts_with(text))
            return false;
        at_ += text.size();
        id = SymbolicString(table_, std::string(text)).getId(table_);
        return true;
    }

    /// Whether digits of a number begin here.
    bool numberAt(const char* at) const {
        if (at < end_ && *at == '.')
            ++at;
        return at < end_ && isDigit(*at);
    }

    bool number(SymbolicExprId& id) {
        const char* start = at_;
        const bool negative = peek() == '-';
        const char* digits = start + (negative || peek() == '+' ? 1 : 0);
        if (!numberAt(digits))
            return false;
        const char* at = digits;
        long long value = 0;
        for (; at < end_ && isDigit(*at); ++at)
            value = value > 4294967295 ? value : value * 10 + (*at - '0');
        if (at < end_ && *at == '.' && real(at, id))
            return true;
        if (at == digits)
            return false;
        value = negative ? -value : value;
        if (value < -2147483648LL || value > 2147483647LL)
            return refuse(digits, start);
        at_ = at;
        id = SymbolicIntValue(table_, static_cast<int>(value)).getId(table_);
        return true;
    }

    /// A real literal that begins at the position and whose point is at `point`.
    bool real(const char* point, SymbolicExprId& id) {
        const char* at = point + 1;
        while (at < end_ && isDigit(*at))
            ++at;
        if (at < end_ && (*at == 'e' || *at == 'E')) {
            const char* exponent = at + 1;
            if (exponent < end_ && (*exponent == '-' || *exponent == '+'))
                ++exponent;
            for (; exponent < end_ && isDigit(*exponent); at = exponent)
                ++exponent;
        }
        const double value = std::strtod(std::string(at_, at).c_str(), nullptr);
        if (std::isinf(value))
            return false;
        at_ = at;
        id = SymbolicDoubleValue(table_, value).getId(table_);
        return true;
    }

    bool refuse(const char* place, const char* start) {
        if (refused_ == nullptr)
            refused_ = place;
        at_ = start;
        return false;
    }

    void skipBlanks() {
        while (at_ < end_ && isBlank(*at_))
            ++at_;
    }

    char peek(std::ptrdiff_t ahead = 0) const { return end_ - at_ > ahead ? at_[ahead] : '\0'; }

    std::size_t rest() const { return static_cast<std::size_t>(end_ - at_); }

    std::size_t offset(const char* at) const { return static_cast<std::size_t>(at - begin_); }

    SymbolicExprTable& table_;
    const char* begin_;
    const char* end_;
    const char* at_;
    OracleOptions options_;
    const char* refused_ = nullptr;   // a literal or bracket that ends the reading
    const char* givenBack_ = nullptr; // an operator without operand, which no outer level tries again
    int depth_ = 0;
    std::string name_;
};

} // namespace

OracleResult oracleParse(SymbolicExprTable& table, std::string_view text, OracleOptions options) {
    return Oracle(table, text, options).run();
}

} // namespace VT::Testing
