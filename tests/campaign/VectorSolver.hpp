// Conditions over signed integers of 32 bits, decided by Z3 over bit vectors.
#pragma once

#include "base/VTSymbolicExpr.hpp"

#include <map>
#include <optional>

#include <z3.h>

namespace VT::Campaign {

/// Translates what C computes without overflow whatever its operands: bits, quotients and remainders by positive
/// literals, shifts to the right by literals, comparisons and logic.
class VectorSolver {
public:
    explicit VectorSolver(const SymbolicExprTable& table) : table_(table) {
        Z3_config config = Z3_mk_config();
        context_ = Z3_mk_context(config);
        Z3_del_config(config);
        word_ = Z3_mk_bv_sort(context_, 32);
    }

    VectorSolver(const VectorSolver&) = delete;
    VectorSolver& operator=(const VectorSolver&) = delete;

    ~VectorSolver() { Z3_del_context(context_); }

    /// Whether an expression has such operators alone.
    [[nodiscard]] bool canTranslate(SymbolicExprId root) {
        bool all = true;
        forEachBelow(root, [&](SymbolicExprId, const SymbolicExpr& node) { all = all && understands(node); });
        return all;
    }

    /// Whether two expressions differ in truth for some values; nothing where the solver gives up.
    std::optional<bool> differ(SymbolicExprId a, SymbolicExprId b) {
        const Z3_ast question = Z3_mk_xor(context_, truth(a), truth(b));
        const Z3_solver solver = Z3_mk_simple_solver(context_);
        Z3_solver_inc_ref(context_, solver);
        const Z3_params parameters = Z3_mk_params(context_);
        Z3_params_inc_ref(context_, parameters);
        Z3_params_set_uint(context_, parameters, Z3_mk_string_symbol(context_, "rlimit"), 20'000'000);
        Z3_solver_set_params(context_, solver, parameters);
        Z3_solver_assert(context_, solver, question);
        const Z3_lbool answer = Z3_solver_check(context_, solver);
        Z3_params_dec_ref(context_, parameters);
        Z3_solver_dec_ref(context_, solver);
        return answer == Z3_L_UNDEF ? std::nullopt : std::optional(answer == Z3_L_TRUE);
    }

private:
    using Op = SymbolicOp;

    [[nodiscard]] bool understands(const SymbolicExpr& node) const {
        static constexpr OperatorSet bits{Op::BitAnd, Op::BitOr, Op::BitXOr, Op::And, Op::Or, Op::Not};
        static constexpr OperatorSet byLiteral{Op::Divide, Op::Modulo, Op::ShiftRight};
        if (byLiteral.contains(node.op())) {
            const SymbolicExpr* const right = table_.get(node.getInput(1));
            return right->op() == Op::IntValue && right->getNumValue() > 0 &&
                   (node.op() != Op::ShiftRight || right->getNumValue() < 32);
        }
        return node.op() == Op::String || node.op() == Op::IntValue || bits.contains(node.op()) ||
               comparisonOps.contains(node.op());
    }

    /// Calls for every node below and including one, operands first.
    template <class Visit>
    void forEachBelow(SymbolicExprId root, Visit visit) {
        std::map<SymbolicExprId, bool> done;
        std::vector<SymbolicExprId> pending{root};
        while (!pending.empty()) {
            const SymbolicExprId id = pending.back();
            const SymbolicExpr& node = *table_.get(id);
            const std::size_t before = pending.size();
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                if (!done.contains(node.getInput(i)))
                    pending.push_back(node.getInput(i));
            if (pending.size() != before)
                continue;
            pending.pop_back();
            if (done.emplace(id, true).second)
                visit(id, node);
        }
    }

    Z3_ast word(int value) { return Z3_mk_int(context_, value, word_); }

    Z3_ast truth(SymbolicExprId root) {
        forEachBelow(root, [&](SymbolicExprId id, const SymbolicExpr& node) {
            if (!words_.contains(id))
                words_[id] = build(node);
        });
        return Z3_mk_not(context_, Z3_mk_eq(context_, words_.at(root), word(0)));
    }

    /// The value of a node as a word; a truth value is 1 or 0.
    Z3_ast build(const SymbolicExpr& node) {
        using Make = Z3_ast (*)(Z3_context, Z3_ast, Z3_ast);
        static const std::map<Op, Make> words{{Op::BitAnd, Z3_mk_bvand},  {Op::BitOr, Z3_mk_bvor},
                                              {Op::BitXOr, Z3_mk_bvxor},  {Op::Divide, Z3_mk_bvsdiv},
                                              {Op::Modulo, Z3_mk_bvsrem}, {Op::ShiftRight, Z3_mk_bvashr}};
        static const std::map<Op, Make> truths{{Op::Equal, Z3_mk_eq},
                                               {Op::LessThan, Z3_mk_bvslt},
                                               {Op::LessThanEqual, Z3_mk_bvsle},
                                               {Op::GreaterThan, Z3_mk_bvsgt},
                                               {Op::GreaterThanEqual, Z3_mk_bvsge}};
        if (node.op() == Op::String) {
            const std::string& name = static_cast<const SymbolicString&>(node).getName();
            return name == "true" || name == "false"
                       ? word(name == "true")
                       : Z3_mk_const(context_, Z3_mk_string_symbol(context_, name.c_str()), word_);
        }
        if (node.op() == Op::IntValue)
            return word(static_cast<const SymbolicIntValue&>(node).getValue());
        const Z3_ast a = words_.at(node.getInput(0));
        const Z3_ast b = node.getNumInputs() > 1 ? words_.at(node.getInput(1)) : a;
        if (const auto make = words.find(node.op()); make != words.end())
            return make->second(context_, a, b);
        const auto isNot0 = [&](Z3_ast value) { return Z3_mk_not(context_, Z3_mk_eq(context_, value, word(0))); };
        const Z3_ast both[] = {isNot0(a), isNot0(b)};
        Z3_ast holds = nullptr;
        if (const auto make = truths.find(node.op()); make != truths.end())
            holds = make->second(context_, a, b);
        else if (node.op() == Op::NotEqual)
            holds = Z3_mk_not(context_, Z3_mk_eq(context_, a, b));
        else if (node.op() == Op::Not)
            holds = Z3_mk_not(context_, both[0]);
        else
            holds = node.op() == Op::And ? Z3_mk_and(context_, 2, both) : Z3_mk_or(context_, 2, both);
        return Z3_mk_ite(context_, holds, word(1), word(0));
    }

    const SymbolicExprTable& table_;
    Z3_context context_;
    Z3_sort word_;
    std::map<SymbolicExprId, Z3_ast> words_;
};

} // namespace VT::Campaign
