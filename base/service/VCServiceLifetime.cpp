// The service of the process: made by its first user, destroyed with its last one.
//
// A handle keeps the number of the service that it counted on, so that it never counts down a later one.
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"
#include "base/variants/Features.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <utility>

namespace VT {

namespace {

VCService* instance = nullptr; ///< never destroyed at exit: its customizer may be gone by then
std::uint64_t generation = 0;  ///< of the latest service

} // namespace

ServiceParts::ServiceParts()
    : cParser(table, true, true),
      quillParser(table, checker),
      registry(table),
      simplifier(table),
      keywordFlag(isVariantKeywordsSimCodegenFeatureOn()),
      toC(table),
      toQuill(table),
      quillPrinter(table, true, true),
      cPrinter(table, false, true),
      assumptions(table),
      caching(cacheSymExprSimplifyResultsFeature().isOn()) {
    table.addBoolSymbols();
    addSimCodegenVariantKeywordSymbols();
}

void ServiceParts::addSimCodegenVariantKeywordSymbols() {
    const SymbolicString sim(table, VariantKeywords::getSimVariantKeyword());
    const SymbolicString codegen(table, VariantKeywords::getCodegenVariantKeyword());
}

VCService::VCService() : parts_(std::make_unique<ServiceParts>()) {}

VCService::~VCService() = default;

VCService& VCService::getInstance() {
    if (instance == nullptr) {
        instance = new VCService;
        ++generation;
    }
    return *instance;
}

void VCService::clean() {
    if (instance == nullptr || --instance->parts_->useCount > 0)
        return;
    // A customizer that calls in while it is released meets a new service, not this one.
    const VCService* const last = instance;
    instance = nullptr;
    delete last;
}

void VCService::setVCCustomizer(VCCustomizer* customizer) {
    if (customizer == parts_->customizer.get())
        return;
    decltype(parts_->customizer) previous(customizer);
    previous.swap(parts_->customizer);
    parts_->customized = true;
}

VCServiceHandle::VCServiceHandle() {
    ++VCService::getInstance().parts_->useCount;
    generation_ = generation;
}

VCServiceHandle::VCServiceHandle(const VCServiceHandle&) : VCServiceHandle() {}

VCServiceHandle& VCServiceHandle::operator=(const VCServiceHandle& other) {
    VCServiceHandle copy(other);
    std::swap(generation_, copy.generation_);
    return *this;
}

VCServiceHandle::~VCServiceHandle() {
    if (instance != nullptr && generation == generation_)
        VCService::clean();
}

VCService& VCServiceHandle::operator*() const {
    return VCService::getInstance();
}

VCService* VCServiceHandle::operator->() const {
    return &VCService::getInstance();
}

} // namespace VT
