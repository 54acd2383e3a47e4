// Where the cells of a prepared expression are, and the operations over them.
#pragma once

#include "base/eval/Prepared.hpp"

#include <vector>

namespace VT {

/// Lays out the operations for the shapes that the slots of an expression have.  Operators on vectors become one
/// operation for each element; those on constants are done at once.
class PreparedExprLayout {
public:
    /// Throws what PreparedExpr::run() throws for vectors that do not fit.
    explicit PreparedExprLayout(const PreparedExpr& expression);

    /// Puts the layout into the expression.
    void install(PreparedExpr& expression) noexcept;

private:
    using Place = PreparedExpr::Place;
    using Step = PreparedExpr::Step;

    void placeSlots();
    void placeConstants();
    [[nodiscard]] Place placeOf(const PreparedExpr::Source& source) const;
    [[nodiscard]] Place placeList(const Step& step);
    [[nodiscard]] Place placeOperator(const Step& step);
    std::uint32_t addLeaf(const SymbolicScalar& value, bool isConstant);
    std::uint32_t addOperation(ScalarRuleIndex rule, std::uint32_t left, std::uint32_t right);
    [[nodiscard]] std::uint32_t element(const Place& place, std::uint32_t index) const;
    void listElement(std::uint32_t cell);
    void finish();

    const PreparedExpr& expression_;
    std::vector<ScalarCell> cells_;
    std::vector<ScalarType> types_;
    std::vector<bool> constant_; ///< by cell
    std::vector<detail::Operation> operations_;
    std::vector<Place> slotPlaces_;
    std::vector<Place> constantPlaces_;
    std::vector<Place> stepPlaces_;
    std::vector<std::uint32_t> vectorCells_;
    Place rootPlace_;
    std::size_t firstResult_ = 0;
};

} // namespace VT
