// Turns an expression into text bottom-up.
//
// Method: a visit takes the printed operands of its node from a stack and leaves the printed node, whose text is a join
// of theirs in a TextPool.  Parentheses follow the precedences of the operator table, and two signs never touch.  A C
// operator without a Quill spelling becomes a call, in whose arguments divisions become calls too; a node that is
// written differently there keeps both forms, so no node is printed more than twice.
// Cost: O(operands) for each distinct node, then the length of the text.
// Relies on: the walkers for order and depth, QuillCalls for the names of functions and the amounts of shifts.
#include "base/print/StringifySymbolicExpr.hpp"

#include "base/core/Check.hpp"
#include "base/transform/QuillCalls.hpp"
#include "host/Numbers.hpp"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>
#include <stdexcept>

namespace VT {

namespace {

constexpr OperatorSet logicalOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};
constexpr unsigned char leafPrecedence = 0;

/// Room that spares most prints the growth of their stacks.
constexpr std::size_t firstDepth = 16;

/// Nodes for which a fresh visitor makes room at once, if the table has as many: growing from nothing would cost more
/// than printing most expressions.
constexpr std::size_t firstNodes = 2048;

/// Where a sign in front of a literal binds like a prefix operator.
constexpr unsigned char signPrecedence = operatorInfo(SymbolicOp::UnaryMinus).precedence;

constexpr unsigned char fieldPrecedence = operatorInfo(SymbolicOp::MemberValue).precedence;

bool isLiteral(const StringifySymbolicExpr::Printed& printed) {
    return printed.op == SymbolicOp::IntValue || printed.op == SymbolicOp::DoubleValue;
}

[[noreturn]] void throwNoSuchExpression() {
    throw std::out_of_range("VT::SymbolicExprTable: no such expression");
}

} // namespace

StringifySymbolicExpr::StringifySymbolicExpr(const SymbolicExprTable& table, bool quillSyntax,
                                             bool spacedLogicalOperators,
                                             SymbolicExprPrinter::PredicateHandle predicate)
    : table_(table),
      predicate_(std::move(predicate)),
      plainNames_(predicate_.isPlain()),
      quillSyntax_(quillSyntax),
      spacedLogicalOperators_(spacedLogicalOperators) {
    stack_.reserve(firstDepth);
    frames_.reserve(firstDepth);
}

StringifySymbolicExpr::~StringifySymbolicExpr() = default;

/// Leaves the stack as deep as it was.
class StringifySymbolicExpr::StackDepth {
public:
    explicit StackDepth(std::vector<Printed>& stack) : stack_(stack), depth_(stack.size()) {}

    StackDepth(const StackDepth&) = delete;
    StackDepth& operator=(const StackDepth&) = delete;

    ~StackDepth() { stack_.resize(std::min(stack_.size(), depth_)); }

private:
    std::vector<Printed>& stack_;
    std::size_t depth_;
};

// Results.

const StringifySymbolicExpr::Printed& StringifySymbolicExpr::top() const {
    if (stack_.empty())
        throwNoSuchExpression();
    return stack_.back();
}

std::string StringifySymbolicExpr::get() const {
    return textOf(top());
}

namespace {

/// What is kept of a printed expression.
StringifySymbolicExpr::Printed unpacked(const auto& known) {
    return {static_cast<SymbolicOp>(known.opAndOne - 1), known.text, known.precedence, known.inCall};
}

} // namespace

/// Pushes an expression that was met before; whether it was.
bool StringifySymbolicExpr::pushKnown(SymbolicExprId id) {
    const Known* const met = known_.find(id);
    if (met == nullptr || met->opAndOne == 0)
        return false;
    push(unpacked(*met));
    return true;
}

StringifySymbolicExpr::Printed StringifySymbolicExpr::printed(SymbolicExprId id) {
    if (!plainNames_) {
        if (const std::uint64_t version = predicate_.version(); version != knownUnder_) {
            known_.clear(); // texts stay, for those who hold them
            knownUnder_ = version;
        }
    }
    return printedOnce(id);
}

/// The same while a walk may be under way.
StringifySymbolicExpr::Printed StringifySymbolicExpr::printedOnce(SymbolicExprId id) {
    if (const Known* const met = known_.find(id); met != nullptr && met->opAndOne != 0)
        return unpacked(*met);
    const StackDepth depth(stack_);
    if (texts_.size() == 0) {
        const std::size_t nodes = std::min<std::size_t>(id, firstNodes);
        texts_.reserve(nodes);
        known_.reserve(nodes);
    }
    [[maybe_unused]] const std::size_t before = stack_.size();
    walkUnknown(
        table_, id, frames_, [&](SymbolicExprId operand, const SymbolicExpr*) { return pushKnown(operand); },
        [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr*) {
            node.invoke(*this);
            const Printed& whole = stack_.back();
            known_.at(visited) = {whole.text, whole.inCall, static_cast<std::uint8_t>(static_cast<int>(whole.op) + 1),
                                  whole.precedence};
        },
        [](SymbolicExprId, const SymbolicExpr*) { throwNoSuchExpression(); });
    VTSYM_CHECK(frames_.empty() && stack_.size() == before + 1);
    return stack_.back();
}

