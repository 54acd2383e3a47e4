#include "tests/support/Cases.hpp"

#include <fstream>
#include <stdexcept>

namespace VT::Testing {

namespace {

std::string unescaped(const std::string& text) {
    std::string result;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] != '\\' || at + 1 == text.size()) {
            result += text[at];
            continue;
        }
        const char what = text[++at];
        if (what == 'x') {
            result += static_cast<char>(std::stoi(text.substr(at + 1, 2), nullptr, 16));
            at += 2;
        } else if (what != 'e') {
            result += what == 'n' ? '\n' : what == 't' ? '\t' : what;
        }
    }
    return result;
}

CaseRow rowOf(const std::string& line) {
    CaseRow row;
    for (std::size_t at = 0; (at = line.find_first_not_of('\t', at)) != std::string::npos;) {
        const std::size_t end = std::min(line.find('\t', at), line.size());
        row.push_back(unescaped(line.substr(at, end - at)));
        at = end;
    }
    return row;
}

} // namespace

std::vector<CaseRow> casesOf(const std::string& file, const std::string& section, std::size_t columns) {
    std::ifstream input(VTSYM_TEST_DATA "/cases/" + file, std::ios::binary);
    std::vector<CaseRow> rows;
    bool inside = false;
    for (std::string line; std::getline(input, line);) {
        if (line.starts_with('[') && line.ends_with(']') && line.find('\t') == std::string::npos)
            inside = line == "[" + section + "]";
        else if (inside && !line.empty() && !line.starts_with('#'))
            rows.push_back(rowOf(line));
        else
            continue;
        if (rows.empty())
            continue;
        if (rows.back().size() > columns)
            throw std::runtime_error(file + ": too many columns: " + line);
        rows.back().resize(columns);
    }
    if (rows.empty())
        throw std::runtime_error(file + ": no cases of " + section);
    return rows;
}

} // namespace VT::Testing
