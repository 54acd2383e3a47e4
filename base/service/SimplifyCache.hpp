// The service's cache of finished simplifications.
#pragma once

#include "base/core/Node.hpp"

#include <boost/unordered_map.hpp>

#include <optional>

namespace VT {

/// Simplified conditions by condition or by text.  Only grows: identifiers are never reused and nodes never change, so
/// results stay right, except where a customizer, a flag or a value bound to a member changes.  O(1) on average.
template <class Key>
class SimplifyCache {
public:
    [[nodiscard]] std::optional<SymbolicExprId> find(const Key& key) const {
        const auto entry = results_.find(key);
        return entry == results_.end() ? std::nullopt : std::optional(entry->second);
    }

    /// Keeps a result unless there is one.  When memory runs out the cache is as before.
    void insert(const Key& key, SymbolicExprId result) { results_.emplace(key, result); }

private:
    boost::unordered_map<Key, SymbolicExprId> results_;
};

} // namespace VT
