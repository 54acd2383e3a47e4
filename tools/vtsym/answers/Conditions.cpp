// Chooses the printers and conversions that the options ask for, and renews the service when its table or the texts in
// its caches pass a bound.
#include "tools/vtsym/answers/Conditions.hpp"

#include "base/core/Table.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/Diagnostics.hpp"
#include "tools/vtsym/answers/Warnings.hpp"
#include "tools/vtsym/io/CommandLine.hpp"

#include <unordered_set>

namespace vtsym {

namespace {

// The service is renewed when its table or its texts have grown to this.
constexpr std::size_t fullTable = 100'000;               ///< nodes
constexpr std::size_t fullTexts = std::size_t{1} << 26U; ///< bytes
constexpr std::size_t cacheEntryBytes = 64;

std::string visible(std::string text) {
    if (text.empty())
        text = "true";
    return text;
}

} // namespace

bool Conditions::begin(std::uint64_t steps) {
    *budget_ = VT::Budget(steps);
    if (isFresh_)
        return false;
    renew();
    return true;
}

bool Conditions::makeRoomFor(const std::string& text) {
    isFresh_ = false;
    budget_->add(VT::limits::commandStepsPerLine);
    textBytes_ += text.size() + cacheEntryBytes;
    if (service().table().size() < fullTable && textBytes_ < fullTexts)
        return false;
    renew();
    return true;
}

Conditions::Conditions(bool bits32, const TextOptions& options, std::vector<std::string> assumptions)
    : bits32_(bits32),
      assumedIn_(&options),
      assumptions_(std::move(assumptions)) {
    renew();
    if (assumptions_.empty())
        return;
    const VT::Reasons contradiction = service().explainDisjoint(service().assumptions());
    if (!contradiction.isProven)
        return;
    std::string texts;
    for (const VT::SymbolicExprId operand : contradiction.operands)
        texts.append(texts.empty() ? "" : ", ").append(print(options, operand));
    throw UsageError("--assume", "the conditions contradict each other: " + texts);
}

void Conditions::assume(const std::string& text) const {
    try {
        service().assume(parse(*assumedIn_, text));
    } catch (const VT::HostDiagnostic& diagnostic) {
        throw UsageError("--assume", quotedArgument(text) + " cannot be read: " + diagnostic.what());
    }
}

void Conditions::renew() {
    service_.reset();
    service_ = std::make_unique<VT::VCService>();
    service().setDecisions32Bit(bits32_);
    service().shareBudget(budget_.get());
    service().clearAssumptions();
    for (const std::string& text : assumptions_)
        assume(text);
    textBytes_ = 0;
    isFresh_ = true;
}

VT::SymbolicExprId Conditions::parse(const TextOptions& options, const std::string& text) const {
    return options.fromQuill() ? service().parseQ(text) : service().parseC(text);
}

VT::SymbolicExprId Conditions::simplify(const TextOptions& options, const std::string& text) const {
    return (options.fromQuill() ? service().simplifyFromQCondition(text) : service().simplifyFromCCondition(text)).id();
}

VT::SymbolicExprId Conditions::inAnswerShape(const TextOptions& options, VT::SymbolicExprId condition) const {
    VT::SymbolicExprTable& table = service().table();
    if (!options.toQuill())
        return VT::SymbolicExprQ2C(table)(condition);
    return options.fromQuill() ? condition : VT::SymbolicExprC2Q(table)(condition);
}

VT::SymbolicExprId Conditions::shortest(const TextOptions& options, VT::SymbolicExprId condition,
                                        std::vector<VT::ShortForm>* forms) const {
    const VT::SymbolicExprId given = inAnswerShape(options, condition);
    return notLonger(options, service().shortestCondition(given, options.toQuill(), forms).id(), given);
}

VT::SymbolicExprId Conditions::shortestGiven(const TextOptions& options, VT::SymbolicExprId condition,
                                             VT::SymbolicExprId known) const {
    const VT::SymbolicExprId given = inAnswerShape(options, condition);
    const VT::SymbolicExprId context = inAnswerShape(options, known);
    return notLonger(options, service().getImpliedCondition(given, context, options.toQuill()).id(), given);
}

/// Returns the result, or the condition itself where the extra brackets of a directive make the result longer.
VT::SymbolicExprId Conditions::notLonger(const TextOptions& options, VT::SymbolicExprId result,
                                         VT::SymbolicExprId condition) const {
    const VT::SymbolicExprTable& table = service().table();
    const bool isTruth = result == table.getIdTRUE() || result == table.getIdFALSE();
    const bool grew =
        options.toDirective() && !isTruth && print(options, result).size() > print(options, condition).size();
    return grew ? condition : result;
}

std::string Conditions::printShortest(const TextOptions& options, VT::SymbolicExprId shortest,
                                      VT::SymbolicExprId condition) const {
    std::string text = print(options, shortest);
    const VT::SymbolicExprTable& table = service().table();
    const bool holds = shortest == table.getIdTRUE();
    const bool isTruth = holds || shortest == table.getIdFALSE();
    if (isTruth && text.size() > print(options, inAnswerShape(options, condition)).size())
        text = holds ? "1" : "0";
    return text;
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

std::string Conditions::printUnconverted(VT::SymbolicExprId condition, bool quill) const {
    return visible(quill ? service().printQExpr(condition) : service().printCExprNoConversion(condition));
}

} // namespace vtsym
