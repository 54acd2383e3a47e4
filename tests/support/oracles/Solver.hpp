// An independent solver as oracle: conditions over unbounded integers decided by Z3.
#pragma once

#include "base/VTSymbolicExpr.hpp"

#include <map>
#include <stdexcept>
#include <string>

#include <z3.h>

namespace VT::Testing {

/// One context for many questions; a condition is translated once.  Arithmetic beyond + - * by a literal is an unknown
/// for each node.
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
        if (answer == Z3_L_UNDEF)
            throw std::logic_error("the solver does not know");
        return answer == Z3_L_TRUE;
    }

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
        const Op op = node.op();
        const auto number = [&](std::size_t i) { return asNumber(node.getInput(i)); };
        if (op == Op::String) {
            const std::string& name = static_cast<const SymbolicString&>(node).getName();
            return name == "true" || name == "false" ? integer(name == "true") : unknown(name);
        }
        if (op == Op::IntValue)
            return integer(static_cast<const SymbolicIntValue&>(node).getValue());
        if (op == Op::UnaryMinus)
            return Z3_mk_unary_minus(context_, number(0));
        if (op == Op::Not)
            return Z3_mk_not(context_, asTruth(node.getInput(0)));
        if (op == Op::NotEqual)
            return Z3_mk_not(context_, Z3_mk_eq(context_, number(0), number(1)));
        if (const auto make = comparisons.find(op); make != comparisons.end())
            return make->second(context_, number(0), number(1));
        const auto make = chains.find(op);
        if (make == chains.end() || (op == Op::Multiply && !table_.get(node.getInput(0))->isNumValue() &&
                                     !table_.get(node.getInput(1))->isNumValue()))
            return unknown("term " + std::to_string(id));
        const auto operand = [&](std::size_t i) { return isTruth(id) ? asTruth(node.getInput(i)) : number(i); };
        const Z3_ast both[] = {operand(0), operand(1)};
        return make->second(context_, 2, both);
    }

    const SymbolicExprTable& table_;
    Z3_context context_;
    Z3_sort integers_;
    Z3_solver solver_;
    std::map<SymbolicExprId, Z3_ast> done_;
};

} // namespace VT::Testing
