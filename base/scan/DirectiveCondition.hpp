// Conditions of #if and #elif become nodes.
//
// A macro stands for one integer, signed or unsigned, of 64 bits; one that is not defined is 0.  The reader understands
// && || !, defined, and comparisons of a macro with a constant that is the same integer for both kinds of macros: not
// negative, not unsigned where it is ordered, and no more than an int.  Any other comparison of two terms is an unknown
// of its own that is negative, zero or positive, so that A < B and A >= B are opposites but nothing follows for a third
// macro: one of them may be unsigned.  Other arithmetic is an unknown of its own, equal where its text is equal; so are
// calls of macros, __has_include() and the like.  Constants are computed.  A condition with a macro that the file
// defines as an expression without parentheses is an unknown as a whole.
//
// An unknown whose value the macros of a build determine comes with that value, as a fact.
//
// A constant that is a condition by itself (#if 0, #if 1 && A) is a switch set by hand: nothing follows from it.
#pragma once

#include "base/scan/ConstantArithmetic.hpp"
#include "base/scan/DirectiveReader.hpp"
#include "base/scan/MacroUnknowns.hpp"
#include "base/scan/build/BuildMacros.hpp"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace VT {

/// The spelling of a part of a condition: tokens from `first` to `last`.
struct PartSpelling {
    SymbolicExprId part;
    std::uint32_t first;
    std::uint32_t last;
};

/// The value of an unknown under the macros of a build.
struct BuildFact {
    MacroUnknownId unknown;
    SymbolicExprId node;             ///< holds: `N == 4`, `defined(N)`
    std::vector<std::string> macros; ///< that it follows from
};

/// A condition that was read: its node, the unknowns in it, and how its parts are written.
struct DirectiveCondition {
    SymbolicExprId node = invalidId;
    std::optional<bool> constant;         ///< of a condition that is a switch
    bool understood = true;               ///< false for a condition that is one unknown
    bool bracketed = false;               ///< && is in parentheses between ||
    std::vector<MacroUnknownId> unknowns; ///< each once
    std::vector<PartSpelling> spellings;  ///< of the parts that && and || join, and of the chains of these
    std::vector<BuildFact> known;         ///< about the unknowns
    /// Unknowns that stand for constants among operands, which are switches set by hand, and whether they hold.
    std::vector<std::pair<MacroUnknownId, bool>> constants;
};

/// Returns the text of tokens, with one blank where there was any; if `compact`, only where the tokens would join.
std::string spelledTokens(std::span<const DirectiveToken> tokens, bool compact = false);

/// Reads conditions of one file, in its order.
class DirectiveConditionReader {
public:
    /// With `truthConstants`, true and false are constants, as in C++; unknowns otherwise.  `build` has the macros that
    /// are defined before the file, or is nullptr.
    DirectiveConditionReader(SymbolicExprTable& table, MacroStates& states, MacroUnknowns& unknowns,
                             bool truthConstants, const BuildMacros* build = nullptr)
        : table_(table),
          states_(states),
          unknowns_(unknowns),
          truthConstants_(truthConstants),
          build_(build) {}

    /// The condition of a directive that has one.  Linear in its tokens.
    DirectiveCondition read(const Directive& directive);

private:
    struct Operand {
        enum class Kind : std::uint8_t { Constant, Truth, Value, Term } kind = Kind::Term;
        bool compound = false;   ///< a term made by operators
        std::uint32_t first = 0; ///< tokens, with parentheses around it
        std::uint32_t last = 0;
        std::uint32_t innerFirst = 0; ///< without them
        std::uint32_t innerLast = 0;
        DirectiveConstant constant{};
        SymbolicExprId truth = invalidId;
    };

    struct Operation {
        SymbolicOp op; ///< None for an open parenthesis
        bool prefix;
        std::uint8_t precedence;
        std::uint32_t token;
    };

    bool parse();
    bool readOperand(std::uint32_t& token);
    bool readInfix(std::uint32_t token);
    bool closeParenthesis(std::uint32_t token);
    [[nodiscard]] bool isSign(std::uint32_t token) const;
    bool readDefined(std::uint32_t& token);
    bool readCall(std::uint32_t& token);
    void reduceTo(std::uint8_t precedence);
    void reduce();
    Operand prefixed(const Operation& operation, const Operand& a);
    Operand joined(SymbolicOp op, const Operand& a, const Operand& b);
    Operand compared(SymbolicOp op, const Operand& a, const Operand& b);
    Operand truthOf(SymbolicExprId node, std::uint32_t first, std::uint32_t last);
    Operand difference(SymbolicOp op, const Operand& a, const Operand& b);
    SymbolicExprId truth(const Operand& operand);
    SymbolicExprId symbol(const Operand& operand);
    SymbolicExprId use(MacroUnknownId unknown);
    std::optional<DirectiveConstant> known(std::uint32_t first, std::uint32_t last, std::vector<std::string>& macros);
    void noteValue(MacroUnknownId unknown, std::uint32_t first, std::uint32_t last);
    void noteDefined(MacroUnknownId unknown, std::string_view macro);
    const BuildMacros::Macro* macroOf(std::string_view name);
    void readAsWhole();

    [[nodiscard]] std::string text(std::uint32_t first, std::uint32_t last, bool compact);
    [[nodiscard]] std::vector<MacroStates::Name> macros(std::uint32_t first, std::uint32_t last);

    SymbolicExprTable& table_;
    MacroStates& states_;
    MacroUnknowns& unknowns_;
    bool truthConstants_;
    const BuildMacros* build_;
    BuildMacros::Budget valueBudget_{}; ///< for all conditions
    std::span<const DirectiveToken> tokens_;
    DirectiveCondition condition_;
    std::vector<Operand> operands_;
    std::vector<Operation> operations_;
    std::size_t spelled_ = 0; ///< tokens written into texts
};

} // namespace VT
