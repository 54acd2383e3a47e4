// A feature flag with another value for as long as a test needs it.
#pragma once

#include "host/Feature.hpp"

namespace VT::Testing {

class FlagSetting {
public:
    FlagSetting(VtFeature& flag, std::int32_t value) : flag_(flag), before_(flag.value()) { flag.setValue(value); }

    FlagSetting(const FlagSetting&) = delete;
    FlagSetting& operator=(const FlagSetting&) = delete;

    ~FlagSetting() { flag_.setValue(before_); }

private:
    VtFeature& flag_;
    std::int32_t before_;
};

} // namespace VT::Testing
