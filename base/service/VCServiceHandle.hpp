// A user of the service.
#pragma once

#include "host/Export.hpp"

#include <cstdint>

namespace VT {

class VCService;

/// Counts a user of the service while it lives, so that the service lives as long.  A copy is a further user.
class VTSYM_API VCServiceHandle {
public:
    /// Makes the service if there is no service yet.
    VCServiceHandle();
    VCServiceHandle(const VCServiceHandle&);
    VCServiceHandle& operator=(const VCServiceHandle& other);
    /// Calls VCService::clean(), unless the service that was counted on is gone already.
    ~VCServiceHandle();

    VCService& operator*() const;
    VCService* operator->() const;

private:
    std::uint64_t generation_; ///< number of the service that was counted on
};

} // namespace VT
