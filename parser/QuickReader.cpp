// Reads ordinary conditions in one pass, and interns them in a second one over their parts.
//
// Method: operator precedence with explicit stacks (Floyd, "Syntactic analysis and operator precedence", 1963).  The
// parts of an operand are linked in the order of interning, right operands first; joining two operands sets three
// links. A text is interned once all of it is read. Cost: linear in the text. Relies on: the operator table for
// spellings and strengths; the condition grammar for all that is given up.
#include "parser/QuickReader.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Numbers.hpp"

#include <array>
#include <limits>

namespace VT::Parser {

namespace {

constexpr std::uint8_t letterClass = 1;
constexpr std::uint8_t digitClass = 2;
constexpr std::uint8_t blankClass = 4;

constexpr auto byteClasses = [] {
    std::array<std::uint8_t, 256> classes{};
    for (unsigned c = 'a'; c <= 'z'; ++c)
        classes[c] = classes[c - 'a' + 'A'] = letterClass;
    classes['_'] = letterClass;
    for (unsigned c = '0'; c <= '9'; ++c)
        classes[c] = digitClass;
    for (const char c : {' ', '\t', '\n', '\v', '\f', '\r'})
        classes[static_cast<unsigned char>(c)] = blankClass;
    return classes;
}();

bool isOf(char c, unsigned classes) {
    return (byteClasses[static_cast<unsigned char>(c)] & classes) != 0;
}

/// The infix operators that begin with a byte: alone, and with a second byte.
struct Beginning {
    static constexpr std::size_t most = 2;

