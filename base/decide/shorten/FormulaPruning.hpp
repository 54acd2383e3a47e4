// Formulas without anything that does not count, and formulas of the fewest comparisons.
#pragma once

#include "base/cover/FactorSearch.hpp"
#include "base/decide/shorten/Formulas.hpp"

#include <optional>
#include <vector>

namespace VT {

class FormulaPruning {
public:
    FormulaPruning(Formulas& formulas, Formulas::Comparisons comparisons)
        : formulas_(formulas),
          comparisons_(std::move(comparisons)) {}

    /// A formula of the same meaning in which no operand can be dropped or be a constant, and no constraint can be one
    /// of fewer comparisons, whatever values the atoms have.  Nothing where it has more than limits::prunedComparisons
    /// or differs at more points than limits::coverPoints.
    std::optional<Formula> pruned(Formula formula);

    struct Smaller {
        Formula formula;
        bool isSmallest; ///< whether it is proven that none has fewer comparisons
    };

    /// A formula of the same meaning with fewer comparisons; the formula itself where none is found within
    /// limits::factorSteps and limits::factorPoints.

    Smaller smaller(Formula formula);

private:
    using Kind = Formulas::Kind;
    using Points = boost::container::small_vector<Word, 16>;

    /// An operand where it is.
    struct Occurrence {
        Formula formula;
        std::size_t parent; ///< in occurrences_; its own place for the whole formula
        std::size_t place;  ///< among the parent's operands
        Points counts;      ///< where its value decides the whole formula's
    };

    bool readGrid(Formula formula);
    void evaluate(Formula formula);
    [[nodiscard]] const Points& valueOf(Formula formula) const;
    void findOccurrences(Formula formula);
    void appendOperands(std::size_t parent);
    [[nodiscard]] Formula replaced(std::size_t occurrence, Formula by);
    [[nodiscard]] std::optional<Formula> shorterFor(const Occurrence& occurrence);
    Formula written(const Factored& items);
    [[nodiscard]] std::optional<Formula> cheaper(const Occurrence& leaf);

    Formulas& formulas_;
    Formulas::Comparisons comparisons_;
    Grid grid_;
    std::vector<Formula> below_;
    std::vector<Points> values_; ///< by place in below_
    std::vector<Occurrence> occurrences_;
};

} // namespace VT
