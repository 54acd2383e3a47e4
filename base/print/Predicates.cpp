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

bool SymbolicExprPrinter::PredicateHandle::isPlain() const {
    const Predicate* const predicate = predicate_.get();
    return predicate == nullptr || typeid(*predicate) == typeid(Predicate);
}

std::string SymbolicExprPrinter::PredicateHandle::printIdentifier(const SymbolicString& node) const {
    return predicate_ == nullptr ? node.getName() : predicate_->printIdentifier(node);
}

std::string SymbolicExprAliasPrinterPredicate::printIdentifier(const SymbolicString& node) const {
    return aliasOrName(*aliases_, node);
}

std::string InlineVariantParameterAliasPrinterPredicate::printIdentifier(const SymbolicString& node) const {
    return aliasOrName(*aliases_, node);
}

} // namespace VT
