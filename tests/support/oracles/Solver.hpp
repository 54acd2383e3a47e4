// An independent solver as oracle: conditions over unbounded integers decided by Z3.
#pragma once

#include "base/VTSymbolicExpr.hpp"
#include "base/integer/RationalForm.hpp"

#include <array>
#include <cstdlib>
#include <limits>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include <z3.h>

namespace VT::Testing {

/// One context for many questions; a condition is translated once.  Understood are + - * by a literal, quotients,
/// remainders and shifts by a literal as in C, masks, and real literals; other arithmetic is an unknown for each node.
/// Bits are taken of values that fit 32 bits: assignments with others do not count.
class Solver {
public:
    explicit Solver(const SymbolicExprTable& table) : table_(table) {
        Z3_config config = Z3_mk_config();
        context_ = Z3_mk_context(config);
        Z3_del_config(config);
        integers_ = Z3_mk_int_sort(context_);
        solver_ = Z3_mk_simple_solver(context_);
        Z3_solver_inc_ref(context_, solver_);
    }

    Solver(const Solver&) = delete;
    Solver& operator=(const Solver&) = delete;

    ~Solver() {
        Z3_solver_dec_ref(context_, solver_);
        Z3_del_context(context_);
    }

    /// The condition in the solver's terms; valid as long as the solver.
    Z3_ast truth(SymbolicExprId id) {
        translate(id);
        return asTruth(id);
    }

    Z3_ast negated(Z3_ast truth) { return Z3_mk_not(context_, truth); }

    /// Whether both can hold together.  As elsewhere a "yes" comes with an assignment, which the solver makes on demand
    /// only, so that asking for it is part of the question.
    bool canHold(Z3_ast a, Z3_ast b) {
        const std::optional<bool> answer = tryHold(a, b);
        if (!answer)
            throw std::logic_error("the solver does not know");
        return *answer;
    }

    /// The same; nothing where the solver gives up.
    std::optional<bool> tryHold(Z3_ast a, Z3_ast b) {
        Z3_solver_push(context_, solver_);
        Z3_solver_assert(context_, solver_, a);
        Z3_solver_assert(context_, solver_, b);
        const Z3_lbool answer = Z3_solver_check(context_, solver_);
        if (answer == Z3_L_TRUE) {
            const Z3_model model = Z3_solver_get_model(context_, solver_);
            Z3_model_inc_ref(context_, model);
            Z3_model_dec_ref(context_, model);
        }
        Z3_solver_pop(context_, solver_, 1);
        return answer == Z3_L_UNDEF ? std::nullopt : std::optional(answer == Z3_L_TRUE);
    }

    /// Bounds the work of a question from now on, in the solver's own unit.
    void limit(unsigned resources) {
        Z3_params parameters = Z3_mk_params(context_);
        Z3_params_inc_ref(context_, parameters);
        Z3_params_set_uint(context_, parameters, Z3_mk_string_symbol(context_, "rlimit"), resources);
        // The one whose work that bounds.
        Z3_params_set_uint(context_, parameters, Z3_mk_string_symbol(context_, "arith.solver"), 2);
        Z3_solver_set_params(context_, solver_, parameters);
        Z3_params_dec_ref(context_, parameters);
    }

    /// Begins with other conditions.
    void forget() { done_.clear(); }

private:
    Z3_ast integer(std::int64_t value) { return Z3_mk_int64(context_, value, integers_); }

    Z3_ast unknown(const std::string& name) {
        return Z3_mk_const(context_, Z3_mk_string_symbol(context_, name.c_str()), integers_);
    }

    Z3_ast asTruth(SymbolicExprId id) {
        const Z3_ast ast = done_.at(id);
        return isTruth(id) ? ast : Z3_mk_not(context_, Z3_mk_eq(context_, ast, integer(0)));
    }

