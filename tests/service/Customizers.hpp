// Services and customizers for the tests.
#pragma once

#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "base/simplify/VCCustomizer.hpp"
#include "base/variants/Features.hpp"
#include "tests/support/FlagSetting.hpp"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace VT::Testing {

/// A service that nobody has used, made under a setting of the cache feature; gone with this object.
class FreshService {
public:
    explicit FreshService(bool caching = true) : caching_(cacheSymExprSimplifyResultsFeature(), caching ? 1 : 0) {
        VCService::clean();
        VCService::getInstance();
    }

    FreshService(const FreshService&) = delete;
    FreshService& operator=(const FreshService&) = delete;

    ~FreshService() { VCService::clean(); }

    VCService* operator->() const { return &VCService::getInstance(); }

    VCService& operator*() const { return VCService::getInstance(); }

private:
    FlagSetting caching_;
};

/// Does what its functions say and takes note of its arguments.
class TestCustomizer : public VCCustomizer {
public:
    void release() noexcept override {
        ++releases;
        if (onRelease)
            onRelease();
    }

    SymbolicExprId rewrite(SymbolicExprId condition, SymbolicExprTable& table) override {
        ++rewrites;
        return onRewrite ? onRewrite(condition, table) : condition;
    }

    bool canReplaceCondition(const std::string& condition, const std::string& replacement) override {
        questions.emplace_back(condition, replacement);
        return agrees;
    }

    ParameterReplacements parameterReplacements() override { return parameters; }

    std::optional<ParameterReplacement> parameterOfBlock(const VTBlock* block,
                                                         const std::string& parameter) const override {
        return onParameter ? onParameter(block, parameter) : std::nullopt;
    }

    ParameterReplacements parameters;
    std::function<std::optional<ParameterReplacement>(const VTBlock*, const std::string&)> onParameter;
    std::function<void()> onRelease;
    std::function<SymbolicExprId(SymbolicExprId, SymbolicExprTable&)> onRewrite;
    bool agrees = true;
    int releases = 0;
    int rewrites = 0;
    std::vector<std::pair<std::string, std::string>> questions;
};

} // namespace VT::Testing
