// What every rule works with.
#pragma once

#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/simplify/Rule.hpp"
#include "base/util/IdMap.hpp"

#include <cstdint>
#include <optional>
#include <span>
#include <utility>

namespace VT {

/// The table, the order of operands and the state of one pass.  How operands are ordered is the driver's choice: rules
/// know the order through sortsBefore() and sort() alone, never the printer.
class RuleContext {
public:
    RuleContext(SymbolicExprTable& table, bool keywordsOn);
    RuleContext(const RuleContext&) = delete;
    RuleContext& operator=(const RuleContext&) = delete;
    virtual ~RuleContext() = default;

    /// Asked before some rules replace an expression.
    virtual bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) = 0;
    /// Operands of a flattened chain and products of a distribution.
    [[nodiscard]] virtual std::uint64_t operandLimit() const = 0;
    /// Takes note of literals that are about to be multiplied out; false, and gives up, where they are more than the
    /// call may have.
    virtual bool multiplies(std::size_t literals) = 0;
    /// Whether the node at hand is below a comparison or a logical operator, where quotients are truncated; elsewhere
    /// they are exact.
    [[nodiscard]] virtual bool inCondition() const = 0;
    /// Whether the node at hand is not an operand of And, Or or Not: what it becomes is final.
    [[nodiscard]] virtual bool isOutermost() const = 0;
    /// Reports that a chain or a distribution is beyond the limit: the pass will not be used.
    virtual void giveUp() = 0;
    /// Whether a comes before b among the operands of a chain: a strict weak order that never depends on how nodes are
    /// numbered.
    [[nodiscard]] virtual bool sortsBefore(SymbolicExprId a, SymbolicExprId b) const = 0;
    /// Sorts operands by that order.
    virtual void sort(std::span<SymbolicExprId> operands) const = 0;

    [[nodiscard]] const SymbolicExpr& node(SymbolicExprId id) const { return *table_.get(id); }

    [[nodiscard]] SymbolicOp op(SymbolicExprId id) const {
        if (isPlain_) // most nodes need not be looked at
            if (const std::uint64_t key = table_.keyAt(id); NodeKeys::isExact(key))
                return NodeKeys::opOf(key);
        return node(id).op();
    }

    template <class Node, class... Parts>
    SymbolicExprId make(Parts&&... parts) {
        return Node(table_, std::forward<Parts>(parts)...).getId(table_);
    }

    /// The node of an operator with two operands.
    SymbolicExprId makeBinary(SymbolicOp op, SymbolicExprId a, SymbolicExprId b) {
        return VT::makeBinary(table_, op, a, b);
    }

    [[nodiscard]] SymbolicExprId truth(bool value) const { return value ? table_.getIdTRUE() : table_.getIdFALSE(); }

    [[nodiscard]] bool isTrue(SymbolicExprId id) const { return id == table_.getIdTRUE(); }

    [[nodiscard]] bool isFalse(SymbolicExprId id) const { return id == table_.getIdFALSE(); }

    /// The value bound to a member, where there is one; otherwise the operand itself.
    [[nodiscard]] SymbolicExprId resolve(SymbolicExprId id) const;

    [[nodiscard]] bool isNumber(SymbolicExprId id) const { return node(id).isNumValue(); }

    /// The value of an integer literal.
    [[nodiscard]] std::optional<int> integer(SymbolicExprId id) const;

    [[nodiscard]] bool isBoolean(SymbolicExprId id) const { return booleanOps.contains(op(id)); }

    /// Whether an operand may have a value between two integers: a real literal takes part in its arithmetic.  Looks at
    /// each node once in a pass.
    [[nodiscard]] bool mayBeReal(SymbolicExprId id);

    [[nodiscard]] bool isSimKeyword(SymbolicExprId id) const;
    [[nodiscard]] bool isCodegenKeyword(SymbolicExprId id) const;

    /// Whether applications of rules are reported to a listener; they cost nothing where nobody listens.
    [[nodiscard]] bool explaining() const noexcept { return listener_ != nullptr; }

    /// Takes note of a chain that is a sum of products, in order and proven smallest: no rule makes it another one.
    void setSmallest(SymbolicExprId chain) { smallest_.insert(chain, true); }

    [[nodiscard]] bool isSmallest(SymbolicExprId chain) const { return smallest_.find(chain) != nullptr; }

    void fired(const RuleInfo& rule, SymbolicExprId before, SymbolicExprId after);

    void listen(RuleListener* listener, std::uint64_t pass) noexcept {
        listener_ = listener;
        pass_ = pass;
    }

    [[nodiscard]] SymbolicExprTable& table() const noexcept { return table_; }

private:
    SymbolicExprTable& table_;
    bool isPlain_; ///< the table
    bool keywordsOn_;
    RuleListener* listener_ = nullptr;
    std::uint64_t pass_ = 0;
    IdMap<bool> real_;     ///< what mayBeReal() found
    IdMap<bool> smallest_; ///< chains that were proven to be so
};

} // namespace VT