std::string StringifySymbolicExpr::print(SymbolicExprId id) {
    return textOf(printed(id));
}

std::string StringifySymbolicExpr::print(const SymbolicExpr& node) {
    const StackDepth depth(stack_);
    const SymbolicExprId id = table_.lookup(&node);
    for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
        if (!table_.hasOperand(id, node.getInput(i)))
            throwNoSuchExpression();
        push(printed(node.getInput(i)));
    }
    node.invoke(*this);
    return get();
}

void StringifySymbolicExpr::forget() {
    known_.clear();
    texts_.clear();
    insideCalls_.clear();
    stack_.clear();
}

// The stack.

std::span<const StringifySymbolicExpr::Printed> StringifySymbolicExpr::operands(std::size_t count) const {
    if (stack_.size() < count)
        throwNoSuchExpression(); // a walker passes over an operand that the table does not have
    return std::span<const Printed>(stack_).last(count);
}

StringifySymbolicExpr::Printed StringifySymbolicExpr::insideCall(const Printed& printed) const {
    return printed.inCall == 0 ? printed : insideCalls_[printed.inCall - 1];
}

void StringifySymbolicExpr::setInsideCall(Printed& printed, const Printed& form) {
    insideCalls_.push_back(form);
    printed.inCall = static_cast<std::uint32_t>(insideCalls_.size());
}

/// Replaces the topmost operands by what `build` makes of them, and of their other forms where one of them has another.
template <class Build>
void StringifySymbolicExpr::replaceOperands(std::size_t count, Build build) {
    const std::span<const Printed> shown = operands(count);
    Printed whole = build(shown);
    if (std::ranges::any_of(shown, [](const Printed& operand) { return operand.inCall != 0; })) {
        boost::container::small_vector<Printed, 4> forms;
        for (const Printed& operand : shown)
            forms.push_back(insideCall(operand));
        setInsideCall(whole, build(std::span<const Printed>(forms.data(), forms.size())));
    }
    stack_.resize(stack_.size() - count);
    push(whole);
}

// Leaves.

Text StringifySymbolicExpr::integer(int value) {
    std::array<char, std::numeric_limits<int>::digits10 + 3> digits{};
    const char* const end = std::to_chars(digits.data(), digits.data() + digits.size(), value).ptr;
    return texts_.bytes({digits.data(), static_cast<std::size_t>(end - digits.data())});
}

void StringifySymbolicExpr::appendInteger(int value) {
    push({SymbolicOp::IntValue, integer(value), leafPrecedence});
}

void StringifySymbolicExpr::appendDouble(double value) {
    std::string text = vtsv_dtoa(value, true);
    const bool hasPoint = text.find('.') != std::string::npos;
    const bool needsPoint = quillSyntax_ ? text == "-0" : std::isfinite(value) && !hasPoint;
    if (needsPoint)
        text.insert(std::min(text.find('e'), text.size()), ".0");
    push(SymbolicOp::DoubleValue, text, leafPrecedence);
}

// Operators.

/// Whether a literal needs parentheses: what follows it binds tighter than its sign, or is a field or an argument list,
/// which a number cannot have.
bool StringifySymbolicExpr::needsParentheses(const Printed& operand, unsigned char precedence) const {
    if (!isLiteral(operand) || precedence >= signPrecedence)
        return false;
    const bool isWord = texts_.beginsWith(operand.text, 'I') || texts_.beginsWith(operand.text, 'N'); // Inf, NaN
    return texts_.beginsWith(operand.text, '-') || (precedence <= fieldPrecedence && !isWord);
}

StringifySymbolicExpr::Delimiters
StringifySymbolicExpr::isDelimitWithSpacesAndWrapParenthesis(const SymbolicOp& op, unsigned char precedence,
                                                             OpAssociativity assoc, const Printed& lhs,
                                                             const Printed& rhs) const {
    return {
        .wrapRight = rhs.precedence > precedence || (rhs.precedence == precedence && assoc == OpAssociativity::Left),
        .wrapLeft = lhs.precedence > precedence || (lhs.precedence == precedence && assoc == OpAssociativity::Right),
        .spaced = spacedLogicalOperators_ && logicalOps.contains(op)};
}

