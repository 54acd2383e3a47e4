// Converts parse trees of variant conditions: the base's walk with the rules of the whole language, and a cache of the
// names that were resolved.  Linear in the text.
#include "parser/QuillConverterBlockVariants.hpp"

#include "base/core/Nodes.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <iostream>

namespace VT {

namespace {

using ParseTree = SymbolicExprFromQParseTree::ParseTree;

bool hasRule(const ParseTree& node, QuillRule code) {
    return node.kind == ParseTree::nonTerminal && node.code == static_cast<std::int32_t>(code);
}

} // namespace

SymbolicExprFromQParseTreeBlockVariants::SymbolicExprFromQParseTreeBlockVariants(SymbolicExprTable& table,
                                                                                 VTSymbolicExprErrorChecker& checker,
                                                                                 SymbolValidator* validator)
    : SymbolicExprFromQParseTree(table, checker, validator),
      names_(table) {}

// Whole texts.

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::operator()(const char* text, bool debug) {
    return convertOrThrow(text, debug);
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::operator()(const std::string& text, bool debug) {
    return convertOrThrow(text, debug);
}

SymbolicExprFromQParseTree::Request SymbolicExprFromQParseTreeBlockVariants::conditionRequest() {
    Request request;
    request.variantKeywords = isVariantKeywordsSimCodegenFeatureOn();
    request.ordinary = true;
    request.ownClass = &typeid(SymbolicExprFromQParseTreeBlockVariants);
    return request;
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::convertOrThrow(std::string_view text, bool debug) {
    Request request = conditionRequest();
    request.dump = debug ? &std::cout : nullptr;
    return answer(convert(text, request), text);
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::operator()(const std::u16string& text) {
    std::string converted;
    const SymbolicExprId id = convert(text, converted, conditionRequest());
    return answer(id, converted);
}

/// Returns the identifier, or throws for a text that was refused.
SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::answer(SymbolicExprId id, std::string_view text) {
    if (id != invalidId || skipDiagnostics())
        return id;
    std::string pointer(reportedPosition() + 1, ' ');
    pointer += '^';
    std::string reason = sentenceOf(failure());
    if (reason.empty() && checker().diagnostics().size() > earlierReports())
        reason = checker().diagnostics().back().what();
    vtsvThrowIExceptionFromDiagnostic(vtsvCreateDiagnostic("Vantor:Variants:ExpressionParseError",
                                                           {std::string(text), std::move(pointer)}, std::move(reason),
                                                           reportedPosition()));
}

// Names and numbers.

bool SymbolicExprFromQParseTreeBlockVariants::shouldCreateIntValueNodeForIntegerValue() const {
    return true;
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::resolveIdentifier(const std::string& name, const char* text,
                                                                          std::size_t position) {
    if (const auto known = names_.find(name); known != invalidId)
        return known;
    const bool isKeyword = name.starts_with('(');
    if (validator() != nullptr && !isKeyword)
        validator()->resolveSymbol(name, text, position);
    const auto id = factory().make<SymbolicString>(name);
    names_.insert(id);
    return id;
}

bool SymbolicExprFromQParseTreeBlockVariants::supportFcn(SymbolicExprId, std::size_t, const ParseTree&, const char*) {
    return true;
}

// Rules.

const SymbolicExprFromQParseTree::RuleTable& SymbolicExprFromQParseTreeBlockVariants::rules() {
    static constexpr Build range = [](SymbolicExprFromQParseTree& self, const ParseTree&,
                                      std::span<const SymbolicExprId> operands, const char*) {
        return static_cast<SymbolicExprFromQParseTreeBlockVariants&>(self).factory().make<SymbolicQColon3Expr>(
            operands[0], operands[1], operands[2]);
    };
    static constexpr Rule rows[] = {
        {QuillRule::UnaryMinus2, 1, 1, 1, buildUnary<SymbolicUnaryMinusExpr>},
        {QuillRule::Not2, 1, 1, 1, buildUnary<SymbolicNotExpr>},
        {QuillRule::Power, 0, 2, 2, buildBinary<SymbolicPowerExpr>},
        {QuillRule::DotPower, 0, 2, 2, buildBinary<SymbolicDotPowerExpr>},
        {QuillRule::Transpose, 0, 1, 1, buildUnary<SymbolicTransposeExpr>},
        {QuillRule::DotTranspose, 0, 1, 1, buildUnary<SymbolicDotTransposeExpr>},
        {QuillRule::DotMultiply, 0, 2, 2, buildBinary<SymbolicDotMulExpr>},
        {QuillRule::DotDivide, 0, 2, 2, buildBinary<SymbolicDotDivExpr>},
        {QuillRule::LeftDivide, 0, 2, 2, buildBinary<SymbolicLDivExpr>},
        {QuillRule::DotLeftDivide, 0, 2, 2, buildBinary<SymbolicDotLDivExpr>},
        {QuillRule::SingleOr, 0, 2, 2, buildBinary<SymbolicSingleOrExpr>},
        {QuillRule::SingleAnd, 0, 2, 2, buildBinary<SymbolicSingleAndExpr>},
        {QuillRule::Range, 0, 2, 1, buildBinary<SymbolicQColonExpr>},
        {QuillRule::SteppedRange, 0, 3, 1, range},
        {QuillRule::Row, 0, allChildren, 1, buildMulti<SymbolicRowExpr>},
    };
    static constexpr RuleTable table(rows);
    return table;
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::visitNonTerminal(const ParseTree& node, const char* text) {
    switch (static_cast<QuillRule>(node.code)) {
    case QuillRule::CellIndex:
        return visitCellIndexNode(node, text);
    case QuillRule::CellArray:
        return visitCellArrayNode(node, text);
    case QuillRule::AnonymousFunction:
        return visitAnonymousFunction(node, text);
    case QuillRule::Call:
        return visitCallNode(node, text, true);
    default:
        if (const Rule* const rule = rules().find(node.code))
            return afterOperands(node, *rule, text);
    }
    return SymbolicExprFromQParseTree::visitNonTerminal(node, text);
}

// Lists.

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::visitMatrixNode(const ParseTree& node, const char* text) {
    return parseArrayBodyNode(node, text);
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::visitCellArrayNode(const ParseTree& node, const char* text) {
    return parseArrayBodyNode(node, text);
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::parseArrayBodyNode(const ParseTree& node, const char* text) {
    static constexpr Rule matrix{QuillRule::Matrix, 0, allChildren, 1, buildMulti<SymbolicMatrixExpr>};
    static constexpr Rule cells{QuillRule::CellArray, 0, allChildren, 1, buildMulti<SymbolicCellArrayExpr>};
    for (std::int32_t i = 0; i < node.childCount; ++i)
        if (!hasRule(node.children[i], QuillRule::Row))
            return refuse(node.children[i], text);
    if (!hasRule(node, QuillRule::CellArray))
        return afterOperands(node, matrix, text);
    if (node.childCount > 0)
        return afterOperands(node, cells, text);
    return factory().make<SymbolicCellArrayExpr>(
        std::vector{factory().make<SymbolicRowExpr>(std::vector<SymbolicExprId>())});
}

SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::visitCellIndexNode(const ParseTree& node, const char* text) {
    return refuse(node.childCount > 1 ? node.children[1] : node, text);
}

/// Converts a function: its parameters become one name, `@(p,q)`, which the printer writes before the body.
SymbolicExprId SymbolicExprFromQParseTreeBlockVariants::visitAnonymousFunction(const ParseTree& node,
                                                                               const char* text) {
    if (node.childCount < 2 || !hasRule(node.children[0], QuillRule::ParameterList))
        return refuse(node, text);
    const ParseTree& parameters = node.children[0];
    std::string head = "@(";
    for (std::int32_t i = 0; i < parameters.childCount; ++i) {
        const ParseTree& parameter = parameters.children[i];
        if (parameter.kind != ParseTree::terminal)
            return refuse(parameter, text);
        head.append(i > 0 ? "," : "").append(parameter.text, parameter.length);
    }
    return afterOperands(node, {nullptr, node.children + 1, 1, 1}, buildBinary<SymbolicAnonymousFuncExpr>,
                         factory().make<SymbolicString>(head + ')'));
}

} // namespace VT
