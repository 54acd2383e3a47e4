// Fuzz target: any bytes as Quill text.  The first byte chooses the nesting bound and whether there are keywords.
//
//   clang++ -std=c++20 -g -O1 -fsanitize=fuzzer,address,undefined -I. fuzz/quill_parser.cpp host/embedded/*Quill*.cpp
#include "host/QuillParser.hpp"

#include <array>
#include <cstdlib>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0)
        return 0;
    const std::array<std::string, 2> keywords{"(sim)", "(codegen)"};
    const std::size_t used = data[0] >= 128 ? keywords.size() : 0;
    const auto parser = PARSER_T<char>::create(data[0] % 128U, std::span(keywords).first(used));
    const char* const text = reinterpret_cast<const char*>(data + 1);
    const PARSER_T<char>::Tree* const tree = parser->generate_parse_tree(text, size - 1);
    if (tree == nullptr) {
        if (parser->failure().position > size - 1 || parser->failure().reason.empty())
            std::abort();
        return 0;
    }
    // Every node is within reach, and every token within the text and after the one before it.
    std::size_t after = 0;
    std::vector<const PARSER_T<char>::Tree*> pending{tree};
    while (!pending.empty()) {
        const PARSER_T<char>::Tree& node = *pending.back();
        pending.pop_back();
        if (node.kind == PARSER_T<char>::Tree::terminal) {
            if (node.start < after || node.text != text + node.start || node.length > size - 1 - node.start)
                std::abort();
            after = node.start + node.length;
        }
        for (std::int32_t i = node.kind == PARSER_T<char>::Tree::nonTerminal ? node.childCount : 0; i-- > 0;)
            pending.push_back(node.children + i);
    }
    parser->delete_parse_tree(tree);
    return 0;
}