StringifySymbolicExpr::Printed StringifySymbolicExpr::createBinaryExpr(const SymbolicOp& op, const char* spelling,
                                                                       unsigned char precedence, OpAssociativity assoc,
                                                                       const Printed& lhs, const Printed& rhs) {
    const Delimiters delimiters = isDelimitWithSpacesAndWrapParenthesis(op, precedence, assoc, lhs, rhs);
    const std::string_view bare = spelling;
    // Two signs would join.
    const bool signAfterSign = !delimiters.spaced && bare.ends_with('-') && texts_.beginsWith(rhs.text, '-');
    const Text left = delimiters.wrapLeft || needsParentheses(lhs, precedence) ? wrapped(lhs.text) : lhs.text;
    const Text right = delimiters.wrapRight || signAfterSign ? wrapped(rhs.text) : rhs.text;
    if (!delimiters.spaced)
        return {op, texts_.infix(left, bare, right), precedence};
    boost::container::small_vector<char, 8> spaced{' '};
    spaced.insert(spaced.end(), bare.begin(), bare.end());
    spaced.push_back(' ');
    return {op, texts_.infix(left, {spaced.data(), spaced.size()}, right), precedence};
}

void StringifySymbolicExpr::appendBinary(const SymbolicOp& op, const char* spelling, unsigned char precedence,
                                         OpAssociativity assoc) {
    const std::span<const Printed> shown = operands(2);
    Printed whole = createBinaryExpr(op, spelling, precedence, assoc, shown[0], shown[1]);
    if (quillSyntax_) {
        const bool isCall = quillCallOps.contains(op);
        if (isCall || shown[0].inCall != 0 || shown[1].inCall != 0) {
            const std::array<Printed, 2> forms{insideCall(shown[0]), insideCall(shown[1])};
            setInsideCall(whole, isCall ? quillCall(op, forms)
                                        : createBinaryExpr(op, spelling, precedence, assoc, forms[0], forms[1]));
        }
    }
    stack_.pop_back();
    stack_.back() = whole;
}

StringifySymbolicExpr::Printed StringifySymbolicExpr::unary(SymbolicOp op, std::string_view spelling,
                                                            unsigned char precedence, bool prefix,
                                                            const Printed& operand) {
    const bool sign = prefix ? spelling.ends_with('-') && texts_.beginsWith(operand.text, '-')
                             : needsParentheses(operand, precedence);
    const bool minusZero = op == SymbolicOp::UnaryMinus && operand.op == SymbolicOp::IntValue &&
                           texts_.length(operand.text) == 1 && texts_.beginsWith(operand.text, '0');
    if (minusZero)
        return operand;
    const bool wrap = operand.precedence >= precedence || sign;
    if (!prefix)
        return {op, texts_.enclose(wrap ? "(" : "", operand.text, wrap ? std::string(")").append(spelling) : spelling),
                precedence};
    return {op, texts_.enclose(wrap ? std::string(spelling).append("(") : spelling, operand.text, wrap ? ")" : ""),
            precedence};
}

void StringifySymbolicExpr::appendUnary(const SymbolicOp& op, const char* spelling, unsigned char precedence,
                                        OpAssociativity, bool prefix) {
    replaceOperands(
        1, [&](std::span<const Printed> operand) { return unary(op, spelling, precedence, prefix, operand[0]); });
}

// Lists and calls.

Text StringifySymbolicExpr::list(std::span<const Printed> parts, std::string_view open, std::string_view separator,
                                 std::string_view close) {
    if (parts.size() == 1)
        return texts_.enclose(open, parts.front().text, close);
    boost::container::small_vector<Text, 8> texts;
    texts.reserve(parts.size());
    for (const Printed& part : parts)
        texts.push_back(part.text);
    return texts_.join(open, {texts.data(), texts.size()}, separator, close);
}

void StringifySymbolicExpr::appendArraySelection(const SymbolicExpr& node, const char* open, const char* close,
                                                 const char* separator) {
    replaceOperands(node.getNumInputs(), [&](std::span<const Printed> inputs) {
        return Printed{node.op(), list(inputs, open, separator, close), leafPrecedence};
    });
}

void StringifySymbolicExpr::appendCellArray(const SymbolicExpr& node) {
    appendArraySelection(node, "{", "}", ";");
}

StringifySymbolicExpr::Printed StringifySymbolicExpr::call(SymbolicOp op, const Printed& callee,
                                                           std::span<const Printed> arguments) {
    const Text name = callee.precedence > leafPrecedence || needsParentheses(callee, leafPrecedence)
                          ? wrapped(callee.text)
                          : callee.text;
    if (arguments.empty())
        return {op, texts_.enclose("", name, "()"), leafPrecedence};
    const std::array<Text, 2> parts{name, list(arguments, "", ",", "")};
    return {op, texts_.join("", parts, "(", ")"), leafPrecedence};
}

