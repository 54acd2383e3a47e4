// Asks a host's customizer before a rewrite, with both expressions as Quill text.
//
// Texts are printed only when there is a question.
#include "base/simplify/SimplifyVisitorBlockVariants.hpp"

namespace VT {

VCCustomizer::~VCCustomizer() = default;

std::optional<ParameterReplacement> VCCustomizer::parameterOfBlock(const VTBlock*, const std::string&) const {
    return std::nullopt;
}

SymbolicExprSimplifyVisitorBlockVariants::SymbolicExprSimplifyVisitorBlockVariants(SymbolicExprTable& table,
                                                                                   bool keywordsFlag,
                                                                                   const SymbolicExprPrinter& printer,
                                                                                   bool askCustomizer,
                                                                                   VCCustomizer* customizer)
    : SymbolicExprSimplifyVisitor(table, keywordsFlag, printer),
      askCustomizer_(askCustomizer),
      customizer_(customizer) {}

SymbolicExprSimplifyVisitorBlockVariants::~SymbolicExprSimplifyVisitorBlockVariants() = default;

bool SymbolicExprSimplifyVisitorBlockVariants::confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) {
    if (!askCustomizer_)
        return true;
    if (customizer_ == nullptr)
        return false;
    if (!shown_)
        shown_.emplace(table(), true, true);
    return customizer_->canReplaceCondition(shown_->printIdUsingCache(expression),
                                            shown_->printIdUsingCache(replacement));
}

} // namespace VT
