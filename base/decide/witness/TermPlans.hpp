// The plans of terms that questions evaluate again and again, made once.
#pragma once

#include "base/decide/witness/TermPlan.hpp"

#include <memory>

namespace VT {

/// Plans stay where they are until clear(); nodes never change.
class TermPlans {
public:
    TermPlans(const LeafReader& leaves, Unknowns& unknowns) : leaves_(leaves), unknowns_(unknowns) {}

    /// The plan of a term; may add unknowns.
    [[nodiscard]] TermPlan& of(SymbolicExprId term) {
        if (const auto* known = plans_.find(term); known != nullptr)
            return **known;
        TermPlan& made = *plans_.insert(term, std::make_unique<TermPlan>(leaves_, unknowns_, term));
        size_ += made.size() + 1;
        return made;
    }

    /// Nodes of all plans.
    [[nodiscard]] std::size_t size() const noexcept { return size_; }

    void clear() noexcept {
        plans_.clear();
        size_ = 0;
    }

private:
    const LeafReader& leaves_;
    Unknowns& unknowns_;
    IdMap<std::unique_ptr<TermPlan>> plans_;
    std::size_t size_ = 0;
};

} // namespace VT
