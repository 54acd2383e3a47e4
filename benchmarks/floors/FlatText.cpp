#include "benchmarks/floors/FlatText.hpp"

#include <array>
#include <bit>
#include <charconv>

namespace Floor {

namespace {

constexpr auto classesOf = [] { // what a byte is: 1 a letter, 2 a digit, 4 a blank
    std::array<std::uint8_t, 256> classes{};
    for (unsigned c = 0; c < 26; ++c)
        classes['a' + c] = classes['A' + c] = 1;
    classes['_'] = 1;
    for (unsigned c = '0'; c <= '9'; ++c)
        classes[c] = 2;
    for (const char c : {' ', '\t', '\n', '\v', '\f', '\r'})
        classes[static_cast<unsigned char>(c)] = 4;
    return classes;
}();

struct Infix {
    std::uint8_t power = 0; ///< a greater number binds tighter; 0 for no operator
    Kind kind{};
};

/// The operators that a byte begins: alone, and followed by a second byte.
struct Begun {
    Infix alone;
    std::array<char, 2> seconds{};
    std::array<Infix, 2> pairs{};
};

constexpr auto begun = [] {
    std::array<Begun, 128> all{};
    all['|'] = {{3, Kind::BitOr}, {'|'}, {Infix{1, Kind::Or}}};
    all['&'] = {{5, Kind::BitAnd}, {'&'}, {Infix{2, Kind::And}}};
    all['^'] = {{4, Kind::BitXor}, {}, {}};
    all['='] = {{}, {'='}, {Infix{6, Kind::Equal}}};
    all['!'] = {{}, {'='}, {Infix{6, Kind::NotEqual}}};
    all['<'] = {{7, Kind::Less}, {'=', '<'}, {Infix{7, Kind::LessEqual}, Infix{8, Kind::ShiftLeft}}};
    all['>'] = {{7, Kind::Greater}, {'=', '>'}, {Infix{7, Kind::GreaterEqual}, Infix{8, Kind::ShiftRight}}};
    all['+'] = {{9, Kind::Plus}, {}, {}};
    all['-'] = {{9, Kind::Minus}, {}, {}};
    all['*'] = {{10, Kind::Times}, {}, {}};
    all['/'] = {{10, Kind::Divide}, {}, {}};
    all['%'] = {{10, Kind::Modulo}, {}, {}};
    return all;
}();

// NOLINTBEGIN(misc-no-recursion): texts that are measured are no deeper than a thread's stack bears

class Reader {
public:
    Reader(FlatTable& table, std::string_view text)
        : table_(table),
          at_(text.data()),
          end_(text.data() + text.size()) {}

    std::uint32_t run() {
        const std::uint32_t id = expression(1);
        return at_ == end_ ? id : none;
    }

private:
    /// Reads up to an operator that binds less tightly.  Blanks after an operand are read with it.
    std::uint32_t expression(unsigned weakest) {
        std::uint32_t left = prefixed();
        while (left != none) {
            const auto c = static_cast<unsigned char>(peek());
            if (c >= begun.size())
                break;
            const Begun& begin = begun[c];
            Infix infix = begin.alone;
            std::ptrdiff_t length = 1;
            for (std::size_t i = 0; i < 2; ++i)
                if (begin.seconds[i] != 0 && begin.seconds[i] == peek(1)) {
                    infix = begin.pairs[i];
                    length = 2;
                }
            if (infix.power == 0 || infix.power < weakest)
                break;
            at_ += length;
            const std::uint32_t right = expression(infix.power + 1U);
            left = right == none ? none : table_.intern(infix.kind, left, right);
        }
        return left;
    }

    std::uint32_t prefixed() {
        skipBlanks();
        Kind kind{};
        switch (peek()) {
        case '!':
            kind = Kind::Not;
            break;
        case '~':
            kind = Kind::Complement;
            break;
        case '-':
            if (is(peek(1), 2) || (peek(1) == '.' && is(peek(2), 2)))
                return number();
            kind = Kind::Negate;
            break;
        case '+':
            ++at_;
            return prefixed();
        default:
            return operand();
        }
        ++at_;
        const std::uint32_t inner = prefixed();
        return inner == none ? none : table_.intern(kind, inner, none);
    }

