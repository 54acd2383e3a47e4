// The visitor that computes values.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/eval/ScalarRules.hpp"
#include "base/eval/Values.hpp"
#include "base/util/IdMap.hpp"

#include <boost/container/small_vector.hpp>

#include <cstddef>
#include <forward_list>
#include <optional>

namespace VT {

namespace detail {
enum class Evaluation : std::uint8_t;
}

/// Computes the value of an expression bottom-up: the values of a node's operands are taken from a stack, and the value
/// of the node is left there.
///
/// Evaluable are literals, symbols, the operators of scalarRules and lists of dimensions, whose elements are scalars.
/// A scalar and a vector combine element by element, and so do two vectors of one length.  "true" and "false" are truth
/// values; any other symbol has the value that is bound to it in the table, evaluated, and so has a member that a value
/// is bound to.  Everything else throws a host diagnostic that names the symbol or the sub-expression:
///
///     Vantor:SymbolicDims:UnboundSymbol   a symbol without a value
///     Vantor:SymbolicDims:CyclicValue     a symbol whose value needs itself
///     Vantor:SymbolicDims:NotEvaluable    a node of another class, a list in a list, an identifier without a node
///     Vantor:SymbolicDims:SizeMismatch    two vectors of different lengths
///
/// Of several faults the first one met is thrown; a node is met before its operands, and these from left to right.  The
/// operands of a node without a value are not evaluated, nor is the owner of a member.
///
/// Use either evaluate(), or a run by node.accept(table, visitor) or visitor.execute(table, id) and then get().  Both
/// return the same value and throw the same errors.  Such a run visits what evaluate() passes over, such as the owner
/// of a member, so its visits compute nothing: get() evaluates the node that was visited last, which is the root.
///
/// Each distinct node is evaluated once in the visitor's life and its value is remembered: bindings must not change
/// meanwhile.
class VTSYM_API SymbolicExprEvalImpl : public RoutedVisitor<SymbolicExprEvalImpl> {
public:
    /// `table` outlives the visitor.
    explicit SymbolicExprEvalImpl(const SymbolicExprTable& table) : table_(table) {}

    SymbolicExprEvalImpl(const SymbolicExprEvalImpl&) = delete;
    SymbolicExprEvalImpl& operator=(const SymbolicExprEvalImpl&) = delete;

    /// The value of an expression.  Linear in the distinct nodes that the visitor has not met, times the length of the
    /// vectors.  Throws std::length_error beyond limits::evaluatedElements.  After an exception the visitor is still
    /// usable.
    SymbolicValue evaluate(SymbolicExprId id);

    /// The value of the run that was completed last; it can be asked for once.  Throws like evaluate(), and
    /// "Vantor:SymbolicDims:NotEvaluable" where nothing was visited.
    SymbolicValue get();

    /// Takes note of a node.  One that is not of the table is evaluated at once, because it need not live until get().
    void on(const SymbolicExpr& node);

private:
    using Elements = SymbolicValue::Elements;

    /// A scalar, or a vector that the visitor keeps.
    struct Entry {
        SymbolicScalar scalar;
        const Elements* elements = nullptr;
    };

    /// A node whose operands, or a symbol whose value, is being evaluated.
    struct Frame {
        const SymbolicExpr* node;
        SymbolicExprId id;
        SymbolicExprId first; ///< operand of an operator, or the value of a symbol; a list has its elements in its node
        SymbolicExprId second; ///< operand of an operator
        std::size_t next;
        std::size_t count;
        ScalarRuleIndex rule; ///< of an operator
        bool isSymbol;
    };

    template <class Enter>
    SymbolicValue evaluateFrom(Enter enterRoot);
    [[nodiscard]] SymbolicValue takeValue();
    void enter(SymbolicExprId id, const Frame* parent);
    void enterNode(SymbolicExprId id, const SymbolicExpr& node, SymbolicOp op, detail::Evaluation way);
    void markOpen(SymbolicExprId id);
    void enterOperands(SymbolicExprId id, const SymbolicExpr& node, SymbolicOp op);
    void enterSymbol(SymbolicExprId id, const SymbolicExpr& node, bool isMember);
    void leave();

    void pushList(const SymbolicExpr& node);

    void push(const SymbolicScalar& scalar) { push(scalar, nullptr); }

    void push(const SymbolicScalar& scalar, const Elements* elements) {
        stack_.push_back(values_.size());
        values_.push_back({scalar, elements});
    }

    void push(Elements elements);
    void combine(const SymbolicExpr& node, ScalarRuleIndex index);
    void combineElements(const SymbolicExpr& node, const ScalarRule& rule, const Entry& left, const Entry& right);

    const SymbolicExprTable& table_;
    // With room for usual expressions in place.
    boost::container::small_vector<Entry, 64> values_;
    boost::container::small_vector<std::size_t, 16> stack_; ///< of values
    boost::container::small_vector<Frame, 16> frames_;
    IdMap<std::size_t> known_;            ///< the values of nodes but literals
    std::forward_list<Elements> vectors_; ///< of the entries
    std::size_t elementCount_ = 0;        ///< in them

    // The result of get(): the value of a node of the table, or one that is known already.
    SymbolicExprId visited_ = invalidId;
    std::optional<SymbolicValue> visitedValue_;
};

} // namespace VT
