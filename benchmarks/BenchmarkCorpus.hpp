// The corpus lines that the condition grammar reads.
#pragma once

#include "base/core/Nodes.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/generators/Corpus.hpp"

#include <stdexcept>
#include <string>
#include <vector>

namespace VT::Benchmarks {

inline const std::vector<std::string>& readableLines() {
    static const std::vector<std::string> lines = [] {
        std::vector<std::string> readable;
        SymbolicExprTable table;
        for (const Testing::CorpusFile& file : Testing::corpusFiles)
            for (std::string& line : Testing::corpusLines(file.name)) {
                try {
                    SymbolicExprParser(table, true, false)(line);
                    readable.push_back(std::move(line));
                } catch (const std::runtime_error&) {
                    continue; // a text that is no condition
                }
            }
        return readable;
    }();
    return lines;
}

} // namespace VT::Benchmarks
