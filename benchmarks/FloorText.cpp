#include "benchmarks/FloorText.hpp"

#include "base/core/Operators.hpp"

#include <bit>
#include <charconv>

namespace VT::Benchmarks {

namespace {

constexpr std::uint64_t none = ~std::uint64_t{0};

struct Infix {
    int strength = 0; // 0 stands for no operator; a greater number binds tighter
    int length = 0;
    SymbolicOp op = SymbolicOp::None;
};

/// Answers the number of a record, or `none` for a text that cannot be read on.
class Reader {
public:
    Reader(RecordTable& table, std::string_view text)
        : table_(table),
          at_(text.data()),
          end_(text.data() + text.size()) {}

    std::uint64_t run() {
        const std::uint64_t id = expression(1);
        skipBlanks();
        return at_ == end_ ? id : none;
    }

private:
    // NOLINTBEGIN(misc-no-recursion): the texts that are measured are not deep

    std::uint64_t expression(int weakest) {
        std::uint64_t left = prefixed();
        while (left != none) {
            const Infix next = infix();
            if (next.strength < weakest || next.strength == 0)
                break;
            at_ += next.length;
            const std::uint64_t right = expression(next.strength + 1);
            if (right == none)
                return none;
            left = table_.intern(next.op, left, right);
        }
        return left;
    }

    Infix infix() {
        skipBlanks();
        const char next = peek(1);
        switch (peek()) {
        case '|':
            return next == '|' ? Infix{1, 2, SymbolicOp::Or} : Infix{3, 1, SymbolicOp::BitOr};
        case '&':
            return next == '&' ? Infix{2, 2, SymbolicOp::And} : Infix{5, 1, SymbolicOp::BitAnd};
        case '^':
            return {4, 1, SymbolicOp::BitXOr};
        case '=':
            return next == '=' ? Infix{6, 2, SymbolicOp::Equal} : Infix{};
        case '!':
            return next == '=' ? Infix{6, 2, SymbolicOp::NotEqual} : Infix{};
        case '<':
            return next == '='   ? Infix{7, 2, SymbolicOp::LessThanEqual}
                   : next == '<' ? Infix{8, 2, SymbolicOp::ShiftLeft}
                                 : Infix{7, 1, SymbolicOp::LessThan};
        case '>':
            return next == '='   ? Infix{7, 2, SymbolicOp::GreaterThanEqual}
                   : next == '>' ? Infix{8, 2, SymbolicOp::ShiftRight}
                                 : Infix{7, 1, SymbolicOp::GreaterThan};
        case '+':
            return {9, 1, SymbolicOp::Plus};
        case '-':
            return {9, 1, SymbolicOp::Minus};
        case '*':
            return {10, 1, SymbolicOp::Multiply};
        case '/':
            return {10, 1, SymbolicOp::Divide};
        case '%':
            return {10, 1, SymbolicOp::Modulo};
        default:
            return {};
        }
    }

    std::uint64_t prefixed() {
        skipBlanks();
        SymbolicOp op = SymbolicOp::None;
        switch (peek()) {
        case '!':
            op = SymbolicOp::Not;
            break;
        case '~':
            op = SymbolicOp::BitCompl;
            break;
        case '-':
            if (isDigit(peek(1)))
                return number();
            op = SymbolicOp::UnaryMinus;
            break;
        case '+':
            ++at_;
            return prefixed();
        default:
            return operand();
        }
        ++at_;
        const std::uint64_t inner = prefixed();
        return inner == none ? none : table_.intern(op, inner, none);
    }

    std::uint64_t operand() {
        const char c = peek();
        if (isLetter(c))
            return named();
        if (isDigit(c) || c == '.')
            return number();
        if (c != '(' && c != '[')
            return none;
        ++at_;
        std::uint64_t id = c == '(' ? expression(1) : table_.intern(SymbolicOp::DimsND, list(), none);
        skipBlanks();
        if (id == none || peek() != (c == '(' ? ')' : ']'))
            return none;
        ++at_;
        return id;
    }

