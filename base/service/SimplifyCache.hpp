// The service's cache of finished simplifications.
#pragma once

#include "base/core/Node.hpp"

#include <boost/unordered_map.hpp>

#include <functional>

namespace VT {

/// Simplified conditions, or their texts, by condition or by text.  Only grows: identifiers are never reused and nodes
/// never change, so results stay right, except where a customizer, a flag or a value bound to a member changes.  O(1)
/// on average.
template <class Key, class Result = SymbolicExprId>
class SimplifyCache {
public:
    /// The result of a key, or nullptr.  Valid as long as the cache.
    [[nodiscard]] const Result* find(const Key& key) const {
        const auto entry = results_.find(key);
        return entry == results_.end() ? nullptr : &entry->second;
    }

    /// Keeps a result unless there is one.  When memory runs out the cache is as before.
    void insert(const Key& key, const Result& result) { results_.emplace(key, result); }

private:
    boost::unordered_map<Key, Result, std::hash<Key>> results_;
};

} // namespace VT
