// The embedded host's model, and the host services that the library asks about it.
//
// Blocks are owned in the order of addition, so that a parent comes before its blocks.  A hash map from parent and name
// to block serves paths: find() is linear in the path.
#include "host/embedded/EmbeddedModel.hpp"

#include "host/Text.hpp"

namespace {

constexpr std::size_t shownNames = 8; ///< of a path
constexpr std::size_t shownNameBytes = 80;

} // namespace

std::string VTBlock::path() const {
    std::vector<const VTBlock*> blocks; // the innermost first
    const VTBlock* block = this;
    for (; block != nullptr && blocks.size() < shownNames; block = block->parent_)
        blocks.push_back(block);
    std::string path = block != nullptr ? "..." : "";
    for (; !blocks.empty(); blocks.pop_back())
        path.append(path.empty() ? "" : "/").append(VT::shownText(blocks.back()->name_, shownNameBytes));
    return path;
}

void VTBlock::setVariantCondition(std::string condition, const VT::Embedded::TextPlace& place) {
    condition_ = std::move(condition);
    conditionPlace_ = place;
}

VTBlock& VTRootBD::addBlock(VTBlock* parent, bool isChoice) {
    blocks_.push_back(VTBlock(*this, parent, isChoice));
    VTBlock& block = blocks_.back();
    if (isChoice && parent != nullptr) {
        try {
            parent->choices_.push_back(&block);
        } catch (...) {
            blocks_.pop_back();
            throw;
        }
    }
    return block;
}

std::string VTRootBD::nameBlock(VTBlock& block, std::string name, const VT::Embedded::TextPlace& place) {
    if (name.empty())
        return "a name is empty: write one";
    if (name.find('/') != std::string::npos)
        return "a name holds \"/\", which separates the names of a path: write another character";
    if (const auto same = named_.find({block.parent_, name}); same != named_.end() && same->second != &block)
        return "there is another " + VT::shownText(name, shownNameBytes) +
               " beside this one: give one of them another name";
    named_.erase({block.parent_, block.name_});
    block.name_ = std::move(name);
    block.namePlace_ = place;
    named_.insert_or_assign(Key{block.parent_, block.name_}, &block);
    return {};
}

void VTRootBD::addPort(vtPort port) {
    ports_.push_back(std::move(port));
}

const VTBlock* VTRootBD::find(std::string_view path) const {
    const VTBlock* block = nullptr;
    for (;;) {
        const std::size_t end = path.find('/');
        const auto found = named_.find({block, path.substr(0, end)});
        if (found == named_.end())
            return nullptr;
        block = found->second;
        if (end == std::string_view::npos)
            return block;
        path.remove_prefix(end + 1);
    }
}

// The services of host/Model.hpp.

const VTBlock* vtsvGetBlockParent(const VTBlock& block) {
    return block.parent();
}

VT::VariantCondition vtsvGetBlockVariantCondition(const VTBlock& block) {
    return {block.variantCondition(), block.root().isQuill()};
}

std::span<const VTBlock* const> vtsvGetBlockChoices(const VTBlock& block) {
    return block.choices();
}

const VTBlock* vtsvGetPortSource(const vtPort& port) {
    return &port.source();
}

std::span<const VTBlock* const> vtsvGetPortDestinations(const vtPort& port) {
    return port.destinations();
}
