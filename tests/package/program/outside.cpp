// A program outside of the library's tree: sees the installed headers only and links what they declare.
#include <vtsym.hpp>

#include <cstdio>

int main() {
    VT::SymbolicExprTable table;
    table.addBoolSymbols();
    const auto a = VT::SymbolicString(table, "A").getId(table);
    const auto b = VT::SymbolicString(table, "B").getId(table);
    const auto sum = VT::SymbolicPlusExpr(table, a, b).getId(table);
    if (VT::SymbolicPlusExpr(table, a, b).getId(table) != sum || table.size() != 5)
        return 1;
    const VT::SymbolicFcnCall1UExpr call(table, "f", a);
    if (call == VT::SymbolicFcnCallExpr(table, "g", {a}) ||
        VT::SymbolicString(table, "f") != *table.get(call.getInput(0)))
        return 1;
    const VT::VCServiceHandle service;
    if (service->simplifyCExprFromCCondition("A == 1 && A == 2") != "false")
        return 1;
    const std::string sim = VT::VariantKeywords::getSimVariantKeyword();
    if (!VT::VariantKeywords::isSimVariantKeyword(sim, VTFEAT_VariantKeywordsSimCodegen->isOn()))
        return 1;
    try {
        vtsvThrowIExceptionFromDiagnostic(vtsvCreateDiagnostic("Outside:Test", {}, ""));
    } catch (const VT::HostDiagnostic& diagnostic) { // the type's identity crosses the library's border
        std::printf("vtsym %s: %s is a keyword\n", EXPECTED_VERSION, sim.c_str());
        return diagnostic.messageId() == "Outside:Test" ? 0 : 1;
    }
    return 1;
}
