// Writes the operands of reasons one by one, each in the language of the answer.
#include "tools/vtsym/answers/ReasonText.hpp"

#include "tools/vtsym/io/Json.hpp"

namespace vtsym {

std::string reasonsText(const Conditions& conditions, const TextOptions& options, const VT::Reasons& reasons) {
    std::string text;
    for (const VT::SymbolicExprId operand : reasons.operands)
        text.append(text.empty() ? "" : ", ").append(conditions.print(options, operand));
    return text;
}

std::string reasonsJson(const Conditions& conditions, const TextOptions& options, const VT::Reasons& reasons) {
    std::string json;
    for (const VT::SymbolicExprId operand : reasons.operands)
        json.append(json.empty() ? "" : ",").append(jsonString(conditions.print(options, operand)));
    return "[" + json + "]";
}

void appendReasons(const Conditions& conditions, const TextOptions& options, const VT::ShorteningReasons& reasons,
                   std::string& out) {
    if (!reasons.because.operands.empty())
        out.append("; because: ").append(reasonsText(conditions, options, reasons.because));
    for (const VT::LostOperand& lost : reasons.lost) {
        const std::string facts = reasonsText(conditions, options, lost.because);
        out.append("; without ").append(conditions.print(options, lost.operand));
        out.append(": ").append(facts.empty() ? "the rest" : facts);
    }
}

void appendReasonsJson(const Conditions& conditions, const TextOptions& options, const VT::ShorteningReasons& reasons,
                       std::string& out) {
    appendMember(out, "because", reasonsJson(conditions, options, reasons.because));
    std::string lost;
    for (const VT::LostOperand& each : reasons.lost) {
        lost.append(lost.empty() ? "{" : ",{").append("\"operand\":");
        lost.append(jsonString(conditions.print(options, each.operand)));
        appendMember(lost, "because", reasonsJson(conditions, options, each.because));
        lost.push_back('}');
    }
    appendMember(out, "lost", "[" + lost + "]");
}

} // namespace vtsym
