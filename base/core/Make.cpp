// Makes nodes of operators that are known at run time only.
//
// Method: for each number of operands, an array of constructors by operator code, filled at compile time from
// operators.def.  A class of another shape has no entry, which yields the invalid identifier.
// Cost: one indirect call more than the constructor itself.
#include "base/core/Make.hpp"

#include "base/core/Nodes.hpp"

#include <array>
#include <type_traits>
#include <utility>

namespace VT {

namespace {

template <class... Parts>
using Maker = SymbolicExprId (*)(SymbolicExprTable&, Parts...);

template <class Node, class... Parts>
SymbolicExprId make(SymbolicExprTable& table, Parts... parts) {
    return Node(table, std::move(parts)...).getId(table);
}

/// The constructors of the classes with a shape, by operator; nullptr for the others.
template <class Shape, class... Parts>
constexpr auto makersOf() {
    std::array<Maker<Parts...>, static_cast<std::size_t>(operatorCount)> makers{};
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    if constexpr (std::is_base_of_v<Shape, Class> && SymbolicOp::Name != SymbolicOp::MemberValue)                      \
        makers[Code] = make<Class, Parts...>;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
    return makers;
}

template <class Shape, class... Parts>
SymbolicExprId makeIfShaped(SymbolicExprTable& table, SymbolicOp op, Parts... parts) {
    static constexpr auto makers = makersOf<Shape, Parts...>();
    const auto at = static_cast<std::size_t>(op); // None is beyond the table
    return at < makers.size() && makers[at] != nullptr ? makers[at](table, std::move(parts)...) : invalidId;
}

} // namespace

SymbolicExprId makeUnary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId operand) {
    return makeIfShaped<SymbolicUnaryExpr>(table, op, operand);
}

SymbolicExprId makeBinary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId left, SymbolicExprId right) {
    return makeIfShaped<SymbolicBinaryExpr>(table, op, left, right);
}

SymbolicExprId makeTernary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId first, SymbolicExprId second,
                           SymbolicExprId third) {
    return makeIfShaped<SymbolicTernaryExpr>(table, op, first, second, third);
}

SymbolicExprId makeChain(SymbolicExprTable& table, SymbolicOp op, std::span<const SymbolicExprId> operands) {
    if (operands.empty())
        return invalidId;
    SymbolicExprId chain = operands.front();
    for (const SymbolicExprId next : operands.subspan(1))
        chain = makeBinary(table, op, chain, next);
    return chain;
}

SymbolicExprId makeMulti(SymbolicExprTable& table, SymbolicOp op, std::vector<SymbolicExprId> operands) {
    return makeIfShaped<SymbolicMultiExpr>(table, op, std::move(operands));
}

} // namespace VT
