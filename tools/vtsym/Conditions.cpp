#include "tools/vtsym/Conditions.hpp"

#include "base/core/Table.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/transform/QuillConversion.hpp"
#include "tools/vtsym/Warnings.hpp"

#include <unordered_set>

namespace vtsym {

namespace {

// When the service has collected much.
constexpr std::size_t fullTable = 100'000;               ///< nodes
constexpr std::size_t fullTexts = std::size_t{1} << 26U; ///< bytes
constexpr std::size_t cacheEntryBytes = 64;

std::string visible(std::string text) {
    if (text.empty())
        text = "true";
    return text;
}

} // namespace

bool Conditions::makeRoomFor(const std::string& text) {
    textBytes_ += text.size() + cacheEntryBytes;
    if (service().table().size() < fullTable && textBytes_ < fullTexts)
        return false;
    renew();
    return true;
}

void Conditions::renew() {
    handle_.reset();
    handle_.emplace();
    service().setDecisions32Bit(bits32_);
    textBytes_ = 0;
}

VT::SymbolicExprId Conditions::parse(const TextOptions& options, const std::string& text) const {
    return options.fromQuill() ? service().parseQ(text) : service().parseC(text);
}

VT::SymbolicExprId Conditions::simplify(const TextOptions& options, const std::string& text) const {
    return (options.fromQuill() ? service().simplifyFromQCondition(text) : service().simplifyFromCCondition(text)).id();
}

std::vector<std::string> Conditions::symbols(VT::SymbolicExprId condition, const VT::VCSymbolTypes& kinds) const {
    std::vector<std::string> all;
    service().getSymbolsFromExpression(condition, all, kinds);
    std::vector<std::string> once;
    std::unordered_set<std::string> seen{"true", "false"};
    for (std::string& symbol : all)
        if (seen.insert(symbol).second)
            once.push_back(std::move(symbol));
    return once;
}

std::string Conditions::print(const TextOptions& options, VT::SymbolicExprId condition) const {
    if (options.toDirective()) {
        VT::SymbolicExprTable& table = service().table();
        return VT::PreprocessorVCExpr(table, false, true).print(VT::SymbolicExprQ2C(table)(condition));
    }
    if (!options.toQuill())
        return visible(service().printCExpr(condition));
    return visible(options.fromQuill() ? service().printQExpr(condition)
                                       : service().printQExprWithConversion(condition));
}

std::vector<std::string> Conditions::warnings(const TextOptions& options, VT::SymbolicExprId condition) const {
    if (options.toQuill())
        return {};
    VT::SymbolicExprTable& table = service().table();
    return warningsOf(table, VT::SymbolicExprQ2C(table)(condition),
                      options.toDirective() ? VT::CTextUse::Directive : VT::CTextUse::Program);
}

std::string Conditions::printAsItStands(VT::SymbolicExprId condition, bool quill) const {
    return visible(quill ? service().printQExpr(condition) : service().printCExprNoConversion(condition));
}

} // namespace vtsym
