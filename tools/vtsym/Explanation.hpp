// What a simplification did.
#pragma once

#include "base/simplify/Simplify.hpp"
#include "tools/vtsym/Conditions.hpp"

#include <string>
#include <vector>

namespace vtsym {

/// A condition simplified, with the rules that fired on the way.
class Explanation {
public:
    /// Simplifies a condition of the service; `conditions` and `options` outlive the explanation.
    Explanation(const Conditions& conditions, const TextOptions& options, VT::SymbolicExprId condition, bool withRules);

    /// The result of the rules or, behind prove(), what was put in its place.
    [[nodiscard]] VT::SymbolicExprId result() const noexcept { return proven_; }

    [[nodiscard]] std::uint64_t passes() const noexcept { return passes_; }

    /// Puts a condition that was proven equal in the place of the result.
    void prove(VT::SymbolicExprId equal) noexcept { proven_ = equal; }

    /// Appends the condition, each rule with before and after by passes, and the result.
    void appendText(const Style& style, std::string& out) const;
    /// The steps as a JSON array.
    [[nodiscard]] std::string json() const;

private:
    [[nodiscard]] std::string step(VT::SymbolicExprId condition) const;
    void appendSteps(const Style& style, std::string& out) const;

    const Conditions& conditions_;
    const TextOptions& options_;
    VT::SymbolicExprId condition_;
    VT::SymbolicExprId result_ = 0; ///< of the rules
    VT::SymbolicExprId proven_ = 0;
    std::uint64_t passes_ = 0;
    std::vector<VT::RuleFiring> firings_;
};

} // namespace vtsym
