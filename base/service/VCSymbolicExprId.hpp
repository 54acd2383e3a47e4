// The identifier of a condition of the service.
#pragma once

#include "base/core/Node.hpp"

namespace VT {

/// The identifier of a condition in the service's table; means nothing once that service was destroyed.
class VTSYM_API VCSymbolicExprId {
public:
    /// No condition.
    VCSymbolicExprId() = default;

    /// Every identifier of the service's table is a condition.
    VCSymbolicExprId(SymbolicExprId id) : id_(id) {} // NOLINT(google-explicit-constructor)

    [[nodiscard]] SymbolicExprId id() const noexcept { return id_; }

    /// Whether two conditions mean the same to the current service: VCService::isEqual().
    [[nodiscard]] bool operator==(const VCSymbolicExprId& other) const;

private:
    SymbolicExprId id_ = invalidId;
};

// A plain identifier is compared as a number, without asking the service.
[[nodiscard]] inline bool operator==(SymbolicExprId left, const VCSymbolicExprId& right) {
    return left == right.id();
}

[[nodiscard]] inline bool operator==(const VCSymbolicExprId& left, SymbolicExprId right) {
    return left.id() == right;
}

[[nodiscard]] inline bool operator!=(SymbolicExprId left, const VCSymbolicExprId& right) {
    return !(left == right);
}

[[nodiscard]] inline bool operator!=(const VCSymbolicExprId& left, SymbolicExprId right) {
    return !(left == right);
}

} // namespace VT