    Z3_ast asNumber(SymbolicExprId id) {
        return isTruth(id) ? Z3_mk_ite(context_, done_.at(id), integer(1), integer(0)) : done_.at(id);
    }

    [[nodiscard]] bool isTruth(SymbolicExprId id) const { return booleanOps.contains(table_.get(id)->op()); }

    void translate(SymbolicExprId root) {
        std::vector<SymbolicExprId> pending{root};
        while (!pending.empty()) {
            const SymbolicExprId id = pending.back();
            const std::size_t before = pending.size();
            const SymbolicExpr& node = *table_.get(id);
            if (!done_.contains(id) && !callOps.contains(node.op()))
                for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                    if (!done_.contains(node.getInput(i)))
                        pending.push_back(node.getInput(i));
            if (pending.size() != before)
                continue;
            pending.pop_back();
            if (!done_.contains(id))
                done_[id] = build(id, node);
        }
    }

    bool isReal(Z3_ast ast) { return Z3_get_sort_kind(context_, Z3_get_sort(context_, ast)) == Z3_REAL_SORT; }

    /// Two numbers as the solver compares and adds them: both real where one is.
    std::array<Z3_ast, 2> alike(Z3_ast a, Z3_ast b) {
        if (isReal(a) != isReal(b))
            (isReal(a) ? b : a) = Z3_mk_int2real(context_, isReal(a) ? b : a);
        return {a, b};
    }

    Z3_ast power(std::int64_t exponent) {
        const std::string text = BigInteger(BigInteger(1) << static_cast<unsigned>(exponent)).str();
        return Z3_mk_numeral(context_, text.c_str(), integers_);
    }

    Z3_ast times(Z3_ast a, Z3_ast b) {
        const Z3_ast both[] = {a, b};
        return Z3_mk_mul(context_, 2, both);
    }

    Z3_ast minus(Z3_ast a, Z3_ast b) {
        const Z3_ast both[] = {a, b};
        return Z3_mk_sub(context_, 2, both);
    }

    /// Z3 leaves a remainder that is never negative, C one with the sign of the dividend.
    Z3_ast quotient(Z3_ast a, std::int64_t divisor) {
        const Z3_ast by = integer(std::abs(divisor));
        const Z3_ast whole = Z3_mk_ite(context_, Z3_mk_ge(context_, a, integer(0)), Z3_mk_div(context_, a, by),
                                       negative(Z3_mk_div(context_, negative(a), by)));
        return divisor < 0 ? negative(whole) : whole;
    }

    Z3_ast negative(Z3_ast a) { return Z3_mk_unary_minus(context_, a); }

    /// The ones of a mask, bit by bit.
    Z3_ast masked(Z3_ast a, std::int32_t mask) {
        if (mask < 0)
            return minus(a, masked(a, ~mask));
        std::vector<Z3_ast> bits{integer(0)};
        for (int i = 0; i < 31; ++i)
            if ((mask >> i & 1) != 0)
                bits.push_back(times(power(i), Z3_mk_mod(context_, Z3_mk_div(context_, a, power(i)), integer(2))));
        return Z3_mk_add(context_, static_cast<unsigned>(bits.size()), bits.data());
    }

    /// Arithmetic with a literal on the right, or nullptr.
    Z3_ast byLiteral(SymbolicOp op, Z3_ast a, std::int32_t literal) {
        using Op = SymbolicOp;
        switch (op) {
        case Op::Divide:
            return quotient(a, literal);
        case Op::Modulo:
            return minus(a, times(quotient(a, literal), integer(literal)));
        case Op::ShiftLeft:
            return times(a, power(literal));
        default:
            break;
        }
        const auto ofMask = [&](int factor) { // a + literal - factor * (a & literal)
            const Z3_ast all[] = {a, integer(literal), times(integer(-factor), masked(a, literal))};
            return Z3_mk_add(context_, 3, all);
        };
        switch (op) {
        case Op::ShiftRight:
            return Z3_mk_div(context_, a, power(literal));
        case Op::BitAnd:
            return masked(a, literal);
        case Op::BitOr:
            return ofMask(1);
        default:
            return ofMask(2);
        }
    }