    SymbolicOp alone = SymbolicOp::None;
    std::array<char, most> seconds{};
    std::array<SymbolicOp, most> pairs{SymbolicOp::None, SymbolicOp::None};
};

constexpr auto beginnings = [] {
    std::array<Beginning, 128> all{};
    for (const OperatorInfo& row : operatorTable()) {
        if (!conditionInfixOps.contains(row.op))
            continue;
        Beginning& beginning = all[static_cast<unsigned char>(row.c[0])];
        if (row.c.size() == 1) {
            beginning.alone = row.op;
            continue;
        }
        const std::size_t place = beginning.seconds[0] == '\0' ? 0 : 1;
        beginning.seconds.at(place) = row.c[1];
        beginning.pairs.at(place) = row.op;
    }
    return all;
}();

constexpr std::uint32_t noItem = std::numeric_limits<std::uint32_t>::max();

} // namespace

SymbolicExprId QuickReader::read(std::string_view text) {
    if (text.size() >= noItem)
        return invalidId;
    text_ = text;
    at_ = 0;
    brackets_ = 0;
    operandIsNext_ = true;
    items_.clear();
    operands_.clear();
    waiting_.clear();
    return readAll() ? intern(operands_[0]) : invalidId;
}

bool QuickReader::readAll() {
    while (true) {
        if (operandIsNext_) {
            if (!readOperand())
                return false;
            continue;
        }
        skipBlanks();
        if (at_ == text_.size()) {
            foldUpTo(std::numeric_limits<unsigned>::max());
            return waiting_.empty();
        }
        if (!readOperator())
            return false;
    }
}

bool QuickReader::readOperand() {
    if (!readPrefixes())
        return false;
    const char c = peek();
    if (isOf(c, letterClass))
        return readName();
    if (c != '(')
        return readNumber();
    const std::string_view rest = text_.substr(at_);
    if (options_.variantKeywords && (rest.starts_with(VariantKeywords::getSimVariantKeyword()) ||
                                     rest.starts_with(VariantKeywords::getCodegenVariantKeyword())))
        return false;
    return openBracket(Wait::Parenthesis, noItem);
}

/// Reads prefix operators.  A sign directly before a number belongs to the number.
bool QuickReader::readPrefixes() {
    for (std::size_t prefixes = 0;; ++prefixes) {
        skipBlanks();
        const char c = peek();
        const bool isSign = c == '-' || c == '+';
        if (!(isSign ? !isDigitAt(peek(1) == '.' ? 2 : 1) : c == '!' || c == '~'))
            return true;
        if (prefixes == limits::nesting)
            return false;
        ++at_;
        if (c == '+')
            continue;
        const SymbolicOp op = c == '-'                          ? SymbolicOp::UnaryMinus
                              : c == '~' && options_.cOperators ? SymbolicOp::BitCompl
                                                                : SymbolicOp::Not;
        waiting_.push_back({Wait::Prefix, 0, op, noItem, noItem, 0});
    }
}

bool QuickReader::readName() {
    const auto addWord = [&] {
        const std::string_view name = word();
        skipBlanks();
        return add(Part::Name, SymbolicOp::String, static_cast<std::uint32_t>(name.data() - text_.data()),
                   static_cast<std::uint32_t>(name.size()));
    };
    const std::uint32_t name = addWord();
    if (peek() == '(')
        return openBracket(Wait::Call, name);
    Operand operand{name, name};
    while (peek() == '.') {
        ++at_;
        skipBlanks();
        if (!isOf(peek(), letterClass))
            return false;
        const std::uint32_t member = addWord();
        const std::uint32_t whole = add(Part::Operator, SymbolicOp::MemberValue);
        items_[operand.root].next = member;
        items_[member].next = whole;
        operand.root = whole;
    }
    return endOperand(operand);
}

/// Reads a number with its sign.
bool QuickReader::readNumber() {
    const std::size_t start = at_;
    const bool isNegative = peek() == '-';
    if (isNegative || peek() == '+')
        ++at_;
    constexpr std::uint64_t bound = std::uint64_t{1} << 31U;
    const std::size_t digits = at_;
    std::uint64_t value = 0;
    for (; isOf(peek(), digitClass) && value <= bound; ++at_)
        value = value * 10 + static_cast<std::uint64_t>(peek() - '0');
    if (at_ == digits || peek() == '.' || isOf(peek(), letterClass | digitClass) ||
        value > bound - (isNegative ? 0U : 1U)) {
        at_ = start; // a real, a number that is too large, or no operand
        return readReal();
    }
    const auto bits = static_cast<std::uint32_t>(isNegative ? 0 - value : value);
    const std::uint32_t number = add(Part::Integer, SymbolicOp::IntValue, 0, bits);
    return endOperand({number, number});
}

bool QuickReader::readReal() {
    if (peek() == '+')
        ++at_; // the number without it is the same
    const std::size_t start = at_;
    if (peek() == '-')
        ++at_;
    const auto skipDigits = [&] {
        const std::size_t first = at_;
        while (isOf(peek(), digitClass))
            ++at_;
        return at_ - first;
    };
    const std::size_t whole = skipDigits();
    if (peek() != '.')
        return false;
    ++at_;
    if (whole + skipDigits() == 0)
        return false;
    if (peek() == 'e' || peek() == 'E') {
        ++at_;
        if (peek() == '+' || peek() == '-')
            ++at_;
        if (skipDigits() == 0)
            return false;
    }
    if (peek() == '.' || isOf(peek(), letterClass) ||
        vtsv_strtod(text_.substr(start, at_ - start)).error != NumberError::None)
        return false;
    const std::uint32_t number = add(Part::Real, SymbolicOp::DoubleValue, static_cast<std::uint32_t>(start),
                                     static_cast<std::uint32_t>(at_ - start));
    return endOperand({number, number});
}

bool QuickReader::openBracket(Wait wait, std::uint32_t callee) {
    if (++brackets_ > limits::nesting)
        return false;
    ++at_;
    waiting_.push_back({wait, 0, SymbolicOp::FcnCall, callee, callee, 0});
    if (wait == Wait::Call) {
        skipBlanks();
        if (peek() == ')')
            return closeBracket();
    }
    return true;
}

/// Reads what follows an operand.
bool QuickReader::readOperator() {
    const char c = peek();
    if (c == ')')
        return closeBracket();
    if (c == ',')
        return nextArgument();
    SymbolicOp op = SymbolicOp::None;
    std::size_t length = 1;
    if (static_cast<unsigned char>(c) < beginnings.size()) {
        const Beginning& beginning = beginnings[static_cast<unsigned char>(c)];
        op = beginning.alone;
        const char second = peek(1);
        for (std::size_t i = 0; i < Beginning::most; ++i)
            if (second != '\0' && beginning.seconds[i] == second) {
                op = beginning.pairs[i];
                length = 2;
            }
    }
    if (op == SymbolicOp::None)
        return false;
    at_ += length;
    const std::uint8_t precedence = operatorInfo(op).precedence;
    foldUpTo(precedence);
    waiting_.push_back({Wait::Infix, precedence, op, noItem, noItem, 0});
    operandIsNext_ = true;
    return true;
}

bool QuickReader::closeBracket() {
    foldUpTo(std::numeric_limits<unsigned>::max());
    if (waiting_.empty())
        return false;
    ++at_;
    --brackets_;
    if (waiting_.back().wait == Wait::Call) {
        const bool isEmpty = operandIsNext_;
        if (!isEmpty)
            endArgument(waiting_.back());
        const Waiting& call = waiting_.back();
        const std::uint32_t root =
            isEmpty ? add(Part::Operator, SymbolicOp::FcnCall0U) : add(Part::Call, SymbolicOp::FcnCall, call.arguments);
        items_[call.last].next = root;
        operands_.push_back({call.callee, root});
    }
    waiting_.pop_back();
    const Operand operand = operands_.back();
    operands_.pop_back();
    return endOperand(operand);
}

bool QuickReader::nextArgument() {
    foldUpTo(std::numeric_limits<unsigned>::max());
    if (waiting_.empty() || waiting_.back().wait != Wait::Call)
        return false;
    ++at_;
    endArgument(waiting_.back());
    operandIsNext_ = true;
    return true;
}

void QuickReader::endArgument(Waiting& call) {
    const Operand argument = operands_.back();
    operands_.pop_back();
    items_[call.last].next = argument.first;
    call.last = argument.root;
    ++call.arguments;
}

/// Joins the operands of the infix operators on top that bind as tightly as `precedence` or tighter.
void QuickReader::foldUpTo(unsigned precedence) {
    while (!waiting_.empty()) {
        const Waiting top = waiting_.back();
        if (top.wait != Wait::Infix || top.precedence > precedence)
            return;
        waiting_.pop_back();
        const Operand right = operands_.back();
        operands_.pop_back();
        Operand& left = operands_.back();
        const std::uint32_t root = add(Part::Operator, top.op);
        items_[right.root].next = left.first;
        items_[left.root].next = root;
        left = {right.first, root};
    }
}

/// Applies the prefix operators before an operand, which is then complete.
bool QuickReader::endOperand(Operand operand) {
    while (!waiting_.empty() && waiting_.back().wait == Wait::Prefix) {
        const std::uint32_t root = add(Part::Operator, waiting_.back().op);
        waiting_.pop_back();
        items_[operand.root].next = root;
        operand.root = root;
    }
    operands_.push_back(operand);
    operandIsNext_ = false;
    return true;
}

SymbolicExprId QuickReader::intern(Operand root) {
    ids_.clear();
    const auto take = [&] {
        const SymbolicExprId id = ids_.back();
        ids_.pop_back();
        return id;
    };
    for (std::uint32_t at = root.first; at != noItem; at = items_[at].next) {
        const Item& item = items_[at];
        switch (item.part) {
        case Part::Name:
            ids_.push_back(table_.internName(text_.substr(item.start, item.size)));
            break;
        case Part::Integer:
            ids_.push_back(SymbolicIntValue(table_, static_cast<std::int32_t>(item.size)).getId(table_));
            break;
        case Part::Real:
            ids_.push_back(
                SymbolicDoubleValue(table_, vtsv_strtod(text_.substr(item.start, item.size)).value).getId(table_));
            break;
        case Part::Call:
            ids_.push_back(internCall(item.start));
            break;
        case Part::Operator: {
            const auto op = static_cast<SymbolicOp>(item.op);
            const SymbolicExprId last = take();
            if (op == SymbolicOp::MemberValue) { // the owner comes first, then the name
                const auto& name = static_cast<const SymbolicString&>(*table_.get(last));
                ids_.push_back(SymbolicMemberValue(table_, take(), name.getName()).getId(table_));
            } else if (conditionInfixOps.contains(op)) {
                ids_.push_back(makeBinary(table_, op, last, take())); // the right operand comes first
            } else {
                ids_.push_back(makeUnary(table_, op, last));
            }
            break;
        }
        }
    }
    return take();
}

SymbolicExprId QuickReader::internCall(std::size_t arguments) {
    const std::size_t first = ids_.size() - arguments - 1;
    std::vector<SymbolicExprId> inputs(ids_.begin() + static_cast<std::ptrdiff_t>(first), ids_.end());
    ids_.resize(first);
    return SymbolicFcnCallExpr(table_, std::move(inputs)).getId(table_);
}

std::uint32_t QuickReader::add(Part part, SymbolicOp op, std::uint32_t start, std::uint32_t size) {
    items_.push_back({noItem, start, size, part, static_cast<std::uint8_t>(op)});
    return static_cast<std::uint32_t>(items_.size() - 1);
}

std::string_view QuickReader::word() {
    const std::size_t start = at_;
    while (isOf(peek(), letterClass | digitClass))
        ++at_;
    return text_.substr(start, at_ - start);
}

void QuickReader::skipBlanks() {
    while (isOf(peek(), blankClass))
        ++at_;
}

/// A byte of the text; 0 at its end.
char QuickReader::peek(std::size_t ahead) const {
    return at_ + ahead < text_.size() ? text_[at_ + ahead] : '\0';
}

bool QuickReader::isDigitAt(std::size_t ahead) const {
    return isOf(peek(ahead), digitClass);
}

} // namespace VT::Parser
