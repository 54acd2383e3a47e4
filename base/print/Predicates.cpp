// Names of identifiers on output: plain, or the aliases of a table.
//
// Aliases are only ever added, so their number serves as the version.  Each look-up is O(length of the name).
#include "base/print/Predicates.hpp"

#include <typeinfo>

namespace VT {

namespace {

std::string aliasOrName(const SymbolicExprTable& aliases, const SymbolicString& node) {
    std::string alias = aliases.getAliasForSymbolicIdentifier(node.getName());
    return alias.empty() ? node.getName() : alias;
}

} // namespace

std::string SymbolicExprPrinter::Predicate::printIdentifier(const SymbolicString& node) const {
    return node.getName();
}

SymbolicExprPrinter::Predicate::~Predicate() = default;

std::uint64_t SymbolicExprPrinter::Predicate::version() const {
    return 0;
}

bool SymbolicExprPrinter::PredicateHandle::isPlain() const {
    const Predicate* const predicate = predicate_.get();
    return predicate == nullptr || typeid(*predicate) == typeid(Predicate);
}

std::string SymbolicExprPrinter::PredicateHandle::printIdentifier(const SymbolicString& node) const {
    return predicate_ == nullptr ? node.getName() : predicate_->printIdentifier(node);
}

std::uint64_t SymbolicExprPrinter::PredicateHandle::version() const {
    return predicate_ == nullptr ? 0 : predicate_->version();
}

std::string SymbolicExprAliasPrinterPredicate::printIdentifier(const SymbolicString& node) const {
    return aliasOrName(*aliases_, node);
}

std::uint64_t SymbolicExprAliasPrinterPredicate::version() const {
    return aliases_->aliasCount();
}

std::string InlineVariantParameterAliasPrinterPredicate::printIdentifier(const SymbolicString& node) const {
    return aliasOrName(*aliases_, node);
}

std::uint64_t InlineVariantParameterAliasPrinterPredicate::version() const {
    return aliases_->aliasCount();
}

} // namespace VT
