// Conditions of blocks and ports: texts, keywords, errors, depth.
#include "base/choices/BlockConditions.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/core/Table.hpp"
#include "base/simplify/Simplify.hpp"
#include "host/Diagnostics.hpp"
#include "host/embedded/ModelFile.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"

#include <array>
#include <gtest/gtest.h>
#include <stdexcept>

namespace VT::Testing {
namespace {

TEST(BlockConditions, AreThoseOfTheBlockAndAllAroundItAsACustomizerSaysThere) {
    VTRootBD root;
    std::string model;
    for (const CaseRow& row : casesOf("service.txt", "model of the blocks", 1))
        model += row[0];
    Embedded::readModel(model, root);
    TestCustomizer customizer; // outlives the service
    const FreshService service;
    const VTBlock* const engine = root.find("Engine");
    customizer.onParameter = [&](const VTBlock* block, const std::string& name) -> std::optional<ParameterReplacement> {
        EXPECT_NE(name, "(sim)");
        if (name == "P")
            return block == engine ? ParameterReplacement("Power") : ParameterReplacement(-5);
        if (name == "F" && block == root.find("Engine/Petrol"))
            return "Fuel";
        return std::nullopt;
    };
    for (const CaseRow& row : casesOf("service.txt", "blocks", 4)) {
        SCOPED_TRACE(row[0]);
        const VTBlock* const block = root.find(row[0]);
        ASSERT_NE(block, nullptr);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, false), row[1]);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, true), row[2]);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, true, nullptr), row[2]);
        EXPECT_EQ(service->printCExpr(service->getQExprNetAAVCEIdx(block, false)), row[1]);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, false, &customizer), row[3]);
        EXPECT_EQ(service->printCExpr(service->getQExprNetAAVCEIdx(block, false, &customizer)), row[3]);
    }
    EXPECT_EQ(service->getQExprNetAAVCEString(root.find("Engine/Other"), true), "F~=1 && F~=2 && P>0");
    EXPECT_EQ(service->getCExprNetAAVCEString(&root.ports()[0], true), "F==1 && P>0");
    EXPECT_EQ(service->getQExprNetAAVCEString(&root.ports()[1], true, &customizer), "Fuel==1 && Power>0");
    EXPECT_EQ(service->getQExprNetAAVCEString(&root.ports()[1], true), "F==1 && P>0 || F==2 && P>0");
    EXPECT_EQ(service->getCExprNetAAVCEString(&root.ports()[2], true), "F==1 && P>0");
    EXPECT_EQ(service->getQExprNetAAVCEIdx(static_cast<const VTBlock*>(nullptr), true), invalidId);
    EXPECT_THROW(service->getQExprNetAAVCEIdx(root.find("Bad"), false), HostDiagnostic);
    EXPECT_EQ(root.find("Engine/Filter"), nullptr);
    EXPECT_EQ(customizer.rewrites, 0) << "it is not installed";

    const SymbolicExprId condition = service->parseC("P > 0 && F == 1 && (sim) && true && f(S.F) && P(1)");
    service->addParameterAlias(root.find("Engine/Petrol"), condition, nullptr);
    EXPECT_EQ(service->getParameterAlias("P"), "");
    service->addParameterAlias(root.find("Engine/Petrol"), condition, &customizer);
    EXPECT_EQ(service->getParameterAlias("P"), "(-5)");
    EXPECT_EQ(service->getParameterAlias("F"), "Fuel");
    EXPECT_EQ(service->getParameterAlias("f"), "");
    service->addParameterAlias(engine, condition, &customizer);
    EXPECT_EQ(service->getParameterAlias("P"), "(-5)") << "the first one stays";
    service->addParameterAlias(engine, invalidId, &customizer);
    customizer.onParameter = [](const VTBlock* block, const std::string&) -> std::optional<ParameterReplacement> {
        EXPECT_EQ(block, nullptr);
        throw std::domain_error("no");
    };
    EXPECT_THROW(service->addParameterAlias(nullptr, condition, &customizer), std::domain_error);
    EXPECT_EQ(service->printCExpr(condition), "P>0 && F==1 && (sim) && true && f(S.F) && P(1)");
}

TEST(ChoiceSets, KeywordsAreInForceWhereTheyWereWhenTheServiceWasMade) {
    for (const bool keywords : {true, false}) {
        const FlagSetting before(*VTFEAT_VariantKeywordsSimCodegen, keywords ? 2 : 0);
        const FreshService service;
        for (const bool now : {true, false}) {
            const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, now ? 2 : 0);
            const bool inForce = keywords && now;
            EXPECT_EQ(service->areVariantKeywordsInForce(), inForce);
            service->simplifier().setKeywordsFlag(true);
            const std::array<SymbolicExprId, 2> choices{service->parseC("(sim)"), service->parseC("(codegen)")};
            const ChoiceSetReport report = ChoiceSetChecker(*service).check(service->parseC(""), choices);
            EXPECT_EQ(report.findings.empty(), inForce) << keywords << now;
            EXPECT_EQ(service->isDisjoint(choices[0], choices[1]).isYes(), inForce);
            EXPECT_EQ(service->covers({choices[0], choices[1]}).isYes(), inForce);
        }
    }
}

TEST(BlockConditions, NeedNoStack) {
    VTRootBD root;
    VTBlock* block = nullptr;
    for (int i = 0; i < 100'000; ++i) {
        block = &root.addBlock(block, false);
        root.nameBlock(*block, "b");
        block->setVariantCondition("A != " + std::to_string(i));
    }
    const VCServiceHandle service;
    EXPECT_EQ(service->getCExprNetAAVCEString(block, false).size(), 100'000 * 7 + 488'890 - 4);
    BlockConditions conditions(*service);
    const std::size_t before = service->table().size();
    const SymbolicExprId net = conditions.net(*block).id();
    EXPECT_EQ(service->table().size(), before); // the same nodes
    EXPECT_EQ(conditions.net(*block->parent()).id(), service->table().get(net)->getInput(0));
}

} // namespace
} // namespace VT::Testing
