// What a host may decide about the conditions of its variants.
#pragma once

#include "base/core/Table.hpp"
#include "host/Model.hpp"

#include <optional>
#include <string>
#include <unordered_map>
#include <variant>

namespace VT {

/// What replaces a parameter: another parameter's name or a value.
using ParameterReplacement = std::variant<std::string, int>;
/// What replaces parameters while conditions are compared.
using ParameterReplacements = std::unordered_map<std::string, ParameterReplacement>;

/// A host's say in simplification.  Exceptions of the operations pass to whoever asked for the simplification, and
/// nothing of its result is kept.
class VTSYM_API VCCustomizer {
public:
    virtual ~VCCustomizer();

    /// The service has no more use for the customizer.  Called once for each time that it was installed; a customizer
    /// made for the service alone deletes itself here.
    virtual void release() noexcept = 0;
    /// The condition to decide instead of `condition`: an expression of the same table, or `condition` itself
    /// where there is nothing to rewrite.  An identifier that is not of the table counts as nothing to rewrite.
    virtual SymbolicExprId rewrite(SymbolicExprId condition, SymbolicExprTable& table) = 0;
    /// Whether a simplification may replace one expression by another; both as Quill text.
    virtual bool canReplaceCondition(const std::string& condition, const std::string& replacement) = 0;

    /// What to replace parameters by before two conditions are compared, all at once; nothing unless
    /// overridden.  Names that the conditions have not are ignored.
    virtual ParameterReplacements parameterReplacements() { return {}; }

    /// What the conditions of a block mean by a parameter; nothing, as unless overridden, for the parameter itself.
    /// Asked by queries on blocks and ports that are given this customizer, whether it is installed or not.  `block` is
    /// nullptr for a condition of no block.
    virtual std::optional<ParameterReplacement> parameterOfBlock(const VTBlock* block,
                                                                 const std::string& parameter) const;

protected:
    VCCustomizer() = default;
    VCCustomizer(const VCCustomizer&) = default;
    VCCustomizer& operator=(const VCCustomizer&) = default;
};

} // namespace VT
