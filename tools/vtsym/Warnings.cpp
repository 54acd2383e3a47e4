#include "tools/vtsym/Warnings.hpp"

#include "base/core/Table.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "host/Text.hpp"

namespace vtsym {

namespace {

constexpr std::size_t shownBytes = 60;
constexpr std::size_t printedBytes = 20'000;

class Wording {
public:
    Wording(const VT::SymbolicExprTable& table, VT::CTextUse use)
        : table_(table),
          where_(use == VT::CTextUse::Directive ? "a preprocessor" : "C"),
          printer_(table, false) {}

    [[nodiscard]] std::string of(const VT::CTextFinding& finding) const;

private:
    [[nodiscard]] std::string text(VT::SymbolicExprId id) const;

    const VT::SymbolicExprTable& table_;
    const char* where_;
    VT::SymbolicExprPrinter printer_;
};

/// The beginning of an expression; the number of its bytes where it is very long.
std::string Wording::text(VT::SymbolicExprId id) const {
    if (!table_.has(id))
        return "(nothing)";
    if (const std::uint64_t bytes = printer_.textLength(id); bytes > printedBytes)
        return "(" + std::to_string(bytes) + " bytes of text)";
    return VT::shownText(printer_(id), shownBytes);
}

std::string Wording::of(const VT::CTextFinding& finding) const {
    const VT::OperatorInfo& row = VT::operatorInfo(table_.get(finding.id)->op());
    switch (finding.obstacle) {
    case VT::CTextObstacle::NoSuchOperator:
        return std::string(where_) + " has no " + std::string(row.meaning) + ": " + text(finding.id);
    case VT::CTextObstacle::BitwiseLogic:
        return "C reads the " + std::string(row.meaning) + " as a bitwise one: " + text(finding.id);
    case VT::CTextObstacle::RealConstant:
        return "a preprocessor has no real constants: " + text(finding.id);
    case VT::CTextObstacle::MemberOfNoName:
        return "only a member of a name is a macro: " + text(finding.id);
    case VT::CTextObstacle::CalledNoName:
        return "only a name is a macro with arguments: " + text(finding.id);
    case VT::CTextObstacle::SharedMacroName:
        return text(finding.id) + " and " + text(finding.other) + " are both written " +
               VT::shownText(VT::PreprocessorVCExpr(table_, false).print(finding.id), shownBytes);
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
