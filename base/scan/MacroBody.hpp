// Classifies the definition of a macro by its effect on the conditions that use it.
#pragma once

#include "base/scan/DirectiveReader.hpp"

#include <span>
#include <string_view>

namespace VT {

/// The class of a definition: the tokens after the macro's name.
struct MacroBody {
    enum class Form : std::uint8_t {
        Operand, ///< nothing, a constant, a prefix and an operand, or anything in parentheses
        Alias,   ///< another macro's name, or a call of it: of the class of that macro
        Open,    ///< operators that others around the macro may take apart, or a parameter that may hold such
    };

    Form form = Form::Operand;
    bool varies = false;      ///< its value may change though no macro does
    bool hasPragma = false;   ///< its expansion may change macros
    std::string_view alias{}; ///< the macro of an Alias
};

/// Reads a definition.  Linear in its tokens.
[[nodiscard]] MacroBody readMacroBody(std::span<const DirectiveToken> definition);

/// Whether the value of a predefined macro changes from line to line, or from inclusion to inclusion.
[[nodiscard]] bool variesByItself(std::string_view name);

/// Whether a token is part of a name that may be spelled, or cut, in another way: a universal character name, or
/// characters beyond ASCII other than Latin and Cyrillic letters, some of which are letters for one compiler only.
[[nodiscard]] bool isOddName(const DirectiveToken& token);

/// Whether a pragma, given by its tokens or those of an operator with its text, may change macros.
[[nodiscard]] bool pragmaChangesMacros(std::span<const DirectiveToken> tokens);

} // namespace VT
