// One sentence for each kind of obstacle, with the expression that it is about.
// Expressions are cut to shownExpressionBytes; a very long one is not printed at all.
#include "tools/vtsym/answers/Warnings.hpp"

#include "base/core/Table.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/answers/NodeText.hpp"

namespace vtsym {

namespace {

constexpr std::size_t shownExpressionBytes = 60;

class Wording {
public:
    Wording(const VT::SymbolicExprTable& table, VT::CTextUse use)
        : table_(table),
          inDirective_(use == VT::CTextUse::Directive),
          where_(inDirective_ ? "a preprocessor" : "C"),
          printer_(table, false) {}

    [[nodiscard]] std::string of(const VT::CTextFinding& finding) const;

private:
    [[nodiscard]] std::string text(VT::SymbolicExprId id) const;

    const VT::SymbolicExprTable& table_;
    bool inDirective_;
    const char* where_;
    VT::SymbolicExprPrinter printer_;
};

/// The beginning of an expression, or the length of a very long one.
std::string Wording::text(VT::SymbolicExprId id) const {
    if (table_.get(id) == nullptr)
        return "(nothing)";
    if (const std::uint64_t bytes = printer_.textLength(id); bytes > printedBytes)
        return lengthOfText(bytes);
    return VT::shownText(printer_(id), shownExpressionBytes);
}

std::string Wording::of(const VT::CTextFinding& finding) const {
    const VT::OperatorInfo& row = VT::operatorInfo(table_.get(finding.id)->op());
    switch (finding.obstacle) {
    case VT::CTextObstacle::NoSuchOperator:
        return std::string(where_) + " has no " + std::string(row.meaning) + ": " + text(finding.id);
    case VT::CTextObstacle::BitwiseLogic:
        return "C reads the " + std::string(row.meaning) + " as a bitwise one: " + text(finding.id);
    case VT::CTextObstacle::RealConstant:
        return std::string(where_) + (inDirective_ ? " has no real constants: " : " has no such constant: ") +
               text(finding.id);
    case VT::CTextObstacle::MemberOfNoName:
        return (inDirective_ ? "only a member of a name is a macro: " : "a number has no members: ") + text(finding.id);
    case VT::CTextObstacle::CalledNoName:
        return (inDirective_ ? "only a name is a macro with arguments: " : "a number cannot be called: ") +
               text(finding.id);
    case VT::CTextObstacle::SharedMacroName:
        return text(finding.id) + " and " + text(finding.other) + " are both written " +
               VT::shownText(VT::PreprocessorVCExpr(table_, false).print(finding.id), shownExpressionBytes);
    case VT::CTextObstacle::VariantKeyword:
        return std::string(where_) + " does not know the variant keyword " + text(finding.id);
    case VT::CTextObstacle::NoSuchName:
        return std::string(where_) + " has no such name: " + text(finding.id);
    case VT::CTextObstacle::DefinedNoName:
        return "'defined' takes one name: " + text(finding.id);
    }
    return {};
}

} // namespace

std::vector<std::string> warningsOf(const VT::SymbolicExprTable& table, VT::SymbolicExprId condition,
                                    VT::CTextUse use) {
    const std::vector<VT::CTextFinding> findings = findCTextObstacles(table, condition, use);
    std::vector<std::string> warnings;
    if (findings.empty())
        return warnings;
    const Wording wording(table, use);
    for (const VT::CTextFinding& finding : findings)
        warnings.push_back(wording.of(finding));
    return warnings;
}

} // namespace vtsym
