#include "benchmarks/FloorText.hpp"

#include "base/core/Operators.hpp"
#include "benchmarks/FloorConditionReader.hpp"

#include <bit>
#include <charconv>

namespace VT::Benchmarks {

namespace {

/// Records by their numbers.
class RecordBuilder {
public:
    using Node = std::uint64_t;
    static constexpr Node none = ~Node{0};

    explicit RecordBuilder(RecordTable& table) : table_(table) {}

    static constexpr bool cOperators() { return true; }

    static constexpr bool keywords() { return false; }

    Node intern(SymbolicOp op, Node left, Node right) { return table_.intern(op, left, right); }

    Node name(std::string_view text) { return table_.name(text); }

    Node integer(int value) {
        return intern(SymbolicOp::IntValue, static_cast<std::uint64_t>(static_cast<std::int64_t>(value)), none);
    }

    Node real(double value) { return intern(SymbolicOp::DoubleValue, std::bit_cast<std::uint64_t>(value), none); }

private:
    RecordTable& table_;
};

constexpr std::uint64_t none = RecordBuilder::none;

template <class Number>
void appendNumber(Number value, std::string& text) {
    char digits[32];
    text.append(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

} // namespace

std::optional<std::uint32_t> readRecords(RecordTable& table, std::string_view text) {
    RecordBuilder builder(table);
    const std::uint64_t id = ConditionReader(builder, text).run();
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
