// Writes the texts of plain expressions in one pass.
//
// Method: down the left operands of infix operators, with an opening parenthesis where precedence asks for one, and up
// again, each time with the operator and down its right operand.  An explicit stack holds the operators that are open.
// A right operand after a minus is looked at for a minus of its own, which is a walk down its left operands; no
// occurrence of a node lies on two such walks.
// Cost: linear in the text; nothing is kept from text to text but the room of the buffers.
// Relies on: the keys of the table, which hold operators and operands without a look at the nodes; the operator table
// for spellings and precedences; StringifySymbolicExpr for all that is given up.
#include "base/print/DirectText.hpp"

#include <array>
#include <charconv>
#include <cstring>
#include <limits>

namespace VT {

/// How an operator is written.
struct DirectText::Style {
    enum class Kind : std::uint8_t { Other, Name, Integer, Infix, Prefix, Call, Member };

    Kind kind = Kind::Other;
    std::uint8_t precedence = 0;
    std::uint8_t size = 0; ///< of the spelling
    std::array<char, 5> spelling{};

    [[nodiscard]] std::string_view text() const { return {spelling.data(), size}; }

    [[nodiscard]] bool isMinus() const { return size == 1 && spelling[0] == '-'; }
};

namespace {

constexpr unsigned prefixPrecedence = operatorInfo(SymbolicOp::UnaryMinus).precedence;
constexpr OperatorSet spacedOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};

} // namespace

const DirectText::Style* DirectText::stylesOf(bool quill, bool spaced) {
    using Styles = std::array<Style, static_cast<std::size_t>(operatorCount)>;
    static constexpr auto make = [](bool inQuill, bool withBlanks) {
        Styles all{};
        for (const OperatorInfo& row : operatorTable()) {
            Style& style = all[static_cast<std::size_t>(row.op)];
            style.precedence = row.precedence;
            const std::string_view spelling = inQuill ? row.quill : row.c;
            const bool isSpaced = withBlanks && spacedOps.contains(row.op);
            if (isSpaced)
                style.spelling[style.size++] = ' ';
            for (const char c : spelling)
                style.spelling[style.size++] = c;
            if (isSpaced)
                style.spelling[style.size++] = ' ';
            // An operator as strong as a sign asks more of literals beside it.
            const bool isWeak = row.precedence > prefixPrecedence && row.associativity == OpAssociativity::Left;
            if (row.op == SymbolicOp::String)
                style.kind = Style::Kind::Name;
            else if (row.op == SymbolicOp::IntValue)
                style.kind = Style::Kind::Integer;
            else if (row.op == SymbolicOp::MemberValue)
                style.kind = Style::Kind::Member;
            else if (row.form == OperatorForm::Call)
                style.kind = Style::Kind::Call;
            else if (row.form == OperatorForm::Infix && isWeak && !spelling.empty())
                style.kind = Style::Kind::Infix;
            else if (row.form == OperatorForm::Prefix && row.precedence == prefixPrecedence && !spelling.empty())
                style.kind = Style::Kind::Prefix;
        }
        return all;
    };
    static constexpr std::array<Styles, 4> styles{make(false, false), make(false, true), make(true, false),
                                                  make(true, true)};
    return styles[(quill ? 2U : 0U) + (spaced ? 1U : 0U)].data();
}

DirectText::DirectText(const SymbolicExprTable& table, bool quillSyntax, bool spacedLogicalOperators)
    : table_(table),
      styles_(stylesOf(quillSyntax, spacedLogicalOperators)) {}

/// How a node is written.  Operators whose operands the key does not hold are left to another printer.
const DirectText::Style& DirectText::styleAt(SymbolicExprId id) const {
    static constexpr Style other{};
    const std::uint64_t key = table_.keyAt(id);
    if (NodeKeys::isExact(key))
        return styles_[static_cast<std::size_t>(NodeKeys::opOf(key))];
    if (NodeKeys::isName(key))
        return styles_[static_cast<std::size_t>(SymbolicOp::String)];
    const auto op = static_cast<std::size_t>(table_.SymbolicExprTable::get(id)->op()); // None is beyond the table
    if (op >= static_cast<std::size_t>(operatorCount))
        return other;
    const Style& style = styles_[op];
    return style.kind == Style::Kind::Call || style.kind == Style::Kind::Member ? style : other;
}

/// The operand of an operator; the invalid identifier where it is missing.
SymbolicExprId DirectText::operandOf(SymbolicExprId id, std::size_t index) const {
    const std::uint64_t key = table_.keyAt(id);
    SymbolicExprId operand = invalidId;
    if (NodeKeys::isExact(key)) {
        operand = index == 0 ? NodeKeys::leftOf(key) : NodeKeys::rightOf(key);
    } else {
        const SymbolicExpr& node = *table_.SymbolicExprTable::get(id);
        operand = index < node.getNumInputs() ? node.getInput(index) : invalidId;
    }
    return operand < id ? operand : invalidId;
}

const std::string& DirectText::nameAt(SymbolicExprId id) const {
    return static_cast<const SymbolicString*>(table_.SymbolicExprTable::get(id))->getName();
}

