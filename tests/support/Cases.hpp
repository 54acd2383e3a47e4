// Tables of cases that are kept as text, so that programs in any language can use them.
//
// A file of tests/data/cases is a list of sections, each with a heading in brackets and one case a line.  Columns are
// separated by tabs, further tabs make no further columns, and lines that begin with # or hold nothing say nothing.
// \n, \t, \\ and \xHH stand for what they do in C; \e is an empty column.  A heading holds no tab.
#pragma once

#include <string>
#include <vector>

namespace VT::Testing {

using CaseRow = std::vector<std::string>;

/// The rows of a section, each with that many columns; the last ones may be left out and are empty then.  Throws
/// std::runtime_error for a section that is not there or holds no row, and for a row with too many columns.
std::vector<CaseRow> casesOf(const std::string& file, const std::string& section, std::size_t columns);

} // namespace VT::Testing