    Z3_ast build(SymbolicExprId id, const SymbolicExpr& node) {
        using Op = SymbolicOp;
        static const std::map<Op, Z3_ast (*)(Z3_context, Z3_ast, Z3_ast)> comparisons{
            {Op::Equal, Z3_mk_eq},       {Op::LessThan, Z3_mk_lt},         {Op::LessThanEqual, Z3_mk_le},
            {Op::GreaterThan, Z3_mk_gt}, {Op::GreaterThanEqual, Z3_mk_ge},
        };
        static const std::map<Op, Z3_ast (*)(Z3_context, unsigned, const Z3_ast*)> chains{
            {Op::Plus, Z3_mk_add}, {Op::Minus, Z3_mk_sub}, {Op::Multiply, Z3_mk_mul},
            {Op::And, Z3_mk_and},  {Op::Or, Z3_mk_or},
        };
        static constexpr OperatorSet withLiteral{Op::Divide, Op::Modulo, Op::ShiftLeft, Op::ShiftRight,
                                                 Op::BitAnd, Op::BitOr,  Op::BitXOr};
        const Op op = node.op();
        const auto number = [&](std::size_t i) { return asNumber(node.getInput(i)); };
        if (op == Op::String) {
            const std::string& name = static_cast<const SymbolicString&>(node).getName();
            return name == "true" || name == "false" ? integer(name == "true") : unknown(name);
        }
        if (op == Op::IntValue)
            return integer(static_cast<const SymbolicIntValue&>(node).getValue());
        if (op == Op::DoubleValue) {
            const WideForm value = RationalForm::of(node.getNumValue()).widened();
            const std::string text = value.constant.str() + "/" + value.denominator.str();
            return Z3_mk_numeral(context_, text.c_str(), Z3_mk_real_sort(context_));
        }
        if (op == Op::UnaryMinus)
            return negative(number(0));
        if (op == Op::Not)
            return Z3_mk_not(context_, asTruth(node.getInput(0)));
        if (withLiteral.contains(op) && table_.get(node.getInput(1))->op() == Op::IntValue && !isReal(number(0)))
            if (const int literal = static_cast<const SymbolicIntValue*>(table_.get(node.getInput(1)))->getValue();
                literal != 0 || (op != Op::Divide && op != Op::Modulo))
                return byLiteral(op, number(0), literal);
        if (op == Op::NotEqual || comparisons.contains(op)) {
            const auto [a, b] = alike(number(0), number(1));
            return op == Op::NotEqual ? Z3_mk_not(context_, Z3_mk_eq(context_, a, b))
                                      : comparisons.at(op)(context_, a, b);
        }
        const auto make = chains.find(op);
        if (make == chains.end() ||
            (op == Op::Multiply && !isConstant(node.getInput(0)) && !isConstant(node.getInput(1))))
            return unknown("term " + std::to_string(id));
        if (isTruth(id)) {
            const Z3_ast both[] = {asTruth(node.getInput(0)), asTruth(node.getInput(1))};
            return make->second(context_, 2, both);
        }
        return make->second(context_, 2, alike(number(0), number(1)).data());
    }

    /// Whether literals alone are in a product.
    [[nodiscard]] bool isConstant(SymbolicExprId id) const {
        const SymbolicExpr* node = table_.get(id);
        while (node->op() == SymbolicOp::Multiply && table_.get(node->getInput(1))->isNumValue())
            node = table_.get(node->getInput(0));
        return node->isNumValue();
    }

    const SymbolicExprTable& table_;
    Z3_context context_;
    Z3_sort integers_;
    Z3_solver solver_;
    std::map<SymbolicExprId, Z3_ast> done_;
};

} // namespace VT::Testing
