#include "benchmarks/floors/FlatMinimiser.hpp"

#include <algorithm>
#include <numeric>
#include <stdexcept>

namespace Floor {

namespace {

bool holds(Kind kind, std::int64_t left, std::int64_t right) {
    switch (kind) {
    case Kind::Equal:
        return left == right;
    case Kind::NotEqual:
        return left != right;
    case Kind::Less:
        return left < right;
    case Kind::LessEqual:
        return left <= right;
    case Kind::Greater:
        return left > right;
    default:
        return left >= right;
    }
}

bool test(const std::vector<std::uint64_t>& bits, std::size_t at) {
    return (bits[at / 64] >> at % 64 & 1U) != 0;
}

} // namespace

std::uint32_t FlatMinimiser::run(std::uint32_t condition) {
    names_ = 0;
    comparisons_ = 0;
    collect(condition);
    layOut();
    holds_.assign((points_ + 63) / 64, 0);
    evaluate(condition, holds_);
    covers_.assign(points_, 0);
    boxes_.clear();
    for (std::size_t at = 0; at < points_; ++at)
        if (test(holds_, at) && covers_[at] == 0) {
            boxes_.push_back(grown(at));
            mark(boxes_.back(), 1);
        }
    for (std::size_t i = boxes_.size(); i-- > 0;)
        if (boxes_.size() > 1 && isCovered(boxes_[i])) {
            mark(boxes_[i], -1);
            boxes_.erase(boxes_.begin() + static_cast<std::ptrdiff_t>(i));
        }
    if (boxes_.empty())
        return none;
    std::uint32_t sum = none;
    for (const Box& box : boxes_) {
        const std::uint32_t product = written(box);
        if (product == everything())
            return everything();
        sum = sum == none ? product : table_.intern(Kind::Or, sum, product);
    }
    return sum;
}

// NOLINTBEGIN(misc-no-recursion): as deep as the conditions that are measured

void FlatMinimiser::collect(std::uint32_t id) {
    const Record record = table_[id];
    switch (record.kind) {
    case Kind::And:
    case Kind::Or:
        collect(record.left);
        return collect(record.right);
    case Kind::Not:
        return collect(record.left);
    default: {
        const bool swapped = table_[record.left].kind == Kind::Integer;
        Axis& axis = axes_[axisOf(swapped ? record.right : record.left)];
        axis.cuts.push_back(static_cast<std::int32_t>(table_[swapped ? record.left : record.right].left));
    }
    }
}

void FlatMinimiser::evaluate(std::uint32_t id, Bits& bits) {
    const Record record = table_[id];
    switch (record.kind) {
    case Kind::And:
    case Kind::Or: {
        evaluate(record.left, bits);
        Bits right;
        if (!spare_.empty()) {
            right.swap(spare_.back());
            spare_.pop_back();
        }
        right.assign(bits.size(), 0);
        evaluate(record.right, right);
        for (std::size_t i = 0; i < bits.size(); ++i)
            bits[i] = record.kind == Kind::And ? bits[i] & right[i] : bits[i] | right[i];
        spare_.push_back(std::move(right));
        return;
    }
    case Kind::Not:
        evaluate(record.left, bits);
        for (std::uint64_t& word : bits)
            word = ~word;
        return;
    default:
        return compare(record, bits);
    }
}

// NOLINTEND(misc-no-recursion)

std::size_t FlatMinimiser::axisOf(std::uint32_t name) {
    for (std::size_t i = 0; i < names_; ++i)
        if (axes_[i].name == name)
            return i;
    if (table_[name].kind != Kind::Name || names_ == mostNames)
        throw std::invalid_argument("the floor knows comparisons of few names with integers alone");
    axes_[names_].name = name;
    axes_[names_].cuts.clear();
    return names_++;
}

void FlatMinimiser::layOut() {
    points_ = 1;
    for (std::size_t i = 0; i < names_; ++i) {
        Axis& axis = axes_[i];
        std::ranges::sort(axis.cuts);
        axis.cells.clear();
        for (const std::int64_t cut : axis.cuts) {
            const bool isFirst = axis.cells.empty();
            if (!isFirst && axis.cells.back().value == cut)
                continue;
            if (isFirst || axis.cells.back().value < cut - 1)
                axis.cells.push_back({cut - 1, false});
            axis.cells.push_back({cut, true});
        }
        axis.cells.push_back({axis.cells.back().value + 1, false});
        axis.stride = static_cast<std::uint32_t>(points_);
        points_ *= axis.cells.size();
    }
}

void FlatMinimiser::compare(const Record& record, Bits& bits) const {
    const bool swapped = table_[record.left].kind == Kind::Integer;
    const std::uint32_t name = swapped ? record.right : record.left;
    const auto constant = static_cast<std::int32_t>(table_[swapped ? record.left : record.right].left);
    std::size_t at = 0;
    while (axes_[at].name != name)
        ++at;
    const Axis& axis = axes_[at];
    std::ranges::fill(bits, 0);
    for (std::size_t cell = 0; cell < axis.cells.size(); ++cell) {
        const std::int64_t value = axis.cells[cell].value;
        if (swapped ? holds(record.kind, constant, value) : holds(record.kind, value, constant))
            for (std::size_t first = cell * axis.stride; first < points_; first += axis.cells.size() * axis.stride)
                for (std::size_t point = first; point < first + axis.stride; ++point)
                    bits[point / 64] |= std::uint64_t{1} << point % 64;
    }
}

/// Calls `use(point)` for each combination in a box until it returns false; whether it never did.
template <class Use>
bool FlatMinimiser::eachRow(const Box& box, Use use) const {
    std::array<std::uint32_t, mostNames> at = box.low;
    std::size_t point = 0;
    for (std::size_t i = 0; i < names_; ++i)
        point += std::size_t{at[i]} * axes_[i].stride;
    while (true) {
        if (!use(point))
            return false;
        std::size_t i = 0;
        for (; i < names_; ++i) {
            if (at[i] < box.high[i]) {
                ++at[i];
                point += axes_[i].stride;
                break;
            }
            point -= std::size_t{box.high[i] - box.low[i]} * axes_[i].stride;
            at[i] = box.low[i];
        }
        if (i == names_)
            return true;
    }
}

bool FlatMinimiser::isIn(const Bits& bits, const Box& box) const {
    return eachRow(box, [&](std::size_t point) { return test(bits, point); });
}

FlatMinimiser::Box FlatMinimiser::grown(std::size_t at) const {
    Box start;
    for (std::size_t i = 0; i < names_; ++i)
        start.low[i] = start.high[i] = static_cast<std::uint32_t>(at / axes_[i].stride % axes_[i].cells.size());
    Box best;
    std::array<std::size_t, mostNames> order{};
    std::iota(order.begin(), order.end(), std::size_t{0});
    const auto last = order.begin() + static_cast<std::ptrdiff_t>(names_);
    do {
        Box box = start;
        for (auto each = order.begin(); each != last; ++each) {
            const std::size_t i = *each;
            Box edge = box;
            while (box.high[i] + 1 < axes_[i].cells.size()) {
                edge.low[i] = edge.high[i] = box.high[i] + 1;
                if (!isIn(holds_, edge))
                    break;
                ++box.high[i];
            }
            while (box.low[i] > 0) {
                edge.low[i] = edge.high[i] = box.low[i] - 1;
                if (!isIn(holds_, edge))
                    break;
                --box.low[i];
            }
        }
        box.size = 1;
        for (std::size_t i = 0; i < names_; ++i)
            box.size *= box.high[i] - box.low[i] + 1;
        if (box.size > best.size)
            best = box;
    } while (std::next_permutation(order.begin(), last));
    return best;
}

void FlatMinimiser::mark(const Box& box, int change) {
    eachRow(box, [&](std::size_t point) {
        covers_[point] = static_cast<std::uint8_t>(covers_[point] + change);
        return true;
    });
}

/// Whether other boxes cover all of a box that is marked.
bool FlatMinimiser::isCovered(const Box& box) const {
    return eachRow(box, [&](std::size_t point) { return covers_[point] > 1; });
}

void FlatMinimiser::join(std::uint32_t& product, std::uint32_t comparison) {
    ++comparisons_;
    product = product == everything() ? comparison : table_.intern(Kind::And, product, comparison);
}

std::uint32_t FlatMinimiser::written(const Box& box) {
    std::uint32_t product = everything();
    for (std::size_t i = 0; i < names_; ++i) {
        const Axis& axis = axes_[i];
        const auto joinComparison = [&](Kind kind, std::size_t cell) {
            const auto constant = static_cast<std::int32_t>(axis.cells[cell].value);
            join(product, table_.intern(kind, axis.name, integer(constant)));
        };
        const std::size_t low = box.low[i];
        const std::size_t high = box.high[i];
        if (low == high && axis.cells[low].isCut) {
            joinComparison(Kind::Equal, low);
            continue;
        }
        if (low > 0)
            axis.cells[low].isCut ? joinComparison(Kind::GreaterEqual, low) : joinComparison(Kind::Greater, low - 1);
        if (high + 1 < axis.cells.size())
            axis.cells[high].isCut ? joinComparison(Kind::LessEqual, high) : joinComparison(Kind::Less, high + 1);
    }
    return product;
}

} // namespace Floor
