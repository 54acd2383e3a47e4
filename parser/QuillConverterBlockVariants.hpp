// The conditions of variant blocks in Quill text become nodes.
#pragma once

#include "parser/NameCache.hpp"
#include "parser/QuillConverter.hpp"

#include <string>
#include <string_view>

namespace VT {

/// Turns the Quill text of a condition into one interned expression in C shape.
///
/// Accepts, beyond SymbolicExprFromQParseTree: every operator of the language, ranges, matrices, cell arrays, anonymous
/// functions, and calls with any number of arguments of any callee but a name in parentheses.  Indexing with braces,
/// texts, imaginary numbers and function handles have no node and are refused.  An integral literal
/// of 32 bits is an integer, -2147483648 with its minus included.  While the feature flag VariantKeywordsSimCodegen is
/// above 0, (sim) and (codegen) are names.
///
/// Names stand for themselves whatever their meaning; resolveIdentifier() asks the validator once for each name in a
/// converter's life, so that the host sees them.
///
/// A text that is refused leaves one report in the checker, and is thrown as the host diagnostic
/// "Vantor:Variants:ExpressionParseError" with two arguments, the text and a line of blanks that points below it with
/// ^, with the byte offset of the place and with the reason.  While the checker drops reports, such a text yields the
/// invalid identifier instead.
class VTSYM_API SymbolicExprFromQParseTreeBlockVariants : public SymbolicExprFromQParseTree {
public:
    /// See the base.
    SymbolicExprFromQParseTreeBlockVariants(SymbolicExprTable& table, VTSymbolicExprErrorChecker& checker,
                                            SymbolValidator* validator = nullptr);

    /// The condition of a text.  With `debug` the parse tree is written to standard output first.
    SymbolicExprId operator()(const char* text, bool debug = false);
    SymbolicExprId operator()(const std::string& text, bool debug = false);
    SymbolicExprId operator()(const std::u16string& text);

    [[nodiscard]] bool shouldCreateIntValueNodeForIntegerValue() const override;
    SymbolicExprId resolveIdentifier(const std::string& name, const char* text, std::size_t position) override;
    bool supportFcn(SymbolicExprId functionNameId, std::size_t numArgs, const ParseTree& node,
                    const char* text) override;
    SymbolicExprId visitNonTerminal(const ParseTree& node, const char* text) override;
    /// A matrix of rows.
    SymbolicExprId visitMatrixNode(const ParseTree& node, const char* text) override;

    /// Reports the brace: indexing with braces has no node.
    virtual SymbolicExprId visitCellIndexNode(const ParseTree& node, const char* text);
    /// A cell array of rows; one without elements has an empty row.
    virtual SymbolicExprId visitCellArrayNode(const ParseTree& node, const char* text);
    /// The rows between the brackets or braces of a node, and what they make.
    virtual SymbolicExprId parseArrayBodyNode(const ParseTree& node, const char* text);

private:
    static const RuleTable& rules();

    static Request conditionRequest();

    SymbolicExprId convertOrThrow(std::string_view text, bool debug);
    SymbolicExprId visitAnonymousFunction(const ParseTree& node, const char* text);
    SymbolicExprId answer(SymbolicExprId id, std::string_view text);

    NameCache names_;
};

} // namespace VT
