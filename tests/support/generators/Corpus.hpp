// The real conditions in tests/data/corpus.
#pragma once

#include <array>
#include <fstream>
#include <string>
#include <vector>

namespace VT::Testing {

struct CorpusFile {
    const char* name;
    std::size_t readable; ///< lines within the condition grammar, C operators, as counted when the lines were collected
};

inline constexpr auto corpusFiles = std::to_array<CorpusFile>({
    {"curl-conditions.txt", 581},
    {"freertos-conditions.txt", 525},
    {"mbedtls-conditions.txt", 515},
    {"micropython-conditions.txt", 2917},
    {"nuttx-conditions.txt", 7895},
    {"nuttx-kconfig.txt", 4411},
});

/// The lines of a corpus file; none where the file is missing.
inline std::vector<std::string> corpusLines(const std::string& name) {
    std::ifstream file(VTSYM_TEST_DATA "/corpus/" + name);
    std::vector<std::string> lines;
    for (std::string line; std::getline(file, line);)
        lines.push_back(line);
    return lines;
}

} // namespace VT::Testing
