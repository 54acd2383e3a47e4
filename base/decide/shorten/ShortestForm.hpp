// The search for the shortest form of a condition, with or without knowledge of where it is asked.
//
// Method: the condition is read as a formula whose leaves are sets of integers (Formulas, ComparedTerms), which joins
// comparisons of one term.  Constraints are judged by those around them, common operands are taken out.  Where every
// unknown is then in one comparison, no other form has fewer of them, and the search ends: that is most real
// conditions.  Otherwise what does not count is found by a truth table, and formulas of fewer comparisons are searched
// (FactorSearch), which mostly ends in a proof that there are none.  Where it does not, the same is done with a
// smallest sum of products, with that of the opposite (which is a product of sums) and with the simplifier's normal
// form.  Where truth tables are too large, or comparisons depend on each other through more than sets, operands are
// taken away one by one with a proof for each.
//
// The form with the fewest comparisons, of those the one with the fewest bytes, is proven equal before it is returned.
//
// Cost: linear in the condition where the search ends early, otherwise bounded by limits::shortenWork, and by the steps
// of the proofs.
#pragma once

#include "base/decide/shorten/ConditionProofs.hpp"
#include "base/decide/shorten/FormulaPruning.hpp"
#include "base/decide/shorten/FormulaReader.hpp"
#include "base/decide/shorten/FormulaRewriting.hpp"
#include "base/decide/shorten/FormulaWriter.hpp"
#include "base/decide/shorten/ShortForm.hpp"

#include <functional>
#include <vector>

namespace VT {

class ShortestForm {
public:
    /// `printer` writes the language in which lengths count.
    ShortestForm(SymbolicExprTable& table, const SymbolicExprPrinter& printer, bool keywordsInForce,
                 ConditionProofs& proofs);

    /// The shortest form of a condition that is found and proven, which is never longer in print; the condition itself
    /// where there is none.  `known` is the condition that holds where it is asked, or the invalid identifier;
    /// `normalForm` yields another form of the condition, which need not be proven.
    SymbolicExprId find(SymbolicExprId condition, SymbolicExprId known,
                        const std::function<SymbolicExprId()>& normalForm);

    /// The forms that the latest search wrote, the shortest first.
    [[nodiscard]] const std::vector<ShortForm>& forms() const noexcept { return forms_; }

private:
    struct Considered {
        std::string_view way;
        Formula formula;
    };

    Formula simplified(Formula formula);
    Formula irredundant(Formula formula);
    Formula withoutDecided(Formula formula, bool isAnythingKnown);
    void readKnown(SymbolicExprId known);
    [[nodiscard]] bool isReadOnce(Formula formula) const;
    [[nodiscard]] bool isPlain(Formula formula) const;
    [[nodiscard]] bool dependOnEachOther(Formula formula) const;
    void search(SymbolicExprId condition, Formula start, SymbolicExprId known,
                const std::function<SymbolicExprId()>& normalForm);
    bool considerSums(Formula formula);
    void consider(std::string_view way, Formula formula);
    [[nodiscard]] Formula fewest() const;
    bool considerFewest();
    void shortenByProofs(SymbolicExprId known);
    SymbolicExprId best(SymbolicExprId condition, std::size_t comparisons);

    SymbolicExprTable& table_;
    const SymbolicExprPrinter& printer_;
    ConditionProofs& proofs_;
    ComparedTerms terms_;
    Formulas formulas_;
    FormulaReader reader_;
    FormulaRewriting rewriting_;
    FormulaPruning pruning_;
    FormulaWriter writer_;
    AtomFacts facts_;
    bool isPruned_ = true; ///< every form so far is without redundant operands as far as atoms are independent
    std::vector<Considered> considered_;
    std::vector<ShortForm> forms_;
};

} // namespace VT
