// The symbols of a variant condition, by kind.
#pragma once

#include "base/transform/Symbols.hpp"

#include <bitset>
#include <initializer_list>

namespace VT {

/// Kinds of symbols of a condition.
enum class VCSymbolType : int {
    Identifier,    ///< identifiers, the constants "true" and "false" too
    BoundMember,   ///< members that have a value in the table
    UnboundMember, ///< members that have none
    FunctionName,  ///< names of called functions
};

/// Number of values of an enumeration that count from 0.
template <class Enum>
inline constexpr std::size_t flagCount = 0;
template <>
inline constexpr std::size_t flagCount<VCSymbolType> = 4;

/// A set of values of an enumeration, each given as a Flag, as one bit each.
template <class Enum, class Flag>
class FlagSetForEnum {
public:
    using Bits = std::bitset<flagCount<Enum>>;

    FlagSetForEnum() = default;

    /// Throws std::out_of_range ("bitset::set") for a flag that is not a value of the enumeration.
    FlagSetForEnum(std::initializer_list<Flag> flags) {
        for (const Flag flag : flags)
            set(flag);
    }

    /// Adds a flag.  Throws as above.
    FlagSetForEnum& set(Flag flag) {
        bits_.set(static_cast<std::size_t>(flag));
        return *this;
    }

    /// The set as a mask: the bit of a value is 1 << value.
    [[nodiscard]] const Bits& bits() const noexcept { return bits_; }

private:
    Bits bits_;
};

using VCSymbolTypes = FlagSetForEnum<VCSymbolType, VCSymbolType>;

/// Collects the symbols of some kinds, in the order of their first occurrence.  Unlike an identifier, the name of a
/// function is collected for each distinct call, and the owner of a member is not searched.
class VTSYM_API VCSymbolsOfSymbolicExpr : public SymbolsOfSymbolicExpr {
public:
    using Kinds = VCSymbolTypes::Bits;

    /// The kinds as a mask: 1 identifiers, 2 members with a value, 4 members without, 8 names of functions.
    VCSymbolsOfSymbolicExpr(const SymbolicExprTable& table, Kinds symbolKinds)
        : SymbolsOfSymbolicExpr(table),
          symbolKinds_(symbolKinds) {}

    VCSymbolsOfSymbolicExpr(const SymbolicExprTable& table, const VCSymbolTypes& symbolKinds)
        : VCSymbolsOfSymbolicExpr(table, symbolKinds.bits()) {}

    /// Appends the symbols as Quill prints them.  Throws std::length_error where an owner's text is beyond the bound.
    void getSymbols(SymbolicExprId id, std::vector<std::string>& names) override;
    /// Appends the symbols.
    void getSymbolIds(SymbolicExprId id, std::vector<SymbolicExprId>& ids) override;

private:
    [[nodiscard]] bool wants(VCSymbolType kind) const { return symbolKinds_[static_cast<std::size_t>(kind)]; }

    Kinds symbolKinds_;
};

} // namespace VT
