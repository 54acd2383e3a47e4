// The service's cache of decisions about pairs.
#pragma once

#include "base/decide/Decision.hpp"

#include <boost/container_hash/hash.hpp>
#include <boost/unordered_map.hpp>

#include <cstdint>

namespace VT {

/// A question about two conditions; every question about a pair is one of these or its opposite.
enum class PairQuestion : std::uint8_t {
    FirstAlone, ///< the first can hold without the second
    Both,       ///< they can hold together
    Differ,     ///< one can hold without the other
};

/// Decisions by question.  Only grows: decisions stay right.  O(1) on average.
class DecisionCache {
public:
    struct Key {
        SymbolicExprId a;
        SymbolicExprId b;
        SymbolicExprId known; ///< the And of the assumptions used
        PairQuestion question;
        unsigned mode; ///< of the decider: ServiceParts::decisionMode()
        bool operator==(const Key&) const = default;

        friend std::size_t hash_value(const Key& key) noexcept {
            std::size_t seed = 0;
            boost::hash_combine(seed, key.a);
            boost::hash_combine(seed, key.b);
            boost::hash_combine(seed, key.known);
            boost::hash_combine(seed, static_cast<unsigned>(key.question) * 4 + key.mode);
            return seed;
        }
    };

    /// The decision of a key, or nullptr.  Valid until the next insertion.
    [[nodiscard]] const Decision* find(const Key& key) const {
        const auto entry = decisions_.find(key);
        return entry == decisions_.end() ? nullptr : &entry->second;
    }

    /// Keeps a decision.  When memory runs out the cache is as before.
    void insert(const Key& key, const Decision& decision) { decisions_.emplace(key, decision); }

private:
    boost::unordered_map<Key, Decision> decisions_;
};

} // namespace VT
