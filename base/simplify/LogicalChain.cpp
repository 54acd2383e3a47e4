// Simplifies And and Or chains to sums of products.
//
// Method: the operands are read as covers over atoms; an And multiplies its sums out, smallest first, and reduces
// after each factor.  The outermost sum is then replaced by a smallest one where the search finds it.  Every step is
// a row of a table, so that an explanation shows it.
// Cost: bounded by the operand limit, limits::multipliedLiterals for a whole call, and limits::coverSteps for a
// search.
// Relies on: Atoms for the way from nodes to covers and back, base/cover for all operations on covers.
#include "base/simplify/LogicalChain.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/simplify/Atoms.hpp"
#include "base/simplify/RuleTables.hpp"
#include "base/util/IdSet.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <iterator>
#include <map>
#include <span>
#include <utility>

namespace VT {

namespace {

/// A chain on its way to a sum of products: first its operands, then covers whose product (And) or sum (Or) it is.
struct Chain {
    Chain(RuleContext& rules, SymbolicOp chainOp, SymbolicExprId root)
        : context(rules),
          op(chainOp),
          source(root),
          shown(root),
          atoms(rules),
          operands(chainOperands(rules, chainOp, root, repeated)) {}

    [[nodiscard]] bool isAnd() const noexcept { return op == SymbolicOp::And; }

    /// The constant that decides the chain alone, and the one that it does without.
    [[nodiscard]] SymbolicExprId dominant() const { return context.truth(!isAnd()); }

    [[nodiscard]] SymbolicExprId neutral() const { return context.truth(isAnd()); }

    bool decide(SymbolicExprId id) {
        result = id;
        return true;
    }

    /// Takes operands away; what is left may be one operand or none.
    template <class Condition>
    bool drop(Condition condition) {
        if (std::erase_if(operands, condition) == 0)
            return false;
        if (operands.size() < 2)
            decide(operands.empty() ? neutral() : operands.front());
        return true;
    }

    /// Reads the operands in the order of their texts: comparisons into one product, alternatives into covers.
    void read();
    /// The chain in its present state.
    SymbolicExprId write();

    /// Gives up beyond the operand limit.
    bool bounded(std::size_t size) {
        if (size <= context.operandLimit())
            return true;
        context.giveUp();
        decide(source);
        return false;
    }

    /// Gives up where the call has multiplied out as much as it may.
    bool affords(std::size_t literals) {
        if (context.multiplies(literals))
            return true;
        decide(source);
        return false;
    }

