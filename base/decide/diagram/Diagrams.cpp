// Implements reduced ordered decision diagrams with interval edges and complemented references.
//
// Method: the apply algorithm (Bryant, "Graph-based algorithms for Boolean function manipulation", 1986) on an explicit
// stack, a unique table with open addressing, and a memo of pairs that a new question invalidates by counting. The
// first edge of a node is never complemented, which makes references canonical.
//
// Cost: one step for each edge that is joined; 16 bytes for each edge and 16 for each node that is kept.
#include "base/decide/diagram/Diagrams.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr std::size_t firstSlots = 64;

/// The slot for a hash: its upper half is the well mixed one.
std::size_t slotFor(std::uint64_t hash, std::size_t slots) noexcept {
    return static_cast<std::size_t>(hash >> 32U) & (slots - 1);
}

} // namespace

Diagrams::Diagrams(Steps& steps) : steps_(steps) {
    begin({});
}

void Diagrams::begin(std::span<const LevelInfo> levels) {
    const auto reset = [](auto& slots) { // memory that one large question needed is not kept for the small ones
        if (slots.size() > limits::keptSlots)
            std::remove_reference_t<decltype(slots)>(firstSlots).swap(slots);
    };
    reset(index_);
    reset(known_);
    nodes_.assign(1, {noLevel, 0, 0, false});
    edges_.clear();
    std::ranges::fill(index_, 0);
    index_.resize(std::max(index_.size(), firstSlots));
    known_.resize(std::max(known_.size(), firstSlots));
    levels_ = levels;
    frames_.clear();
    scratch_.clear();
    knownCount_ = 0;
    if (++question_ == 0) {
        std::ranges::fill(known_, Known{});
        question_ = 1;
    }
}

Diagram Diagrams::of(const Question& question) {
    begin(question.levels());
    std::vector<Diagram>& made = made_;
    made.clear();
    for (const Question::Node& node : question.nodes()) {
        if (question.isComparison(node)) {
            made.push_back(comparison(node.level, question.ends(node)));
            continue;
        }
        row_.clear();
        for (const Gate operand : question.operands(node))
            row_.push_back(made[operand >> 1U] ^ (operand & 1U));
        made.push_back(all(row_));
    }
    return made[question.root() >> 1U] ^ (question.root() & 1U);
}

// Nodes.

Diagram Diagrams::comparison(Level level, std::span<const std::int64_t> ends) {
    steps_.take(ends.size());
    const std::size_t scratch = scratch_.size();
    Diagram child = always;
    for (const std::int64_t end : ends) {
        append(scratch, end, child);
        child = opposite(child);
    }
    append(scratch, plusInfinite, child);
    return make(level, scratch);
}

/// Adds an edge to those from `scratch` on.
void Diagrams::append(std::size_t scratch, std::int64_t high, Diagram child) {
    if (scratch_.size() > scratch && scratch_.back().child == child)
        scratch_.back().high = high;
    else
        scratch_.push_back({high, child});
}

/// Whether the edges from `scratch` on are those of a node: in order, up to infinity, no two neighbours alike, and
/// children that branch on later levels.
[[maybe_unused]] bool Diagrams::isReduced(Level level, std::size_t scratch) const {
    for (std::size_t i = scratch; i < scratch_.size(); ++i) {
        const Edge& edge = scratch_[i];
        const bool follows = i == scratch || (scratch_[i - 1].high < edge.high && scratch_[i - 1].child != edge.child);
        const bool below = level < this->level(edge.child);
        if (!follows || !below)
            return false;
    }
    return scratch_.back().high == plusInfinite;
}

/// The node with the edges from `scratch` on, which are taken away.
Diagram Diagrams::make(Level level, std::size_t scratch) {
    const Diagram flip = scratch_[scratch].child & 1U; // the first edge of a node is never negated
    const std::size_t count = scratch_.size() - scratch;
    if (count == 1) {
        const Diagram only = scratch_[scratch].child;
        scratch_.resize(scratch);
        return only;
    }
    VTSYM_CHECK(isReduced(level, scratch));
    std::uint64_t hash = hashStep(0, level); // levels and bounds often grow together
    for (std::size_t i = scratch; i < scratch_.size(); ++i) {
        scratch_[i].child ^= flip;
        hash = hashStep(hashStep(hash, static_cast<std::uint64_t>(scratch_[i].high)), scratch_[i].child);
    }
    if ((nodes_.size() + 1) * 2 > index_.size())
        growIndex();
    const std::size_t mask = index_.size() - 1;
    std::size_t at = slotFor(hash, index_.size());
    const auto fresh = scratch_.begin() + static_cast<std::ptrdiff_t>(scratch);
    for (; index_[at] != 0; at = (at + 1) & mask, ++probes_) {
        const Node& node = nodes_[index_[at]];
        if (node.level == level && node.count == count &&
            std::equal(fresh, scratch_.end(), edges_.begin() + static_cast<std::ptrdiff_t>(node.first))) {
            scratch_.resize(scratch);
            return index_[at] * 2 + flip;
        }
    }
    bool needsChecking = levels_[level].isChecked;
    for (auto edge = fresh; edge != scratch_.end(); ++edge)
        needsChecking = needsChecking || this->needsChecking(edge->child);
    const auto number = static_cast<std::uint32_t>(nodes_.size());
    const auto first = static_cast<std::uint32_t>(edges_.size());
    for (auto edge = fresh; edge != scratch_.end(); ++edge) // two or three, as a rule
        edges_.push_back(*edge);
    nodes_.push_back({level, first, static_cast<std::uint32_t>(count), needsChecking});
    index_[at] = number;
    scratch_.resize(scratch);
    return number * 2 + flip;
}