    std::uint32_t operand() {
        const char c = peek();
        if (is(c, 1))
            return named();
        if (is(c, 2) || c == '.')
            return number();
        if (c != '(' && c != '[')
            return none;
        ++at_;
        const std::uint32_t inner = c == '(' ? expression(1) : list();
        if (inner == none || peek() != (c == '(' ? ')' : ']'))
            return none;
        next();
        return c == '(' ? inner : table_.intern(Kind::List, inner, none);
    }

    std::uint32_t named() {
        std::uint32_t id = table_.name(word());
        if (peek() == '(') {
            next();
            const bool empty = peek() == ')';
            const std::uint32_t arguments = empty ? none : list();
            if ((!empty && arguments == none) || peek() != ')')
                return none;
            next();
            return table_.intern(Kind::Call, id, arguments);
        }
        while (peek() == '.') {
            next();
            if (!is(peek(), 1))
                return none;
            id = table_.intern(Kind::Member, id, table_.name(word()));
        }
        return id;
    }

    std::uint32_t list() {
        const std::uint32_t first = expression(1);
        if (first == none || peek() != ',')
            return first;
        ++at_;
        const std::uint32_t rest = list();
        return rest == none ? none : table_.intern(Kind::Row, first, rest);
    }

    std::uint32_t number() {
        const char* digits = at_ + (*at_ == '-' ? 1 : 0);
        std::uint64_t value = 0;
        for (; digits < end_ && is(*digits, 2) && value <= 0x80000000U; ++digits)
            value = value * 10 + static_cast<std::uint64_t>(*digits - '0');
        if (digits == end_ || *digits != '.') {
            const bool negative = *at_ == '-';
            if (value > 0x7fffffffU + (negative ? 1U : 0U))
                return none;
            at_ = digits;
            skipBlanks();
            return table_.intern(Kind::Integer, static_cast<std::uint32_t>(negative ? 0 - value : value), none);
        }
        double real = 0;
        const auto [after, error] = std::from_chars(at_, end_, real);
        if (error != std::errc())
            return none;
        at_ = after;
        skipBlanks();
        const auto bits = std::bit_cast<std::uint64_t>(real);
        return table_.intern(Kind::Real, static_cast<std::uint32_t>(bits >> 32U), static_cast<std::uint32_t>(bits));
    }

    std::string_view word() {
        const char* const start = at_;
        while (is(peek(), 3))
            ++at_;
        const std::string_view text(start, static_cast<std::size_t>(at_ - start));
        skipBlanks();
        return text;
    }

    static bool is(char c, unsigned classes) { return (classesOf[static_cast<unsigned char>(c)] & classes) != 0; }

    void next() {
        ++at_;
        skipBlanks();
    }

    void skipBlanks() {
        while (is(peek(), 4))
            ++at_;
    }

    [[nodiscard]] char peek(std::ptrdiff_t ahead = 0) const { return end_ - at_ > ahead ? at_[ahead] : '\0'; }

