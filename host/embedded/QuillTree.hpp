// The memory of parse trees.
#pragma once

#include "host/embedded/QuillLexer.hpp"

#include <algorithm>
#include <memory>
#include <span>
#include <utility>
#include <vector>

namespace VT::Embedded {

/// A root together with the nodes below it.  Nodes lie in chunks that grow, and never move.
class QuillTree : public QuillNode {
public:
    QuillTree() : QuillNode{} {}

    /// Stores nodes in a row.
    ///
    /// @return the first of them, nullptr for none
    const QuillNode* store(std::span<const QuillNode> nodes) {
        if (nodes.empty())
            return nullptr;
        if (nodes.size() > free_.size())
            grow(nodes.size());
        QuillNode* const first = free_.data();
        std::ranges::copy(nodes, first);
        free_ = free_.subspan(nodes.size());
        return first;
    }

    /// Whether the tree is small enough to be kept for another text.
    bool isReusable() const { return chunkSize_ <= firstChunk; }

    /// Forgets the nodes, but keeps their memory.
    void reuse() {
        if (!chunks_.empty())
            free_ = {chunks_.front().get(), firstChunk};
    }

private:
    static constexpr std::size_t firstChunk = 1024; ///< nodes

    void grow(std::size_t needed) {
        const std::size_t size = std::max(needed, chunks_.empty() ? firstChunk : 2 * chunkSize_);
        chunks_.push_back(std::make_unique_for_overwrite<QuillNode[]>(size));
        chunkSize_ = size;
        free_ = {chunks_.back().get(), size};
    }

    std::vector<std::unique_ptr<QuillNode[]>> chunks_;
    std::size_t chunkSize_ = 0;
    std::span<QuillNode> free_;
};

} // namespace VT::Embedded
