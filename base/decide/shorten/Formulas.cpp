// Interns formulas: constraints by content, chains by their operands in any order.
//
// A chain is gathered in one walk that joins constraints of one atom; rounds instead of sets mark what was met.
// Cost: linear in the operands of a chain.
#include "base/decide/shorten/Formulas.hpp"

#include <algorithm>
#include <limits>

namespace VT {

namespace {

bool isChain(Formulas::Kind kind) {
    return kind == Formulas::Kind::And || kind == Formulas::Kind::Or;
}

} // namespace

Formulas::Formulas(Comparisons comparisons) : comparisonsOf_(std::move(comparisons)) {
    nodes_.push_back({Kind::Constant, 0, 1, 0, yes});
    nodes_.push_back({Kind::Constant, 0, 1, 0, no});
    member_.assign(2, 0);
}

Formula Formulas::add(Node node) {
    nodes_.push_back(node);
    member_.push_back(0);
    return static_cast<Formula>(nodes_.size() - 1);
}

Formula Formulas::leaf(const Constraint& constraint) {
    if (constraint.set.empty())
        return no;
    if (constraint.set.isAll())
        return yes;
    const auto [at, added] = leafIndex_.try_emplace(constraint, no);
    if (added) {
        constraints_.push_back(constraint);
        at->second = add({Kind::Leaf, static_cast<std::uint32_t>(constraints_.size() - 1),
                          static_cast<std::uint32_t>(comparisonsOf_(constraint))});
    }
    return at->second;
}

/// Joins a constraint with that of the same atom in gathered_; false where it decides the chain.
bool Formulas::merge(Kind kind, Formula operand) {
    const Constraint& fresh = constraint(operand);
    if (fresh.atom >= placeOfAtom_.size())
        placeOfAtom_.resize(fresh.atom + 1, {0, 0});
    auto& [round, place] = placeOfAtom_[fresh.atom];
    if (round != round_) {
        round = round_;
        place = static_cast<std::uint32_t>(gathered_.size());
        gathered_.push_back(operand);
        return true;
    }
    const IntegerSet& before = constraint(gathered_[place]).set;
    const Constraint joined{fresh.atom, kind == Kind::And ? before.intersect(fresh.set) : before.unite(fresh.set)};
    const Formula result = leaf(joined);
    if (result == no || result == yes)
        return false;
    gathered_[place] = result;
    return true;
}

/// Whether one operand of an operand is an operand of the chain itself, or weaker than one.
bool Formulas::isRedundant(Kind kind, Formula operand) const {
    if (nodes_[operand].kind != opposite(kind))
        return false;
    return std::ranges::any_of(operands(operand), [&](Formula inner) {
        if (member_[inner] == round_)
            return true;
        if (nodes_[inner].kind != Kind::Leaf)
            return false;
        const Constraint& weaker = constraint(inner);
        if (weaker.atom >= placeOfAtom_.size() || placeOfAtom_[weaker.atom].first != round_)
            return false;
        const IntegerSet& own = constraint(gathered_[placeOfAtom_[weaker.atom].second]).set;
        return kind == Kind::And ? own.isSubsetOf(weaker.set) : weaker.set.isSubsetOf(own);
    });
}

Formula Formulas::chain(Kind kind, std::span<const Formula> operands) {
    const Formula dominant = kind == Kind::And ? no : yes;
    const Formula neutral = kind == Kind::And ? yes : no;
    ++round_;
    gathered_.clear();
    const auto take = [&](Formula operand) {
        if (operand == neutral)
            return true;
        if (operand == dominant)
            return false;
        if (nodes_[operand].kind == Kind::Leaf)
            return merge(kind, operand);
        if (member_[operand] != round_)
            gathered_.push_back(operand);
        member_[operand] = round_;
        return true;
    };
    for (const Formula operand : operands) {
        if (nodes_[operand].kind != kind) {
            if (!take(operand))
                return dominant;
            continue;
        }
        const Operands inner = this->operands(operand);
        for (const Formula each : inner)
            if (!take(each))
                return dominant;
    }
    for (const Formula operand : gathered_)
        member_[operand] = round_;
    // The constraints stay where they are, so that redundant operands are found by them.
    std::vector<bool> gone(gathered_.size(), false);
    for (std::size_t i = 0; i < gathered_.size(); ++i)
        gone[i] = isRedundant(kind, gathered_[i]);
    Operands kept;
    for (std::size_t i = 0; i < gathered_.size(); ++i)
        if (!gone[i])
            kept.push_back(gathered_[i]);
    if (kept.size() < 2)
        return kept.empty() ? neutral : kept.front();
    Operands sorted = kept;
    std::ranges::sort(sorted);
    auto key = static_cast<std::size_t>(kind);
    boost::hash_range(key, sorted.begin(), sorted.end());
    const auto [begin, end] = chainIndex_.equal_range(key);
    for (auto at = begin; at != end; ++at) {
        if (nodes_[at->second].kind != kind || this->operands(at->second).size() != sorted.size())
            continue;
        Operands other = this->operands(at->second);
        std::ranges::sort(other);
        if (other == sorted)
            return at->second;
    }
    Node node{kind, static_cast<std::uint32_t>(chains_.size())};
    for (const Formula operand : kept) {
        const std::uint64_t sum = std::uint64_t{node.comparisons} + nodes_[operand].comparisons;
        node.comparisons =
            static_cast<std::uint32_t>(std::min<std::uint64_t>(sum, std::numeric_limits<std::uint32_t>::max()));
        node.height = std::max(node.height, nodes_[operand].height + 1);
    }
    chains_.push_back(std::move(kept));
    const Formula result = add(node);
    chainIndex_.emplace(key, result);
    return result;
}

std::vector<Formula> Formulas::below(Formula formula) const {
    std::vector<Formula> found{formula};
    std::vector<bool> seen(formula + 1, false);
    seen[formula] = true;
    for (std::size_t i = 0; i < found.size(); ++i) { // NOLINT(modernize-loop-convert): it grows
        if (!isChain(nodes_[found[i]].kind))
            continue;
        for (const Formula operand : operands(found[i])) {
            if (!seen[operand])
                found.push_back(operand);
            seen[operand] = true;
        }
    }
    std::ranges::sort(found); // operands are made before what they are of
    return found;
}

Formula Formulas::negated(Formula formula) {
    if (nodes_[formula].negation != unknown)
        return nodes_[formula].negation;
    for (const Formula each : below(formula)) {
        if (nodes_[each].negation != unknown)
            continue;
        Formula opposed = no;
        if (nodes_[each].kind == Kind::Leaf) {
            const Constraint own = constraint(each);
            opposed = leaf({own.atom, own.set.complement()});
        } else {
            Operands parts;
            for (const Formula operand : operands(each))
                parts.push_back(nodes_[operand].negation);
            opposed = chain(opposite(nodes_[each].kind), parts);
        }
        nodes_[each].negation = opposed;
        nodes_[opposed].negation = each;
    }
    return nodes_[formula].negation;
}

} // namespace VT
