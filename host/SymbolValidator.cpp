// The default validator: every name is a symbol.
//
// Here so that the class has one home for its table of virtual functions.
#include "host/SymbolValidator.hpp"

namespace VT {

SymbolValidator::~SymbolValidator() = default;

SymbolMeaning SymbolValidator::resolveSymbol(const std::string&, const char*, std::size_t) {
    return SymbolName{};
}

} // namespace VT
