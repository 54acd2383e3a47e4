// The operator table as values: what a node kind is called, how it is written and what the rules know of it.
#pragma once

#include <array>
#include <bit>
#include <cstdint>
#include <initializer_list>
#include <string_view>

namespace VT {

/// Operator code of a node class: dense from 0, part of every hash.
enum class SymbolicOp : int {
    None = -1, ///< no operator; never the code of a node
#define VTSYM_OPERATOR(Code, Name, ...) Name = Code,
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
};

/// How a node kind is written.
enum class OperatorForm : std::uint8_t {
    Leaf,     ///< its own text
    Infix,    ///< a op b
    Prefix,   ///< op a
    Postfix,  ///< a op
    Field,    ///< a.name
    Range,    ///< a:b and a:s:b, operands never wrapped
    Brackets, ///< [a,b]
    Row,      ///< a,b
    Rows,     ///< [row;row]
    Cell,     ///< {a;b}
    Call,     ///< name(a,b)
    Function, ///< parameters body
};

enum class OpAssociativity : std::uint8_t { Left, Right };

/// One row of the operator table.
struct OperatorInfo {
    SymbolicOp op;
    std::string_view name;      ///< enumerator
    std::string_view className; ///< node class
    std::string_view shape;     ///< payload and operands
    std::string_view quill;     ///< spelling in Quill; empty where Quill has no such operator
    std::string_view c;         ///< spelling in C; empty where C has no such operator
    std::string_view quillCall; ///< the Quill function that stands for the C operator; empty for none
    std::uint8_t precedence;    ///< a smaller number binds tighter
    OpAssociativity associativity;
    OperatorForm form;
    SymbolicOp negated;  ///< comparison that holds exactly where this one does not, or None
    SymbolicOp mirrored; ///< comparison that holds for swapped operands, or None
    int onEqual;         ///< value of a comparison of equal operands (0 or 1), -1 for other operators
    bool boolean;        ///< every value of the node is a truth value
    std::string_view meaning;
};

namespace detail {
inline constexpr auto operatorRows = std::to_array<OperatorInfo>({
#define VTSYM_OPERATOR(Code, Name, Class, Shape, Quill, C, QuillCall, Prec, Assoc, Form, Negated, Mirrored, OnEqual,   \
                       Boolean, Meaning)                                                                               \
    {SymbolicOp::Name,                                                                                                 \
     #Name,                                                                                                            \
     #Class,                                                                                                           \
     #Shape,                                                                                                           \
     Quill,                                                                                                            \
     C,                                                                                                                \
     QuillCall,                                                                                                        \
     Prec,                                                                                                             \
     OpAssociativity::Assoc,                                                                                           \
     OperatorForm::Form,                                                                                               \
     SymbolicOp::Negated,                                                                                              \
     SymbolicOp::Mirrored,                                                                                             \
     OnEqual,                                                                                                          \
     (Boolean) != 0,                                                                                                   \
     Meaning},
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
});

constexpr bool codesAreDense() {
    for (std::size_t i = 0; i < operatorRows.size(); ++i)
        if (static_cast<std::size_t>(operatorRows[i].op) != i)
            return false;
    return true;
}

static_assert(codesAreDense(), "operator codes are dense and in the order of the table");
} // namespace detail

inline constexpr int operatorCount = static_cast<int>(detail::operatorRows.size());

/// All rows in the order of their codes.
constexpr const auto& operatorTable() {
    return detail::operatorRows;
}

/// The row of an operator.  `op` is the code of a node, never None.
constexpr const OperatorInfo& operatorInfo(SymbolicOp op) {
    return detail::operatorRows[static_cast<std::size_t>(op)];
}

/// A set of operators as a bit mask.
class OperatorSet {
public:
    constexpr OperatorSet() = default;

    constexpr OperatorSet(std::initializer_list<SymbolicOp> ops) {
        for (const SymbolicOp op : ops)
            add(op);
    }

    constexpr void add(SymbolicOp op) { bits_ |= bit(op); }

    [[nodiscard]] constexpr bool contains(SymbolicOp op) const { return (bits_ & bit(op)) != 0; }

    [[nodiscard]] constexpr int size() const { return std::popcount(bits_); }

    /// The operators of either set.
    friend constexpr OperatorSet operator|(OperatorSet a, OperatorSet b) {
        a.bits_ |= b.bits_;
        return a;
    }

    /// The operators of both sets.
    friend constexpr OperatorSet operator&(OperatorSet a, OperatorSet b) {
        a.bits_ &= b.bits_;
        return a;
    }

    constexpr bool operator==(const OperatorSet&) const = default;

    /// The operators whose row satisfies a condition.
    template <class Condition>
    static constexpr OperatorSet where(Condition condition) {
        OperatorSet set;
        for (const OperatorInfo& row : operatorTable())
            if (condition(row))
                set.add(row.op);
        return set;
    }

private:
    static_assert(operatorCount <= 64, "one bit per operator");

    static constexpr std::uint64_t bit(SymbolicOp op) { return std::uint64_t{1} << static_cast<unsigned>(op); }

    std::uint64_t bits_ = 0;
};

/// The comparisons == ~= < <= > >=.
inline constexpr OperatorSet comparisonOps = OperatorSet::where([](const OperatorInfo& r) { return r.onEqual >= 0; });
/// The operators written between their two operands.
inline constexpr OperatorSet infixOps =
    OperatorSet::where([](const OperatorInfo& r) { return r.form == OperatorForm::Infix; });
/// The operators that are written as a symbol before, between or after their operands.
inline constexpr OperatorSet symbolOps = OperatorSet::where([](const OperatorInfo& r) {
    return r.form == OperatorForm::Infix || r.form == OperatorForm::Prefix || r.form == OperatorForm::Postfix;
});
/// Kinds whose every value is a truth value.
inline constexpr OperatorSet booleanOps = OperatorSet::where([](const OperatorInfo& r) { return r.boolean; });
/// The four call classes.
inline constexpr OperatorSet callOps =
    OperatorSet::where([](const OperatorInfo& r) { return r.form == OperatorForm::Call; });
/// The three dimension lists.
inline constexpr OperatorSet dimensionOps =
    OperatorSet::where([](const OperatorInfo& r) { return r.form == OperatorForm::Brackets; });

} // namespace VT
