// The floor of reading and writing: a precedence parser with a table of binding powers that interns as it reads, and a
// printer that appends to one buffer.
#pragma once

#include "benchmarks/floors/FlatTable.hpp"

#include <string_view>
#include <vector>

namespace Floor {

/// Reads one condition in C operators; none for a text that is no condition.  Recurses for brackets and operators that
/// bind tighter.
std::uint32_t read(FlatTable& table, std::string_view text);

/// The texts that were written, one after the other, and the operators whose right operand comes next.
struct Output {
    struct Waiting {
        std::uint32_t id;
        bool wrapped;
    };

    std::vector<char> bytes;
    std::vector<Waiting> waiting;
};

/// Appends the text of a record, with parentheses where precedence asks for them.  Recurses for right operands.
void write(const FlatTable& table, std::uint32_t id, Output& output);

} // namespace Floor
