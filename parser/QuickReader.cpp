// Reads ordinary conditions in one pass, and interns them in a second one over their parts.
//
// Method: operator precedence with explicit stacks (Floyd, "Syntactic analysis and operator precedence", 1963).  The
// parts of an operand are linked in the order of interning; joining two operands sets three links.  A text is interned
// once all of it is read.
// Cost: linear in the text.
// Relies on: the operator table for spellings and strengths, the NUL after a text, which ends every look ahead; the
// grammar of each language for all that is given up.
#include "parser/QuickReader.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Numbers.hpp"
#include "parser/QuickSpellings.hpp"

#include <cmath>
#include <limits>

namespace VT::Parser {

namespace {

constexpr std::uint32_t noItem = std::numeric_limits<std::uint32_t>::max();

} // namespace

SymbolicExprId QuickReader::read(std::string_view text) {
    constexpr std::size_t most = std::numeric_limits<std::int32_t>::max();
    if (text.size() > most)
        return invalidId;
    text_ = text;
    at_ = text.data();
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
        if (at_ == text_.data() + text_.size()) {
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
    if (isOf(*at_, letterClass))
        return readName();
    if (*at_ != '(')
        return readNumber();
    return !startsKeyword() && openBracket(Wait::Parenthesis, noItem);
}

/// Reads prefix operators.  In C a sign directly before a number belongs to the number.
bool QuickReader::readPrefixes() {
    for (std::size_t prefixes = 0;; ++prefixes) {
        skipBlanks();
        const char c = *at_;
        const bool isSign = c == '-' || c == '+';
        if (isSign) {
            if (!isQuill_ && isOf(at_[at_[1] == '.' ? 2 : 1], digitClass))
                return true;
        } else if (c != '!' && c != '~') {
            return true;
        }
        if (prefixes == limits::nesting || (isQuill_ && !isSign && at_[1] == '='))
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
    const auto addName = [&](std::string_view name) {
        return add(Part::Name, SymbolicOp::String, static_cast<std::uint32_t>(name.data() - text_.data()),
                   static_cast<std::uint32_t>(name.size()));
    };
    const std::string_view first = word();
    const bool blank = skipBlanks();
    const bool isCalled = *at_ == '(';
    if (isQuill_ && (isQuillWord(first, isCalled) || (isCalled && blank && startsKeyword())))
        return false;
    const std::uint32_t name = addName(first);
    if (isCalled)
        return openBracket(Wait::Call, name);
    Operand operand{name, name};
    while (*at_ == '.') {
        ++at_;
        skipBlanks();
        if (!isOf(*at_, letterClass))
            return false;
        const std::string_view field = word();
        skipBlanks();
        if (isQuill_ && isQuillWord(field, false))
            return false;
        const std::uint32_t member = addName(field);
        const std::uint32_t whole = add(Part::Operator, SymbolicOp::MemberValue);
        items_[operand.root].next = member;
        items_[member].next = whole;
        operand.root = whole;
    }
    return endOperand(operand);
}

/// Reads a number with its sign.
bool QuickReader::readNumber() {
    const char* const start = at_;
    const bool isNegative = *at_ == '-';
    if (isNegative || *at_ == '+')
        ++at_;
    constexpr std::uint64_t bound = std::uint64_t{1} << 31U;
    const char* const digits = at_;
    std::uint64_t value = 0;
    for (; isOf(*at_, digitClass) && value <= bound; ++at_)
        value = value * 10 + static_cast<std::uint64_t>(*at_ - '0');
    if (at_ == digits || *at_ == '.' || isOf(*at_, letterClass | digitClass) ||
        value > bound - (isNegative ? 0U : 1U)) {
        at_ = start; // a real, a number that is too large, or no operand
        return readReal();
    }
    const auto bits = static_cast<std::uint32_t>(isNegative ? 0 - value : value);
    const std::uint32_t number = add(Part::Integer, SymbolicOp::IntValue, 0, bits);
    return endOperand({number, number});
}

/// Reads a real number with a decimal point.  In Quill digits follow the point, which else may begin an operator, and
/// integral values are left to the grammar, because they become integers.
bool QuickReader::readReal() {
    if (*at_ == '+')
        ++at_; // the number without it is the same
    const char* const start = at_;
    if (*at_ == '-')
        ++at_;
    const auto skipDigits = [&] {
        const char* const first = at_;
        while (isOf(*at_, digitClass))
            ++at_;
        return at_ - first;
    };
    const auto whole = skipDigits();
    if (*at_ != '.')
        return false;
    ++at_;
    const auto decimals = skipDigits();
    if ((isQuill_ ? 0 : whole) + decimals == 0)
        return false;
    if (*at_ == 'e' || *at_ == 'E') {
        ++at_;
        if (*at_ == '+' || *at_ == '-')
            ++at_;
        if (skipDigits() == 0)
            return false;
    }
    const std::string_view digits(start, static_cast<std::size_t>(at_ - start));
    const ParsedNumber read = vtsv_strtod(digits);
    if (*at_ == '.' || isOf(*at_, letterClass) || read.error != NumberError::None ||
        (isQuill_ && read.value == std::trunc(read.value)))
        return false;
    const std::uint32_t number =
        add(Part::Real, SymbolicOp::DoubleValue, static_cast<std::uint32_t>(start - text_.data()),
            static_cast<std::uint32_t>(digits.size()));
    return endOperand({number, number});
}

bool QuickReader::openBracket(Wait wait, std::uint32_t callee) {
    if (++brackets_ > limits::nesting)
        return false;
    ++at_;
    waiting_.push_back({wait, 0, SymbolicOp::FcnCall, callee, callee, 0});
    if (wait == Wait::Call) {
        skipBlanks();
        if (*at_ == ')')
            return closeBracket();
    }
    return true;
}

/// Reads what follows an operand.
bool QuickReader::readOperator() {
    const char c = *at_;
    if (c == ')')
        return closeBracket();
    if (c == ',')
        return nextArgument();
    const Beginning& beginning = (isQuill_ ? beginningsOfQuill : beginningsOfC)[static_cast<unsigned char>(c)];
    SymbolicOp op = beginning.alone;
    std::size_t length = 1;
    for (std::size_t i = 0; i < Beginning::most; ++i) {
        if (beginning.seconds[i] != '\0' && beginning.seconds[i] == at_[1]) {
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
        const std::uint32_t root = isEmpty && !isQuill_ ? add(Part::Operator, SymbolicOp::FcnCall0U)
                                                        : add(Part::Call, SymbolicOp::FcnCall, call.arguments);
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
        const Operand before = isQuill_ ? left : right;
        const Operand after = isQuill_ ? right : left;
        items_[before.root].next = after.first;
        items_[after.root].next = root;
        left = {before.first, root};
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
            ids_.push_back(table_.internName(textOf(item)));
            break;
        case Part::Integer:
            ids_.push_back(SymbolicIntValue(table_, static_cast<std::int32_t>(item.size)).getId(table_));
            break;
        case Part::Real:
            ids_.push_back(SymbolicDoubleValue(table_, vtsv_strtod(textOf(item)).value).getId(table_));
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
            } else if (infixOps.contains(op)) {
                const SymbolicExprId before = take();
                ids_.push_back(isQuill_ ? makeBinary(table_, op, before, last) : makeBinary(table_, op, last, before));
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
    const char* const start = at_;
    do
        ++at_;
    while (isOf(*at_, letterClass | digitClass));
    return {start, static_cast<std::size_t>(at_ - start)};
}

/// Returns whether there were any.
bool QuickReader::skipBlanks() {
    if (!isOf(*at_, blankClass))
        return false;
    do
        ++at_;
    while (isOf(*at_, blankClass));
    return true;
}

/// Whether a variant keyword begins here, at a parenthesis.
bool QuickReader::startsKeyword() const {
    const std::string_view rest(at_, static_cast<std::size_t>(text_.data() + text_.size() - at_));
    return options_.variantKeywords && (rest.starts_with(VariantKeywords::getSimVariantKeyword()) ||
                                        rest.starts_with(VariantKeywords::getCodegenVariantKeyword()));
}

} // namespace VT::Parser
