// Keeps potentials that satisfy all bounds while bounds come and go.
#include "base/decide/search/DifferenceGraph.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Potentials only fall.  Below it the next ones could leave 64 bits; no question is that long.
constexpr std::int64_t lowestPotential = -(std::int64_t{1} << 61U);

} // namespace

void DifferenceGraph::begin(std::size_t vertices) {
    bounds_.clear();
    from_.assign(vertices, {});
    potentials_.assign(vertices, 0);
    lowered_.assign(vertices, {});
    round_ = 0;
}

void DifferenceGraph::shrink(std::size_t size) {
    for (; bounds_.size() > size; bounds_.pop_back())
        from_[bounds_.back().bound.from].pop_back();
}

bool DifferenceGraph::add(const Bound& bound, std::uint32_t name) {
    steps_.take();
    const auto number = static_cast<std::uint32_t>(bounds_.size());
    bounds_.push_back({bound, name});
    from_[bound.from].push_back(number);
    if (potentials_[bound.to] - potentials_[bound.from] <= bound.most)
        return true;
    if (lower(bound))
        return true;
    for (const auto& [vertex, potential] : changed_)
        potentials_[vertex] = potential;
    contradiction_.assign(1, name);
    for (Vertex at = bound.from; at != bound.to;) {
        const Named& because = bounds_[lowered_[at].because];
        contradiction_.push_back(because.name);
        at = because.bound.from;
    }
    shrink(number);
    return false;
}

/// Lowers what has to be lower because of a bound; false where its start is among that.
bool DifferenceGraph::lower(const Bound& bound) {
    ++round_;
    changed_.clear();
    waiting_ = {};
    const auto wait = [&](Vertex vertex, std::int64_t by, std::uint32_t because) {
        lowered_[vertex] = {by, round_, because, false};
        waiting_.emplace(-by, vertex);
    };
    wait(bound.to, potentials_[bound.from] + bound.most - potentials_[bound.to],
         static_cast<std::uint32_t>(bounds_.size() - 1));
    while (!waiting_.empty()) {
        const auto [by, vertex] = waiting_.top();
        waiting_.pop();
        Lowered& current = lowered_[vertex];
        if (current.isDone || current.by != -by)
            continue;
        if (vertex == bound.from)
            return false;
        current.isDone = true;
        changed_.emplace_back(vertex, potentials_[vertex]);
        potentials_[vertex] -= by;
        if (potentials_[vertex] < lowestPotential)
            throw StepsUsedUp{};
        steps_.take(from_[vertex].size() / 4 + 1);
        for (const std::uint32_t number : from_[vertex]) {
            const Bound& next = bounds_[number].bound;
            const std::int64_t gap = potentials_[vertex] + next.most - potentials_[next.to];
            const Lowered& before = lowered_[next.to];
            const bool isMet = before.round == round_;
            if (gap < 0 && !(isMet && (before.isDone || before.by <= gap)))
                wait(next.to, gap, number);
        }
    }
    return true;
}

} // namespace VT
