// The floor of reading and writing: a precedence parser that interns into records, and a printer that appends to one
// buffer.
#pragma once

#include "benchmarks/RecordTable.hpp"

#include <optional>
#include <string>
#include <string_view>

namespace VT::Benchmarks {

/// Reads one condition in C operators; nothing for a text that is none.  Recurses.
std::optional<std::uint32_t> readRecords(RecordTable& table, std::string_view text);

/// Appends the text of a record, with parentheses where precedence asks for them.  Recurses.
void writeRecord(const RecordTable& table, std::uint64_t id, std::string& text);

} // namespace VT::Benchmarks
