// The steps of one simplification: rules that fired, forms that were considered, and the result.
// Bypasses the caches of the service, which keep only results.
#pragma once

#include "base/simplify/Simplify.hpp"
#include "tools/vtsym/answers/Conditions.hpp"

#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// Simplifies one condition and records how.
class Explanation {
public:
    /// Simplifies a condition of the service; `conditions` and `options` outlive the explanation.
    Explanation(const Conditions& conditions, const TextOptions& options, VT::SymbolicExprId condition, bool withRules);

    /// The result of the rules or, after shorten(), the shortest form.
    [[nodiscard]] VT::SymbolicExprId result() const noexcept { return shortest_.value_or(result_); }

    [[nodiscard]] std::uint64_t passes() const noexcept { return passes_; }

    /// Searches the shortest form, which becomes the result.
    void shorten();

    /// The text of the result.
    [[nodiscard]] std::string resultText() const;
    /// Appends the condition, the rules of each pass with the text before and after, the forms considered, the result.
    void appendText(const Style& style, std::string& out) const;
    /// The steps as a JSON array.
    [[nodiscard]] std::string json() const;

private:
    [[nodiscard]] std::string step(VT::SymbolicExprId condition) const;
    void appendSteps(const Style& style, std::string& out) const;
    void appendForms(const Style& style, std::string& out) const;

    const Conditions& conditions_;
    const TextOptions& options_;
    VT::SymbolicExprId condition_;
    VT::SymbolicExprId result_ = 0; ///< of the rules
    std::optional<VT::SymbolicExprId> shortest_;
    std::vector<VT::ShortForm> forms_; ///< considered for the shortest one
    std::uint64_t passes_ = 0;
    std::vector<VT::RuleFiring> firings_;
};

} // namespace vtsym