void StringifySymbolicExpr::appendFcnCall(const SymbolicExpr& node) {
    replaceOperands(node.getNumInputs(), [&](std::span<const Printed> inputs) {
        if (inputs.empty())
            return Printed{node.op(), texts_.bytes("()"), leafPrecedence};
        return call(node.op(), inputs.front(), inputs.subspan(1));
    });
}

// C operators in Quill.

StringifySymbolicExpr::Printed StringifySymbolicExpr::quillCall(SymbolicOp op, std::span<const Printed> arguments) {
    boost::container::small_vector<Printed, 2> kept(arguments.begin(), arguments.end());
    visit(quillCallName(op));
    const Printed name = stack_.back();
    stack_.pop_back();
    return call(kept.size() == 1 ? SymbolicOp::FcnCall1U : SymbolicOp::FcnCall2U, name, {kept.data(), kept.size()});
}

/// Prints the second argument of the call that stands for a shift.
StringifySymbolicExpr::Printed StringifySymbolicExpr::shiftAmount(const SymbolicExpr& shift, const Printed& amount) {
    const ShiftAmount converted = quillShiftAmount(table_, shift.op(), shift.getInput(1));
    constexpr const OperatorInfo& minus = operatorInfo(SymbolicOp::UnaryMinus);
    switch (converted.form) {
    case ShiftAmount::Form::Literal:
        return {SymbolicOp::IntValue, integer(converted.literal), leafPrecedence};
    case ShiftAmount::Form::Negated:
        return unary(minus.op, minus.quill, minus.precedence, true, amount);
    case ShiftAmount::Form::Expression:
        break;
    }
    return converted.expression == shift.getInput(1) ? amount : insideCall(printedOnce(converted.expression));
}

void StringifySymbolicExpr::PrintQExprFromCExpr(const SymbolicExpr& node) {
    const std::span<const Printed> shown = operands(node.getNumInputs());
    boost::container::small_vector<Printed, 2> arguments;
    for (const Printed& operand : shown)
        arguments.push_back(insideCall(operand));
    if (node.op() == SymbolicOp::ShiftLeft || node.op() == SymbolicOp::ShiftRight)
        arguments[1] = shiftAmount(node, arguments[1]);
    stack_.resize(stack_.size() - arguments.size());
    push(quillCall(node.op(), {arguments.data(), arguments.size()}));
}

// Visits.

/// Prints a node by its row in the operator table.
template <SymbolicOp Op, class Node>
void StringifySymbolicExpr::append(const Node& node) {
    static constexpr const OperatorInfo& row = operatorInfo(Op);
    [[maybe_unused]] const char* const spelling = quillSyntax_ ? row.quill.data() : row.c.data();
    if constexpr (Op == SymbolicOp::String) {
        if (plainNames_)
            push(Op, node.getName(), row.precedence);
        else
            push(Op, identifier(node), row.precedence);
    } else if constexpr (Op == SymbolicOp::IntValue) {
        appendInteger(node.getValue());
    } else if constexpr (Op == SymbolicOp::DoubleValue) {
        appendDouble(node.getValue());
    } else if constexpr (row.form == OperatorForm::Infix || row.form == OperatorForm::Prefix ||
                         row.form == OperatorForm::Postfix) {
        if (quillSyntax_ && row.quill.empty())
            PrintQExprFromCExpr(node);
        else if constexpr (row.form == OperatorForm::Infix)
            appendBinary(Op, spelling, row.precedence, row.associativity);
        else
            appendUnary(Op, spelling, row.precedence, row.associativity, row.form == OperatorForm::Prefix);
    } else if constexpr (row.form == OperatorForm::Field) {
        push(SymbolicOp::String, node.getMemberName(), leafPrecedence);
        appendBinary(Op, spelling, row.precedence, row.associativity);
    } else if constexpr (row.form == OperatorForm::Range || row.form == OperatorForm::Function) {
        replaceOperands(node.getNumInputs(), [&](std::span<const Printed> inputs) {
            return Printed{Op, list(inputs, "", row.form == OperatorForm::Range ? spelling : " ", ""), row.precedence};
        });
    } else if constexpr (row.form == OperatorForm::Brackets) {
        appendArraySelection(node, "[", "]", ",");
    } else if constexpr (row.form == OperatorForm::Row) {
        appendArraySelection(node, "", "", ",");
    } else if constexpr (row.form == OperatorForm::Rows) {
        appendArraySelection(node, "[", "]", ";");
    } else if constexpr (row.form == OperatorForm::Cell) {
        appendCellArray(node);
    } else {
        static_assert(row.form == OperatorForm::Call);
        appendFcnCall(node);
    }
}

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void StringifySymbolicExpr::visit(const Class& node) {                                                             \
        append<SymbolicOp::Name>(node);                                                                                \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

} // namespace VT