    RuleContext& context;
    SymbolicOp op;
    SymbolicExprId source;
    SymbolicExprId shown; ///< what an explanation showed last
    Atoms atoms;
    bool repeated = false; ///< an operand occurred twice
    std::vector<SymbolicExprId> operands;
    bool isRead = false;
    bool impossible = false;         ///< And: the comparisons contradict each other
    std::size_t written = 0;         ///< And: operands that are comparisons
    Cube common;                     ///< And: what they say together
    std::vector<Cover> alternatives; ///< And: operands that are sums
    Cover sum;                       ///< Or, and And once it is distributed
    bool isReduced = false;          ///< no reducing rule makes the sum smaller
    bool isSmallest = false;         ///< the sum is proven to be so
    CoverBudget budget;              ///< of the rules that an explanation shows one by one
    SymbolicExprId result = invalidId;
};

void Chain::read() {
    isRead = true;
    context.sort(operands);
    // What the comparisons of a long And exclude is gathered, so that sets of many intervals are made once.
    const bool isLong = operands.size() > limits::restrictedOneByOne;
    if (!isAnd())
        sum.reserve(operands.size());
    std::map<Atom, std::vector<IntegerSet::Interval>> excluded;
    for (const SymbolicExprId operand : operands) {
        if (!isAnd()) {
            Cube product;
            if (atoms.readProduct(operand, product))
                sum.push_back(std::move(product));
        } else if (context.op(operand) == SymbolicOp::Or) {
            Cover cover;
            bool ignored = false;
            for (const SymbolicExprId alternative : chainOperands(context, SymbolicOp::Or, operand, ignored)) {
                Cube product;
                if (atoms.readProduct(alternative, product))
                    cover.push_back(std::move(product));
            }
            alternatives.push_back(std::move(cover));
        } else {
            const Constraint constraint = atoms.read(operand);
            ++written;
            if (!isLong) {
                impossible = !common.restrict(constraint.atom, constraint.set) || impossible;
                continue;
            }
            const IntegerSet others = constraint.set.complement();
            std::ranges::copy(others.intervals(), std::back_inserter(excluded[constraint.atom]));
        }
    }
    for (auto& [atom, intervals] : excluded)
        impossible = !common.restrict(atom, IntegerSet::of(std::move(intervals)).complement()) || impossible;
}

SymbolicExprId Chain::write() {
    if (result != invalidId)
        return result;
    if (!isRead)
        return foldLeft(context, op, operands);
    if (!isAnd())
        return atoms.write(sum);
    if (impossible)
        return foldLeft(context, op, operands);
    std::vector<SymbolicExprId> parts;
    if (!common.alwaysHolds())
        parts.push_back(atoms.write({common}));
    for (const Cover& cover : alternatives)
        parts.push_back(atoms.write(cover));
    return parts.empty() ? neutral() : foldLeft(context, op, parts);
}

// Rules over constants.

bool dominantOperand(Chain& chain) {
    return std::ranges::find(chain.operands, chain.dominant()) != chain.operands.end() &&
           chain.decide(chain.dominant());
}

/// A real literal that is not a number counts as true in And and as false in Or.
bool decides(SymbolicOp op, double number) {
    return op == SymbolicOp::And ? number <= 0 && number >= 0 : number > 0 || number < 0;
}

bool numberOperand(Chain& chain) {
    const auto value = [&](SymbolicExprId id) { return chain.context.resolve(id); };
    for (const SymbolicExprId operand : chain.operands) {
        if (chain.context.isNumber(value(operand)) &&
            decides(chain.op, chain.context.node(value(operand)).getNumValue()))
            return chain.decide(chain.dominant());
    }
    if (std::ranges::all_of(chain.operands, [&](SymbolicExprId id) { return chain.context.isNumber(value(id)); }))
        return chain.decide(chain.neutral());
    return chain.drop([&](SymbolicExprId id) { return chain.context.isNumber(value(id)); });
}

bool neutralOperand(Chain& chain) {
    return chain.drop([&](SymbolicExprId id) { return id == chain.neutral(); });
}

bool repeatedOperand(Chain& chain) {
    if (!std::exchange(chain.repeated, false))
        return false;
    if (chain.operands.size() == 1)
        chain.decide(chain.operands.front());
    return true;
}

bool oppositeKeywords(Chain& chain) {
    const auto has = [&](auto test) {
        return std::ranges::any_of(chain.operands, [&](SymbolicExprId id) { return (chain.context.*test)(id); });
    };
    return has(&RuleContext::isSimKeyword) && has(&RuleContext::isCodegenKeyword) && chain.decide(chain.dominant());
}

// Rules over what an And says together.

bool contradiction(Chain& chain) {
    chain.read();
    return chain.impossible && chain.decide(chain.dominant());
}

bool commonRange(Chain& chain) {
    const std::size_t comparisons = chain.common.comparisons();
    return chain.bounded(comparisons + chain.alternatives.size()) && comparisons < chain.written;
}

bool absorbedAlternative(Chain& chain) {
    return std::erase_if(chain.alternatives, [&](const Cover& cover) {
               return std::ranges::any_of(cover, [&](const Cube& cube) { return chain.common.isSubsetOf(cube); });
           }) > 0;
}

/// Multiplies covers one after the other and keeps what comes out small.  False where the operand limit or what a call
/// may multiply out is exceeded.
bool multiplyOut(Chain& chain, std::vector<Cover> factors) {
    std::ranges::stable_sort(factors, {}, &Cover::size);
    CoverBudget budget{limits::coverSteps};
    for (const Cover& factor : factors) {
        const std::size_t literals = chain.sum.size() * comparisons(factor) + factor.size() * comparisons(chain.sum);
        if (!chain.bounded(chain.sum.size() * factor.size()) || !chain.affords(literals))
            return false;
        chain.sum = product(chain.sum, factor);
        chain.isReduced = reduce(chain.sum, budget);
    }
    return true;
}

bool distribution(Chain& chain) {
    const bool any = !chain.alternatives.empty();
    chain.sum.assign(1, chain.common);
    if (any && !multiplyOut(chain, std::exchange(chain.alternatives, {})))
        return false;
    chain.op = SymbolicOp::Or;
    return any;
}

// Rules over sums of products.

bool joinedRange(Chain& chain) {
    const bool joined = joinCubes(chain.sum);
    return chain.bounded(chain.sum.size()) && joined;
}

bool absorbedProduct(Chain& chain) {
    return absorb(chain.sum);
}

bool redundantComparison(Chain& chain) {
    return dropComparisons(chain.sum, chain.budget);
}

bool redundantProduct(Chain& chain) {
    return dropCubes(chain.sum, chain.budget);
}

/// Nested sums are multiplied out further; only the outermost one is worth the search.
bool smallestSum(Chain& chain) {
    if (!chain.context.isOutermost())
        return false;
    const std::size_t before = comparisons(chain.sum);
    CoverBudget budget{limits::coverSteps};
    chain.isSmallest = minimize(chain.sum, budget, Ranges::NotOfPoints);
    return comparisons(chain.sum) < before;
}

bool operandOrder(Chain& chain) {
    return chain.decide(chain.write());
}

struct ChainRule {
    RuleInfo info;
    bool (*apply)(Chain& chain);
};

constexpr OperatorSet andOnly{SymbolicOp::And};
constexpr OperatorSet orOnly{SymbolicOp::Or};
constexpr OperatorSet andOr{SymbolicOp::And, SymbolicOp::Or};

// Both operators begin with constants; And goes on to what its comparisons say together and is then distributed into a
// sum of products.
constexpr ChainRule chainRules[] = {
    {{andOnly, "false operand of And", "A == 1 && false", "false"}, dominantOperand},
    {{andOnly, "number in And", "2 && A == 1", "A == 1"}, numberOperand},
    {{andOnly, "true operand of And", "A == 1 && true", "A == 1"}, neutralOperand},
    {{andOnly, "repeated operand of And", "A && B && A", "A && B"}, repeatedOperand},
    {{andOnly, "both keywords", "(sim) && (codegen)", "false"}, oppositeKeywords},
    {{andOnly, "contradiction", "A == 1 && A == 2", "false"}, contradiction},
    {{andOnly, "common range", "A <= 3 && A >= 3", "A == 3"}, commonRange},
    {{andOnly, "absorbed alternative", "A && (A || B)", "A"}, absorbedAlternative},
    {{andOnly, "distribution", "(A == 1 || A == 2) && B == 3", "A == 1 && B == 3 || A == 2 && B == 3"}, distribution},
    {{orOnly, "true operand of Or", "A == 1 || true", "true"}, dominantOperand},
    {{orOnly, "number in Or", "0 || A == 1", "A == 1"}, numberOperand},
    {{orOnly, "false operand of Or", "A == 1 || false", "A == 1"}, neutralOperand},
    {{orOnly, "repeated operand of Or", "A || B || A", "A || B"}, repeatedOperand},
    {{orOnly, "either keyword", "(sim) || (codegen)", "true"}, oppositeKeywords},
};

// Tried again until none of them makes the sum of products smaller.
constexpr ChainRule reducingRules[] = {
    {{andOr, "joined range", "A == 3 || A > 3", "A >= 3"}, joinedRange},
    {{andOr, "absorbed product", "A || A && B", "A"}, absorbedProduct},
    // A search that exhausts its budget is as if it had not been.
    {{andOr, "redundant comparison", "A == 1 || A ~= 1 && B == 2", "A == 1 || B == 2"}, redundantComparison},
    {{andOr, "redundant product", "A && B || ~A && C || B && C", "A && B || C && ~A"}, redundantProduct},
};

constexpr ChainRule smallestRule = {{andOr, "smallest sum", "A > 2 && (C == 0 || C > 1)", "A > 2 && C >= 0 && C ~= 1"},
                                    smallestSum};

constexpr ChainRule orderRule = {{andOr, "operand order", "B == 2 && A == 1", "A == 1 && B == 2"}, operandOrder};

constexpr RuleInfo truthValueAsNumber{andOr, "truth value as number", "-(A && 2)", "-(A ~= 0)"};

/// Applies one rule and reports it.
bool apply(const ChainRule& rule, Chain& chain) {
    const bool changed = rule.apply(chain);
    if (changed && chain.context.explaining()) {
        const SymbolicExprId after = chain.write();
        chain.context.fired(rule.info, std::exchange(chain.shown, after), after);
    }
    return changed;
}

/// Tries the rules of the chain's operator from top to bottom until one decides it.
bool decideByRules(Chain& chain) {
    const SymbolicOp op = chain.op;
    for (const ChainRule& rule : chainRules) {
        if (!rule.info.operators.contains(op))
            continue;
        apply(rule, chain);
        if (chain.result != invalidId)
            return true;
    }
    return false;
}

SymbolicExprId reduceSum(Chain& chain) {
    if (!chain.isRead)
        chain.read();
    const auto applyAll = [&](std::span<const ChainRule> rules) {
        const auto helped = [&](const ChainRule& rule) { return apply(rule, chain) || chain.result != invalidId; };
        while (chain.result == invalidId && std::ranges::any_of(rules, helped)) {
        }
    };
    if (chain.isReduced) {
        chain.bounded(chain.sum.size());
    } else {
        applyAll(std::span(reducingRules).first(2));
        CoverBudget budget = chain.budget = searchBudget(chain.sum);
        if (chain.result == invalidId && chain.context.explaining()) {
            Cover smaller = chain.sum;
            if (reduceJoined(smaller, budget))
                applyAll(reducingRules);
        } else if (chain.result == invalidId) {
            reduceJoined(chain.sum, budget);
        }
    }
    if (chain.result != invalidId)
        return chain.result;
    apply(smallestRule, chain);
    apply(orderRule, chain);
    if (chain.isSmallest)
        chain.context.setSmallest(chain.result);
    return chain.result;
}

SymbolicExprId rewriteChain(RuleContext& context, SymbolicExprId root) {
    Chain chain(context, context.op(root), root);
    return decideByRules(chain) ? chain.result : reduceSum(chain);
}

} // namespace

bool chainIsWithin(const SymbolicExprTable& table, const SymbolicExpr& root, std::uint64_t limit) {
    std::uint64_t operands = 0;
    boost::container::small_vector<SymbolicExprId, 32> pending{root.getInput(1), root.getInput(0)};
    IdSet seen;
    while (!pending.empty() && operands <= limit) {
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        if (!table.has(id) || !seen.add(id))
            continue;
        const SymbolicExpr& node = *table.get(id);
        if (node.op() != root.op())
            ++operands;
        else
            for (const std::size_t side : {1, 0})
                pending.push_back(node.getInput(side));
    }
    return operands <= limit;
}

SymbolicExprId simplifyChain(RuleContext& context, SymbolicExprId root) {
    if (context.isSmallest(root)) {
        VTSYM_CHECK(root % 8 != 0 || rewriteChain(context, root) == root); // a sample
        return root;
    }
    return rewriteChain(context, root);
}

SymbolicExprId negateChain(RuleContext& context, SymbolicExprId root) {
    Chain chain(context, SymbolicOp::Or, root);
    chain.read();
    std::vector<Cover> factors;
    for (const Cube& cube : chain.sum)
        factors.push_back(complement(cube));
    chain.sum.assign(1, Cube());
    if (!multiplyOut(chain, std::move(factors)))
        return invalidId;
    return reduceSum(chain);
}

void appendChainRules(std::vector<const RuleInfo*>& out) {
    for (const std::span<const ChainRule> rules :
         {std::span<const ChainRule>(chainRules), std::span<const ChainRule>(reducingRules)})
        for (const ChainRule& rule : rules)
            out.push_back(&rule.info);
    for (const RuleInfo* rule : {&smallestRule.info, &orderRule.info, &truthValueAsNumber})
        out.push_back(rule);
}

SymbolicExprId truthAsNumber(RuleContext& context, SymbolicExprId source, SymbolicExprId rebuilt) {
    if (!context.table().has(source) || !context.isBoolean(source))
        return rebuilt;
    if (context.isBoolean(rebuilt) || context.isTrue(rebuilt) || context.isFalse(rebuilt))
        return rebuilt;
    const SymbolicExprId value =
        simplifyComparison(context, SymbolicOp::NotEqual, rebuilt, context.make<SymbolicIntValue>(0));
    context.fired(truthValueAsNumber, source, value);
    return value;
}

} // namespace VT
