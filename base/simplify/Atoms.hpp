// Conditions as sums of products: from nodes to covers and back.
#pragma once

#include "base/cover/Cover.hpp"
#include "base/simplify/RuleContext.hpp"

#include <boost/container/small_vector.hpp>
#include <boost/unordered_map.hpp>

#include <map>
#include <span>
#include <tuple>
#include <vector>

namespace VT {

/// The atoms of one condition.
///
/// A comparison with an integer constant restricts its left operand to a set of integers; a comparison of two operands
/// restricts their difference, compared with 0; any other operand of an And or Or is a value that is zero or not.  A
/// comparison of or with a real value is a truth value of its own, so that only its exact opposite meets it.  Atoms are
/// numbered in the order in which literals are read, which the caller keeps independent of how nodes are numbered.
class Atoms {
public:
    explicit Atoms(RuleContext& context) : context_(context) {}

    /// What an operand of a chain (no And, no Or, no truth constant, no number) restricts.  The operand is remembered,
    /// so that a product that says the same is written with it.
    Constraint read(SymbolicExprId literal);
    /// An operand that is an And chain or a literal; false where the product can never hold.
    bool readProduct(SymbolicExprId product, Cube& cube);

    using Ids = boost::container::small_vector<SymbolicExprId, 16>;

    /// Appends the comparisons that a constraint takes, one identifier each.
    void write(const Constraint& constraint, Ids& out);
    /// A cover as a sum of products, operands in the order of their texts.
    SymbolicExprId write(const Cover& cover);

private:
    /// Identity of an atom: two operands, or one; `op` distinguishes comparisons of real values.
    using Key = std::tuple<SymbolicExprId, SymbolicExprId, SymbolicOp>;

    struct Entry {
        Key key;
        SymbolicExprId left;  ///< operand as the condition has it
        SymbolicExprId right; ///< second operand, or the invalid identifier
    };

    Atom atomOf(const Key& key, SymbolicExprId left, SymbolicExprId right);
    SymbolicExprId& formOf(const Constraint& constraint, SymbolicExprId literal);
    Constraint enter(const Key& key, SymbolicExprId left, SymbolicExprId right, IntegerSet set, SymbolicExprId literal);
    Constraint readComparison(SymbolicExprId literal, const SymbolicBinaryExpr& comparison);
    [[nodiscard]] SymbolicExprId known(const Constraint& constraint) const;
    SymbolicExprId compare(const Entry& entry, SymbolicOp op, std::int64_t constant);
    SymbolicExprId ray(const Entry& entry, const IntegerSet& set);
    SymbolicExprId negateTruth(SymbolicExprId value);
    SymbolicExprId single(const Constraint& constraint);
    SymbolicExprId sortedChain(SymbolicOp op, Ids& operands);

    /// A literal that was read.
    struct Form {
        Constraint constraint;
        SymbolicExprId literal;
    };

    static constexpr std::size_t few = 16; ///< most conditions have fewer, which are compared one by one

    RuleContext& context_;
    boost::container::small_vector<Entry, 8> entries_;
    std::map<Key, Atom> byKey_; ///< of the entries after the first few
    boost::container::small_vector<Form, few> forms_;
    boost::unordered_map<Constraint, SymbolicExprId> furtherForms_;
};

/// The operands of a chain of `op` rooted at a node, each once, in the order of the tree; `repeated` reports whether
/// one was there twice.  Linear in the number of distinct nodes of the chain.
std::vector<SymbolicExprId> chainOperands(const RuleContext& context, SymbolicOp op, SymbolicExprId root,
                                          bool& repeated);

/// Operands folded from the left; there is at least one.
SymbolicExprId foldLeft(RuleContext& context, SymbolicOp op, std::span<const SymbolicExprId> operands);

} // namespace VT
