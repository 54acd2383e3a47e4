// What C text or a preprocessor cannot decide as the library does.
#pragma once

#include "base/print/ExpressionPrinter.hpp"

#include <cstdint>
#include <vector>

namespace VT {

/// Where the C text of a condition is used.
enum class CTextUse : std::uint8_t {
    Program,   ///< in a compiled expression; members are fields
    Directive, ///< after `#if`, as PreprocessorVCExpr prints it; members are flat macro names
};

/// Why the text of a condition is not decided as the condition is.
enum class CTextObstacle : std::uint8_t {
    NoSuchOperator,  ///< C has no such operator: power, transpose, element-wise or left division, range ...
    BitwiseLogic,    ///< element-wise & or | of what may be other than 0 and 1, which C combines bit by bit
    RealConstant,    ///< a directive knows integers only; C has no infinities
    MemberOfNoName,  ///< a member of anything but a name is not a macro, and in C a number has no members
    CalledNoName,    ///< only a name can be called: in a directive a macro with arguments, in C a function
    SharedMacroName, ///< two parameters become one macro
    VariantKeyword,  ///< "(sim)" and its like would be names in parentheses
    NoSuchName,      ///< a name is written as something that C does not take for one, or as a reserved word
    DefinedNoName,   ///< `defined` of anything but one name
};

/// An obstacle and the node it is about; `other` is the second parameter of a shared macro name.
struct CTextFinding {
    CTextObstacle obstacle;
    SymbolicExprId id;
    SymbolicExprId other = invalidId;
};

/// The obstacles in a condition, at most one of each kind and operator; none for an identifier that is not of the
/// table.  Calls such as defined(X) are not obstacles.  `predicate` is that of the printer; what it writes for a name
/// is taken to be C.  Linear in the number of distinct nodes, but for the sorting of names.
[[nodiscard]] VTSYM_API std::vector<CTextFinding>
findCTextObstacles(const SymbolicExprTable& table, SymbolicExprId id, CTextUse use,
                   const SymbolicExprPrinter::PredicateHandle& predicate = {});

} // namespace VT
