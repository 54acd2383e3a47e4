// Runs the search for the shortest form: reads, rewrites, writes, and proves the best.
//
// Forms are tried from the shortest on, and the first that is proven equal is returned; so a fault in the algebra can
// cost length, never the meaning.
#include "base/decide/shorten/ShortestForm.hpp"

#include "base/decide/shorten/ImpliedCondition.hpp"

#include <algorithm>

namespace VT {

namespace {

using Kind = Formulas::Kind;

} // namespace

ShortestForm::ShortestForm(SymbolicExprTable& table, const SymbolicExprPrinter& printer, bool keywordsInForce,
                           ConditionProofs& proofs)
    : table_(table),
      printer_(printer),
      proofs_(proofs),
      terms_(table, printer, keywordsInForce),
      formulas_([this](const Constraint& constraint) { return terms_.comparisons(constraint); }),
      reader_(table, formulas_, terms_),
      rewriting_(formulas_, [this](const Constraint& constraint) { return terms_.comparisons(constraint); }),
      pruning_(formulas_, [this](const Constraint& constraint) { return terms_.comparisons(constraint); }),
      writer_(table, printer, formulas_, terms_) {}

Formula ShortestForm::simplified(Formula formula) {
    for (std::size_t round = 0; round < limits::shortenRounds; ++round) {
        const Formula next = rewriting_.factored(rewriting_.inContext(formula, facts_));
        if (next == formula)
            break;
        formula = next;
    }
    return formula;
}

/// A simplified formula without anything that does not count, as far as atoms are independent.
Formula ShortestForm::irredundant(Formula formula) {
    for (std::size_t round = 0; round < limits::shortenRounds; ++round) {
        const auto pruned = pruning_.pruned(formula);
        if (pruned == formula)
            return formula;
        if (!pruned)
            break;
        formula = simplified(*pruned);
    }
    isPruned_ = false;
    return formula;
}

/// What the known condition says of single atoms.
void ShortestForm::readKnown(SymbolicExprId known) {
    facts_.clear();
    const auto read = reader_.read(known);
    if (!read)
        return;
    const auto add = [&](Formula fact) {
        if (formulas_.kind(fact) == Kind::Leaf)
            facts_.emplace(formulas_.constraint(fact).atom, formulas_.constraint(fact).set);
    };
    add(read->formula);
    if (formulas_.kind(read->formula) == Kind::And)
        for (const Formula fact : formulas_.operands(read->formula))
            add(fact);
}

/// Whether a formula is a chain, or a comparison of unknowns that nothing else is known of.
bool ShortestForm::isPlain(Formula formula) const {
    return formulas_.kind(formula) != Kind::Leaf || terms_.isPlain(formulas_.constraint(formula).atom);
}

/// Replaces operands by constants that the known condition decides, or their arithmetic.
Formula ShortestForm::withoutDecided(Formula formula, bool isAnythingKnown) {
    const std::vector<Formula> all = formulas_.below(formula);
    std::vector<Formula> result(all.size());
    for (std::size_t i = 0; i < all.size(); ++i) {
        result[i] = all[i];
        const Kind kind = formulas_.kind(all[i]);
        if (kind == Kind::Constant)
            continue;
        if (kind != Kind::Leaf) {
            Formulas::Operands parts = formulas_.operands(all[i]);
            std::ranges::transform(parts, parts.begin(), [&](Formula each) {
                return result[static_cast<std::size_t>(std::ranges::lower_bound(all, each) - all.begin())];
            });
            result[i] = formulas_.chain(kind, parts);
        }
        const bool isAsked = isAnythingKnown ? formulas_.height(all[i]) <= 1 : !isPlain(all[i]);
        if (proofs_.usedUp() || !isAsked)
            continue;
        const SymbolicExprId written = writer_.writePlainly(all[i]);
        if (written == invalidId)
            continue;
        if (const auto decided = proofs_.decided(written))
            result[i] = *decided ? Formulas::yes : Formulas::no;
    }
    return result.back();
}

/// Whether every unknown is in one comparison, and no comparison says anything of another one.
bool ShortestForm::isReadOnce(Formula formula) const {
    std::vector<bool> used;
    const auto useOnce = [&](std::size_t what) {
        if (what >= used.size())
            used.resize(what + 1, false);
        if (used[what])
            return false;
        used[what] = true;
        return true;
    };
    std::size_t occurrences = 1;
    std::size_t distinct = 0;
    for (const Formula each : formulas_.below(formula)) {
        ++distinct;
        switch (formulas_.kind(each)) {
        case Kind::Constant:
            break;
        case Kind::Leaf: {
            const Atom atom = formulas_.constraint(each).atom;
            if (!terms_.isPlain(atom))
                return false;
            if (terms_.unknowns(atom).empty() && !useOnce(0))
                return false;
            for (const LinearPart& part : terms_.unknowns(atom))
                if (!useOnce(part.unknown + 1))
                    return false;
            break;
        }
        default:
            occurrences += formulas_.operands(each).size();
        }
    }
    return occurrences == distinct;
}

/// Whether comparisons of different terms share an unknown, or terms are not understood.
bool ShortestForm::dependOnEachOther(Formula formula) const {
    std::vector<std::pair<Unknown, Atom>> uses;
    for (const Formula each : formulas_.below(formula)) {
        if (formulas_.kind(each) != Kind::Leaf)
            continue;
        const Atom atom = formulas_.constraint(each).atom;
        if (!terms_.isPlain(atom))
            return true;
        for (const LinearPart& part : terms_.unknowns(atom))
            uses.emplace_back(part.unknown, atom);
    }
    std::ranges::sort(uses);
    const auto differ = [](const auto& a, const auto& b) { return a.first == b.first && a.second != b.second; };
    return std::ranges::adjacent_find(uses, differ) != uses.end();
}

void ShortestForm::consider(std::string_view way, Formula formula) {
    if (std::ranges::find(considered_, formula, &Considered::formula) == considered_.end())
        considered_.push_back({way, formula});
}

/// Considers the minimal sum of products and the minimal product of sums; false where one was too large.
bool ShortestForm::considerSums(Formula formula) {
    const auto sum = rewriting_.minimalSum(formula);
    const auto opposite = rewriting_.minimalSum(formulas_.negated(formula));
    if (sum)
        consider("minimal sum of products, factored", irredundant(simplified(*sum)));
    if (opposite)
        consider("minimal product of sums, factored",
                 irredundant(simplified(formulas_.negated(rewriting_.factored(*opposite)))));
    return sum && opposite;
}

/// The form of the fewest comparisons so far.
Formula ShortestForm::fewest() const {
    const auto count = [&](const Considered& each) { return formulas_.comparisons(each.formula); };
    return std::ranges::min_element(considered_, {}, count)->formula;
}

/// Considers a form of fewer comparisons than those so far; whether none has fewer where atoms are independent.
bool ShortestForm::considerFewest() {
    const Formula before = fewest();
    const auto [smaller, isSmallest] = pruning_.smaller(before);
    if (smaller != before)
        consider("fewest comparisons", isSmallest ? smaller : irredundant(smaller));
    return isSmallest;
}

/// Takes operands away from the best form so far.
void ShortestForm::shortenByProofs(SymbolicExprId known) {
    const Formula fewest = this->fewest();
    if (formulas_.comparisons(fewest) > limits::shortenByProofs || formulas_.kind(fewest) == Kind::Constant)
        return;
    const SymbolicExprId start = writer_.writePlainly(fewest);
    if (start == invalidId || !proofs_.isEqual(start))
        return;
    const auto isEqual = [&](SymbolicExprId candidate) { return proofs_.isEqual(candidate); };
    const SymbolicExprId literals = known == invalidId ? table_.getIdTRUE() : known;
    const SymbolicExprId shorter = ImpliedCondition(table_, printer_, literals, isEqual).shorten(start);
    const auto read = shorter == start ? std::nullopt : reader_.read(shorter);
    if (read)
        consider("operands taken away, each with a proof", simplified(read->formula));
}

SymbolicExprId ShortestForm::best(SymbolicExprId condition, std::size_t comparisons) {
    const std::uint64_t bytes = printer_.textLength(condition);
    for (const auto& [way, formula] : considered_) {
        const std::size_t count = formulas_.kind(formula) == Kind::Constant ? 0 : formulas_.comparisons(formula);
        const SymbolicExprId id = count > comparisons ? invalidId : writer_.write(formula);
        if (id != invalidId)
            forms_.push_back({way, id, count, printer_.textLength(id), false});
    }
    std::ranges::stable_sort(forms_, [](const ShortForm& a, const ShortForm& b) {
        return a.comparisons != b.comparisons ? a.comparisons < b.comparisons : a.bytes < b.bytes;
    });
    for (ShortForm& form : forms_) {
        const bool isConstant = form.comparisons == 0;
        const bool isShorter = form.comparisons < comparisons || form.bytes < bytes;
        if (form.form == condition || (!isConstant && (form.bytes > bytes || !isShorter)))
            continue;
        if (!proofs_.isEqual(form.form))
            continue;
        form.chosen = true;
        return form.form;
    }
    return condition;
}

SymbolicExprId ShortestForm::find(SymbolicExprId condition, SymbolicExprId known,
                                  const std::function<SymbolicExprId()>& normalForm) {
    considered_.clear();
    forms_.clear();
    facts_.clear();
    isPruned_ = true;
    const auto read = reader_.read(condition);
    if (!read) { // too long to look for more than its normal form
        const SymbolicExprId normal = normalForm();
        const bool isShorter = table_.has(normal) && printer_.textLength(normal) < printer_.textLength(condition);
        return isShorter && proofs_.isEqual(normal) ? normal : condition;
    }
    writer_.use(reader_.chainOps());
    const bool isAnythingKnown = known != invalidId;
    if (isAnythingKnown)
        readKnown(known);
    Formula start = simplified(read->formula);
    const bool isPlain = std::ranges::all_of(formulas_.below(start), [&](Formula each) { return this->isPlain(each); });
    if (isAnythingKnown || !isPlain)
        start = simplified(withoutDecided(start, isAnythingKnown));
    consider("comparisons joined, common operands taken out", start);
    if (isAnythingKnown || !isReadOnce(start))
        search(condition, start, known, normalForm);
    return best(condition, read->comparisons);
}

/// Considers what takes more than looking at neighbours.
void ShortestForm::search(SymbolicExprId condition, Formula start, SymbolicExprId known,
                          const std::function<SymbolicExprId()>& normalForm) {
    const bool isAnythingKnown = known != invalidId;
    const bool depends = dependOnEachOther(start);
    if (const auto decided = depends && !isAnythingKnown ? proofs_.decided(condition) : std::nullopt) {
        consider("decided", *decided ? Formulas::yes : Formulas::no);
        return;
    }
    consider("what does not count left out", irredundant(start));
    if (considerFewest() && !isAnythingKnown && !depends && isPruned_)
        return;
    const bool complete = considerSums(start);
    considerFewest();
    const SymbolicExprId normal = normalForm();
    if (const auto other = normal == condition ? std::nullopt : reader_.read(normal))
        consider("normal form, factored", irredundant(simplified(other->formula)));
    if (isAnythingKnown || !complete || depends || !isPruned_)
        shortenByProofs(known);
}

} // namespace VT
