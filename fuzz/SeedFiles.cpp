// vtsym_seeds unpack FILE FOLDER makes a file of each seed, as libFuzzer reads them; vtsym_seeds pack FOLDER FILE keeps
// them again, in the order of their length.
#include "fuzz/Seeds.hpp"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>

namespace {

std::string contentOf(const std::filesystem::path& path) {
    std::ostringstream text;
    text << std::ifstream(path, std::ios::binary).rdbuf();
    return text.str();
}

} // namespace

int main(int argc, char** argv) {
    const std::vector<std::string> words(argv + 1, argv + argc);
    if (words.size() == 3 && words[0] == "unpack") {
        std::size_t number = 0;
        for (const VT::Fuzz::Seed& seed : VT::Fuzz::seedsOf(contentOf(words[1])))
            std::ofstream(std::filesystem::path(words[2]) / ("seed" + std::to_string(number++)), std::ios::binary)
                .write(reinterpret_cast<const char*>(seed.data()), static_cast<std::streamsize>(seed.size()));
        return 0;
    }
    if (words.size() == 3 && words[0] == "pack") {
        std::vector<std::string> lines;
        for (const auto& entry : std::filesystem::directory_iterator(words[1])) {
            const std::string content = contentOf(entry.path());
            lines.push_back(VT::Fuzz::lineOf({content.begin(), content.end()}));
        }
        std::ranges::sort(lines, [](const std::string& a, const std::string& b) {
            return a.size() != b.size() ? a.size() < b.size() : a < b;
        });
        std::ofstream out(words[2], std::ios::binary);
        for (const std::string& line : lines)
            out << line;
        return out.flush() ? 0 : 1;
    }
    std::cerr << "vtsym_seeds unpack FILE FOLDER | pack FOLDER FILE\n";
    return 2;
}
