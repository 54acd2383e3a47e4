// The simplifier's pass for the conditions of variant blocks.
#pragma once

#include "base/simplify/SimplifyVisitor.hpp"
#include "base/simplify/VCCustomizer.hpp"

#include <optional>

namespace VT {

/// Simplifies by the same rules as its base, but lets a customizer confirm the rewrites that need it.
///
/// A comparison of an expression with itself whose folding is not confirmed folds to the opposite constant: `P<P`
/// becomes true. So with `askCustomizer` and without a customizer, every such comparison is answered the other way
/// round.
class VTSYM_API SymbolicExprSimplifyVisitorBlockVariants : public SymbolicExprSimplifyVisitor {
public:
    /// @param printer        prints Quill text of the table and outlives the visitor
    /// @param askCustomizer  false makes the visitor behave like its base
    /// @param customizer     outlives the visitor; may be nullptr
    SymbolicExprSimplifyVisitorBlockVariants(SymbolicExprTable& table, bool keywordsFlag,
                                             const SymbolicExprPrinter& printer, bool askCustomizer,
                                             VCCustomizer* customizer);
    ~SymbolicExprSimplifyVisitorBlockVariants() override;

    bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) override;

private:
    bool askCustomizer_;
    VCCustomizer* customizer_;
    std::optional<SymbolicExprPrinter>
        shown_; ///< prints what the customizer is asked about; made by the first question
};

} // namespace VT