    FlatTable& table_;
    const char* at_;
    const char* end_;
};

struct Spelling {
    std::uint8_t power; ///< a greater number binds tighter
    std::uint8_t length;
    std::array<char, 2> text;
};

constexpr auto spellings = [] {
    std::array<Spelling, 28> all{};
    for (Spelling& each : all)
        each = {20, 0, {}};
    const auto set = [&](Kind kind, std::uint8_t power, std::string_view text) {
        all[static_cast<std::size_t>(kind)] = {
            power, static_cast<std::uint8_t>(text.size()), {text[0], text.size() > 1 ? text[1] : '\0'}};
    };
    set(Kind::Or, 1, "||");
    set(Kind::And, 2, "&&");
    set(Kind::BitOr, 3, "|");
    set(Kind::BitXor, 4, "^");
    set(Kind::BitAnd, 5, "&");
    set(Kind::Equal, 6, "==");
    set(Kind::NotEqual, 6, "!=");
    set(Kind::Less, 7, "<");
    set(Kind::LessEqual, 7, "<=");
    set(Kind::Greater, 7, ">");
    set(Kind::GreaterEqual, 7, ">=");
    set(Kind::ShiftLeft, 8, "<<");
    set(Kind::ShiftRight, 8, ">>");
    set(Kind::Plus, 9, "+");
    set(Kind::Minus, 9, "-");
    set(Kind::Times, 10, "*");
    set(Kind::Divide, 10, "/");
    set(Kind::Modulo, 10, "%");
    set(Kind::Negate, 11, "-");
    set(Kind::Not, 11, "!");
    set(Kind::Complement, 11, "~");
    set(Kind::Member, 20, ".");
    return all;
}();

const Spelling& spellingOf(Kind kind) {
    return spellings[static_cast<std::size_t>(kind)];
}

class Writer {
public:
    Writer(const FlatTable& table, Output& output) : table_(table), text_(output.bytes), spine_(output.waiting) {}

    void write(std::uint32_t id) {
        // The left spine is written without recursion, however long it is.
        const std::size_t bottom = spine_.size();
        while (isInfix(table_[id].kind)) {
            const Record& record = table_[id];
            const bool wrapped = spellingOf(table_[record.left].kind).power < spellingOf(record.kind).power;
            spine_.push_back({id, wrapped});
            id = record.left;
        }
        for (std::size_t i = spine_.size(); i-- > bottom;)
            if (spine_[i].wrapped)
                text_.push_back('(');
        writeOther(table_[id]);
        while (spine_.size() > bottom) {
            const Output::Waiting step = spine_.back();
            spine_.pop_back();
            if (step.wrapped)
                text_.push_back(')');
            const Record& record = table_[step.id];
            const Spelling& spelling = spellingOf(record.kind);
            append({spelling.text.data(), spelling.length});
            writeOperand(record.right, spellingOf(table_[record.right].kind).power <= spelling.power);
        }
    }

private:
    static bool isInfix(Kind kind) { return kind >= Kind::Or && kind <= Kind::Modulo; }

    void writeOther(const Record& record) {
        switch (record.kind) {
        case Kind::Name:
            return append(table_.text(record));
        case Kind::Integer:
            return appendNumber(static_cast<std::int32_t>(record.left));
        case Kind::Real:
            return appendNumber(std::bit_cast<double>(std::uint64_t{record.left} << 32U | record.right));
        case Kind::Member:
            write(record.left);
            text_.push_back('.');
            return write(record.right);
        case Kind::Call:
            write(record.left);
            text_.push_back('(');
            if (record.right != none)
                write(record.right);
            return text_.push_back(')');
        case Kind::Row:
            write(record.left);
            text_.push_back(',');
            return write(record.right);
        case Kind::List:
            text_.push_back('[');
            write(record.left);
            return text_.push_back(']');
        default:
            text_.push_back(spellingOf(record.kind).text[0]);
            return writeOperand(record.left, spellingOf(table_[record.left].kind).power < 11);
        }
    }

    void writeOperand(std::uint32_t id, bool wrapped) {
        if (wrapped)
            text_.push_back('(');
        const Record& record = table_[id];
        if (isInfix(record.kind))
            write(id);
        else
            writeOther(record);
        if (wrapped)
            text_.push_back(')');
    }

    void append(std::string_view bytes) { text_.insert(text_.end(), bytes.begin(), bytes.end()); }

    template <class Number>
    void appendNumber(Number value) {
        std::array<char, 32> digits;
        append({digits.data(), std::to_chars(digits.data(), digits.data() + digits.size(), value).ptr});
    }

    const FlatTable& table_;
    std::vector<char>& text_;
    std::vector<Output::Waiting>& spine_;
};

// NOLINTEND(misc-no-recursion)

} // namespace

std::uint32_t read(FlatTable& table, std::string_view text) {
    return Reader(table, text).run();
}

void write(const FlatTable& table, std::uint32_t id, Output& output) {
    Writer(table, output).write(id);
}

} // namespace Floor