std::optional<std::string> DirectText::print(SymbolicExprId id, std::size_t most) {
    bytes_.truncate(0);
    open_.truncate(0);
    if (!table_.has(id) || !enter(id, &styleAt(id)))
        return std::nullopt;
    while (open_.size() > 0)
        if (bytes_.size() > most || !advance())
            return std::nullopt;
    if (bytes_.size() > most)
        return std::nullopt;
    return bytes_.size() == 0 ? std::string() : std::string(&bytes_[0], bytes_.size());
}

/// Writes a node down to its first leaf and opens the operators on the way; false where another printer is needed.
bool DirectText::enter(SymbolicExprId id, const Style* style) {
    while (true) {
        switch (style->kind) {
        case Style::Kind::Name:
            put(nameAt(id));
            return true;
        case Style::Kind::Integer:
            putInteger(NodeKeys::integerOf(table_.keyAt(id)));
            return true;
        case Style::Kind::Call:
            return enterCall(id, style);
        case Style::Kind::Infix:
        case Style::Kind::Prefix:
        case Style::Kind::Member:
            break;
        case Style::Kind::Other:
            return false;
        }
        const SymbolicExprId first = operandOf(id, 0);
        if (first == invalidId)
            return false;
        const Style* const inner = &styleAt(first);
        bool wrapped = inner->precedence > style->precedence;
        if (style->kind == Style::Kind::Member && inner->kind != Style::Kind::Name &&
            inner->kind != Style::Kind::Member)
            return false;
        if (style->kind == Style::Kind::Prefix) {
            if (style->isMinus() && inner->kind == Style::Kind::Integer &&
                NodeKeys::integerOf(table_.keyAt(first)) == 0)
                return false; // a minus that is not written
            wrapped = inner->precedence >= style->precedence || (style->isMinus() && beginsWithMinus(first));
            put(style->text());
        }
        if (wrapped)
            put('(');
        open_.push_back({id, style, 1, style->kind == Style::Kind::Infix ? 2U : 1U, wrapped});
        id = first;
        style = inner;
    }
}

/// Writes the name of a function and opens its call.
bool DirectText::enterCall(SymbolicExprId id, const Style* style) {
    const SymbolicExprId name = operandOf(id, 0);
    if (name == invalidId || !NodeKeys::isName(table_.keyAt(name)))
        return false;
    put(nameAt(name));
    put('(');
    const std::size_t operands = table_.SymbolicExprTable::get(id)->getNumInputs();
    if (operands > std::numeric_limits<std::uint32_t>::max())
        return false;
    open_.push_back({id, style, 1, static_cast<std::uint32_t>(operands), false});
    return true;
}

/// Goes on with the operator that was opened last, one of whose operands is written.
bool DirectText::advance() {
    Open& open = open_[open_.size() - 1];
    const Style& style = *open.style;
    if (open.wrapped) {
        put(')');
        open.wrapped = false;
    }
    const bool isCall = style.kind == Style::Kind::Call;
    if (style.kind == Style::Kind::Member) {
        put('.');
        put(static_cast<const SymbolicMemberValue*>(table_.SymbolicExprTable::get(open.id))->getMemberName());
    }
    if (open.next == open.count) {
        if (isCall)
            put(')');
        open_.pop_back();
        return true;
    }
    const SymbolicExprId next = operandOf(open.id, open.next);
    if (next == invalidId)
        return false;
    const Style* const inner = &styleAt(next);
    if (isCall) {
        if (open.next > 1)
            put(',');
    } else {
        put(style.text());
        open.wrapped = inner->precedence >= style.precedence || (style.isMinus() && beginsWithMinus(next));
        if (open.wrapped)
            put('(');
    }
    ++open.next;
    return enter(next, inner);
}

/// Whether the text of a node begins with a minus.  Nodes for which enter() gives up do not count.
bool DirectText::beginsWithMinus(SymbolicExprId id) const {
    while (true) {
        const Style& style = styleAt(id);
        switch (style.kind) {
        case Style::Kind::Name:
            return nameAt(id).starts_with('-');
        case Style::Kind::Integer:
            return NodeKeys::integerOf(table_.keyAt(id)) < 0;
        case Style::Kind::Prefix:
            return style.isMinus();
        case Style::Kind::Infix:
        case Style::Kind::Member:
        case Style::Kind::Call:
            break;
        case Style::Kind::Other:
            return false;
        }
        const SymbolicExprId first = operandOf(id, 0);
        if (first == invalidId || styleAt(first).precedence > style.precedence)
            return false; // a parenthesis
        id = first;
    }
}

void DirectText::putInteger(int value) {
    constexpr std::size_t most = std::numeric_limits<int>::digits10 + 2;
    char* const digits = bytes_.extend(most);
    const char* const end = std::to_chars(digits, digits + most, value).ptr;
    bytes_.truncate(bytes_.size() - most + static_cast<std::size_t>(end - digits));
}

void DirectText::put(std::string_view text) {
    if (!text.empty())
        std::memcpy(bytes_.extend(text.size()), text.data(), text.size());
}

} // namespace VT