void Diagrams::growIndex() {
    std::vector<std::uint32_t> old(index_.size() * 2, 0);
    old.swap(index_);
    const std::size_t mask = index_.size() - 1;
    for (std::uint32_t number = 1; number < nodes_.size(); ++number) {
        const Node& node = nodes_[number];
        std::uint64_t hash = hashStep(0, node.level);
        for (std::uint32_t i = 0; i < node.count; ++i) {
            const Edge& edge = edges_[node.first + i];
            hash = hashStep(hashStep(hash, static_cast<std::uint64_t>(edge.high)), edge.child);
        }
        std::size_t at = slotFor(hash, index_.size());
        while (index_[at] != 0)
            at = (at + 1) & mask;
        index_[at] = number;
    }
}

std::size_t Diagrams::edgeOf(Diagram diagram, std::int64_t value) const {
    const Node& node = nodes_[diagram >> 1U];
    const auto first = edges_.begin() + static_cast<std::ptrdiff_t>(node.first);
    const auto at = std::lower_bound(first, first + node.count, value,
                                     [](const Edge& edge, std::int64_t sought) { return edge.high < sought; });
    return static_cast<std::size_t>(at - first);
}

// And.

Diagrams::Known& Diagrams::slotOf(Diagram a, Diagram b) {
    const std::size_t mask = known_.size() - 1;
    std::size_t at = slotFor(hashStep(hashStep(0, a), b), known_.size());
    while (known_[at].question == question_ && (known_[at].a != a || known_[at].b != b))
        at = (at + 1) & mask;
    return known_[at];
}

void Diagrams::remember(Diagram a, Diagram b, Diagram result) {
    if ((knownCount_ + 1) * 2 > known_.size()) {
        std::vector<Known> old(known_.size() * 2);
        old.swap(known_);
        for (const Known& entry : old)
            if (entry.question == question_)
                slotOf(entry.a, entry.b) = entry;
    }
    slotOf(a, b) = {a, b, result, question_};
    ++knownCount_;
}

/// What needs no walk; false where the edges have to be joined.
bool Diagrams::resolve(Diagram a, Diagram b, Diagram& result) {
    if (a == b || b == always)
        result = a;
    else if (a == always)
        result = b;
    else if (a == never || b == never || a == opposite(b))
        result = never;
    else {
        const Known& known = slotOf(std::min(a, b), std::max(a, b));
        if (known.question != question_)
            return false;
        result = known.result;
    }
    return true;
}

void Diagrams::enter(Diagram a, Diagram b) {
    if (a > b)
        std::swap(a, b);
    const Level levelA = level(a);
    const Level levelB = level(b);
    const bool inA = levelA <= levelB;
    const bool inB = levelB <= levelA;
    frames_.push_back({a, b, std::min(levelA, levelB), inA ? 0 : none, inB ? 0 : none,
                       static_cast<std::uint32_t>(scratch_.size()), 0});
}

Diagram Diagrams::both(Diagram a, Diagram b) {
    Diagram result = never;
    if (resolve(a, b, result))
        return result;
    const std::size_t bottom = frames_.size();
    enter(a, b);
    bool returned = false; // whether `result` is what the top frame waits for
    for (;;) {
        Frame& frame = frames_.back();
        if (returned)
            append(frame.scratch, frame.high, result);
        if (returned && frame.high == plusInfinite) {
            result = make(frame.level, frame.scratch);
            remember(frame.a, frame.b, result);
            frames_.pop_back();
            if (frames_.size() == bottom) {
                VTSYM_CHECK(bottom != 0 || scratch_.empty());
                return result;
            }
            continue;
        }
        steps_.take();
        Edge edgeA{plusInfinite, frame.a};
        Edge edgeB{plusInfinite, frame.b};
        if (frame.nextA != none)
            edgeA = edge(frame.a, frame.nextA);
        if (frame.nextB != none)
            edgeB = edge(frame.b, frame.nextB);
        frame.high = std::min(edgeA.high, edgeB.high);
        if (frame.nextA != none && edgeA.high == frame.high)
            ++frame.nextA;
        if (frame.nextB != none && edgeB.high == frame.high)
            ++frame.nextB;
        returned = resolve(edgeA.child, edgeB.child, result);
        if (!returned)
            enter(edgeA.child, edgeB.child);
    }
}

Diagram Diagrams::all(std::vector<Diagram>& diagrams) {
    while (diagrams.size() > 1) {
        for (std::size_t i = 0; i + 1 < diagrams.size(); i += 2)
            diagrams[i / 2] = both(diagrams[i], diagrams[i + 1]);
        if (diagrams.size() % 2 != 0)
            diagrams[diagrams.size() / 2] = diagrams.back();
        diagrams.resize((diagrams.size() + 1) / 2);
    }
    return diagrams.empty() ? always : diagrams.front();
}

} // namespace VT
