// The meaning of the names in an expression: a service that the library asks of its host.
#pragma once

#include "host/Export.hpp"

#include <cstddef>
#include <cstdint>
#include <string>
#include <variant>
#include <vector>

namespace VT {

/// A value of the host's array language.
struct QxArray {
    enum class Type : std::uint8_t {
        Logical,
        Integer,
        Real,
        Other, ///< text, structure, object: no numbers
    };

    Type type = Type::Other;
    bool complex = false;                  ///< there are imaginary parts
    std::vector<std::size_t> dimensions{}; ///< rows, columns and so on
    std::vector<double> elements{};        ///< real parts, column by column
};

/// The name is a symbol: it stands for itself.
struct SymbolName {};

/// The host knows nothing of the name.
struct UnknownSymbol {};

using SymbolMeaning = std::variant<SymbolName, UnknownSymbol, QxArray>;

/// Resolves names to their meaning.  The default takes every name as a symbol.
class VTSYM_API SymbolValidator {
public:
    SymbolValidator() = default;
    SymbolValidator(const SymbolValidator&) = delete;
    SymbolValidator& operator=(const SymbolValidator&) = delete;
    virtual ~SymbolValidator();

    /// The meaning of a name.  An exception ends the conversion of the text and passes to its caller.
    ///
    /// @param text      the text that holds the name, ended by NUL
    /// @param position  characters of the text before the name
    virtual SymbolMeaning resolveSymbol(const std::string& name, const char* text, std::size_t position);
};

} // namespace VT
