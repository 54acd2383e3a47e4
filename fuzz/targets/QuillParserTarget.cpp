// Any bytes as Quill text.  The first byte chooses the nesting bound and whether there are keywords.
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "host/QuillParser.hpp"

#include <array>
#include <vector>

namespace VT::Fuzz {

void fuzzQuillParser(Input input) {
    const std::uint8_t* const data = input.data();
    const std::size_t size = input.size();
    if (size == 0)
        return;
    const std::array<std::string, 2> keywords{"(sim)", "(codegen)"};
    const std::size_t used = data[0] >= 128 ? keywords.size() : 0;
    const auto parser = PARSER_T<char>::create(data[0] % 128U, std::span(keywords).first(used));
    const char* const text = reinterpret_cast<const char*>(data + 1);
    const PARSER_T<char>::Tree* const tree = parser->generate_parse_tree(text, size - 1);
    if (tree == nullptr) {
        demand(parser->failure().position < size && !parser->failure().reason.empty(),
               "a refusal has a place and a reason");
        return;
    }
    // Every node is within reach, and every token within the text and after the one before it.
    std::size_t after = 0;
    std::vector<const PARSER_T<char>::Tree*> pending{tree};
    while (!pending.empty()) {
        const PARSER_T<char>::Tree& node = *pending.back();
        pending.pop_back();
        if (node.kind == PARSER_T<char>::Tree::terminal) {
            demand(node.start >= after && node.text == text + node.start && node.length <= size - 1 - node.start,
                   "tokens are those of the text, in order");
            after = node.start + node.length;
        }
        for (std::int32_t i = node.kind == PARSER_T<char>::Tree::nonTerminal ? node.childCount : 0; i-- > 0;)
            pending.push_back(node.children + i);
    }
    parser->delete_parse_tree(tree);
}

} // namespace VT::Fuzz
