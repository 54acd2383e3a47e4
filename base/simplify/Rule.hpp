// Simplification rules as rows of tables.
//
// A row's example is its documentation, its test case and what an explanation shows.  Rules of one family are tried
// from top to bottom; the first that applies decides.
#pragma once

#include "base/core/Node.hpp"
#include "host/Export.hpp"

#include <span>
#include <string_view>
#include <vector>

namespace VT {

/// The row of a rule.
struct RuleInfo {
    OperatorSet operators;   ///< the operators at whose nodes the rule is tried
    std::string_view name;   ///< as an explanation shows it
    std::string_view before; ///< an example in Quill syntax to which the rule applies
    std::string_view after;  ///< the simplified example
};

/// Every rule of the simplifier, in the order of its families.
VTSYM_API std::span<const RuleInfo* const> simplificationRules();

/// One application of a rule.
struct RuleFiring {
    std::uint64_t pass; ///< counted from 1
    const RuleInfo* rule;
    SymbolicExprId before;
    SymbolicExprId after;
};

/// Receives every application of a rule, in order.
class VTSYM_API RuleListener {
public:
    virtual ~RuleListener();
    virtual void fired(const RuleFiring& firing) = 0;

protected:
    RuleListener() = default;
    RuleListener(const RuleListener&) = default;
    RuleListener& operator=(const RuleListener&) = default;
};

} // namespace VT
