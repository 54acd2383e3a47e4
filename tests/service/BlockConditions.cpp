// Conditions of blocks and ports: texts, keywords, errors, depth.
#include "base/service/BlockConditions.hpp"
#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "base/service/VCServiceHandle.hpp"
#include "host/Diagnostics.hpp"
#include "host/embedded/ModelFile.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

constexpr const char* model = R"json({"blocks": [
    {"name": "Engine", "condition": "P > 0", "choices": [
        {"name": "Petrol", "condition": "F == 1"},
        {"name": "Diesel", "condition": "F == 2 && P > 0", "blocks": [{"name": "Filter", "condition": "(inherit)"}]},
        {"name": "Other", "condition": " (default) "}]},
    {"name": "Free"},
    {"name": "Sim", "condition": "(sim)"},
    {"name": "Bad", "condition": "F ==="}],
  "ports": [
    {"name": "joined", "from": "Engine/Petrol", "to": ["Free", "Sim"]},
    {"name": "split", "from": "Free", "to": ["Engine/Petrol", "Engine/Diesel"]},
    {"name": "open", "from": "Engine/Petrol"}]})json";

TEST(BlockConditions, AreThoseOfTheBlockAndAllAroundIt) {
    VTRootBD root;
    Embedded::readModel(model, root);
    const VCServiceHandle service;

    struct Row {
        const char* path;
        const char* condition;
        const char* simplified;
    };

    for (const Row& row : std::initializer_list<Row>{
             {"Engine", "P>0", "P>0"},
             {"Engine/Petrol", "P>0 && F==1", "F==1 && P>0"},
             {"Engine/Diesel", "P>0 && (F==2 && P>0)", "F==2 && P>0"},
             {"Engine/Diesel/Filter", "P>0 && (F==2 && P>0)", "F==2 && P>0"},
             {"Engine/Other", "P>0 && !(F==1 || F==2 && P>0)", "F!=1 && F!=2 && P>0"},
             {"Free", "", ""},
             {"Sim", "(sim)", "(sim)"},
         }) {
        SCOPED_TRACE(row.path);
        const VTBlock* const block = root.find(row.path);
        ASSERT_NE(block, nullptr);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, false), row.condition);
        EXPECT_EQ(service->getCExprNetAAVCEString(block, true), row.simplified);
        EXPECT_EQ(service->printCExpr(service->getQExprNetAAVCEIdx(block, false)), row.condition);
    }
    EXPECT_EQ(service->getQExprNetAAVCEString(root.find("Engine/Other"), true), "F~=1 && F~=2 && P>0");
    EXPECT_EQ(service->getCExprNetAAVCEString(&root.ports()[0], true), "F==1 && P>0");
    EXPECT_EQ(service->getQExprNetAAVCEString(&root.ports()[1], true), "F==1 && P>0 || F==2 && P>0");
    EXPECT_EQ(service->getCExprNetAAVCEString(&root.ports()[2], true), "F==1 && P>0");
    EXPECT_EQ(service->getQExprNetAAVCEIdx(static_cast<const VTBlock*>(nullptr), true), invalidId);
    EXPECT_THROW(service->getQExprNetAAVCEIdx(root.find("Bad"), false), HostDiagnostic);
    EXPECT_EQ(root.find("Engine/Filter"), nullptr);
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