    std::uint64_t named() {
        std::uint64_t id = table_.name(word());
        skipBlanks();
        if (peek() == '(') {
            ++at_;
            skipBlanks();
            const std::uint64_t arguments = peek() == ')' ? none : list();
            skipBlanks();
            if (peek() != ')')
                return none;
            ++at_;
            return table_.intern(SymbolicOp::FcnCall, id, arguments);
        }
        for (; peek() == '.'; skipBlanks()) {
            ++at_;
            skipBlanks();
            if (!isLetter(peek()))
                return none;
            id = table_.intern(SymbolicOp::MemberValue, id, table_.name(word()));
        }
        return id;
    }

    /// Arguments as pairs of one and the rest.
    std::uint64_t list() {
        const std::uint64_t first = expression(1);
        skipBlanks();
        if (first == none || peek() != ',')
            return first;
        ++at_;
        const std::uint64_t rest = list();
        return rest == none ? none : table_.intern(SymbolicOp::Row, first, rest);
    }

    // NOLINTEND(misc-no-recursion)

    std::uint64_t number() {
        int integer = 0;
        const auto [end, error] = std::from_chars(at_, end_, integer);
        if (error == std::errc() && (end == end_ || *end != '.')) {
            at_ = end;
            return table_.intern(SymbolicOp::IntValue, static_cast<std::uint64_t>(static_cast<std::int64_t>(integer)),
                                 none);
        }
        double real = 0;
        const auto [behind, failure] = std::from_chars(at_, end_, real);
        if (failure != std::errc())
            return none;
        at_ = behind;
        return table_.intern(SymbolicOp::DoubleValue, std::bit_cast<std::uint64_t>(real), none);
    }

    std::string_view word() {
        const char* start = at_;
        while (isLetter(peek()) || isDigit(peek()))
            ++at_;
        return {start, static_cast<std::size_t>(at_ - start)};
    }

    static bool isDigit(char c) { return c >= '0' && c <= '9'; }

    static bool isLetter(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_'; }

    void skipBlanks() {
        while (at_ < end_ && (*at_ == ' ' || (*at_ >= '\t' && *at_ <= '\r')))
            ++at_;
    }

    [[nodiscard]] char peek(std::ptrdiff_t ahead = 0) const { return end_ - at_ > ahead ? at_[ahead] : '\0'; }

    RecordTable& table_;
    const char* at_;
    const char* end_;
};

template <class Number>
void appendNumber(Number value, std::string& text) {
    char digits[32];
    text.append(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

} // namespace

std::optional<std::uint32_t> readRecords(RecordTable& table, std::string_view text) {
    const std::uint64_t id = Reader(table, text).run();
    return id == none ? std::nullopt : std::optional(static_cast<std::uint32_t>(id));
}

// NOLINTBEGIN(misc-no-recursion): the trees that are measured are no deeper than a thread's stack bears

namespace {

void writeOperand(const RecordTable& table, std::uint64_t id, bool wrapped, std::string& text) {
    if (wrapped)
        text += '(';
    writeRecord(table, id, text);
    if (wrapped)
        text += ')';
}

} // namespace

void writeRecord(const RecordTable& table, std::uint64_t id, std::string& text) {
    const Record& record = table[id];
    const auto precedence = [&](std::uint64_t operand) { return operatorInfo(table[operand].op).precedence; };
    switch (record.op) {
    case SymbolicOp::String:
        text += table.text(record);
        return;
    case SymbolicOp::IntValue:
        return appendNumber(static_cast<std::int64_t>(record.left), text);
    case SymbolicOp::DoubleValue:
        return appendNumber(std::bit_cast<double>(record.left), text);
    case SymbolicOp::FcnCall:
        writeRecord(table, record.left, text);
        text += '(';
        if (record.right != none)
            writeRecord(table, record.right, text);
        text += ')';
        return;
    case SymbolicOp::Row:
        writeRecord(table, record.left, text);
        text += ',';
        return writeRecord(table, record.right, text);
    case SymbolicOp::DimsND:
        text += '[';
        writeRecord(table, record.left, text);
        text += ']';
        return;
    default:
        break;
    }
    const OperatorInfo& info = operatorInfo(record.op);
    if (record.right == none) {
        text += info.c;
        return writeOperand(table, record.left, precedence(record.left) > info.precedence, text);
    }
    writeOperand(table, record.left, precedence(record.left) > info.precedence, text);
    text += info.c;
    writeOperand(table, record.right, precedence(record.right) >= info.precedence, text);
}

// NOLINTEND(misc-no-recursion)

} // namespace VT::Benchmarks
