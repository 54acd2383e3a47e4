#include "tests/preprocessor/Worlds.hpp"

#include "tests/preprocessor/Judges.hpp"

#include <sstream>

namespace VT::Testing {

std::vector<std::set<int>> entered(std::string text, const Values& values, const std::string& assumed) {
    const auto pragma = [](const std::string& what, const std::string& name) {
        return "#pragma " + what + "_macro(\"" + name + "\")\n";
    };
    std::size_t pushed = 2;
    for (std::size_t at = 0; (at = text.find("push_macro", at)) != std::string::npos; ++at)
        ++pushed;
    std::string begin; // leaves nothing of the definition before, and something to pop
    for (const std::string& name : defined) {
        for (std::size_t i = 0; i < pushed; ++i)
            begin += pragma("pop", name);
        begin += "#undef " + name + "\n";
    }
    for (const std::string& name : macros)
        for (const char* const value : {" 1\n", " 0\n"})
            begin += "#define " + name + value + pragma("push", name) + "#undef " + name + "\n";
    begin += "#unassert m\n";
    for (const std::string import : {"export import", "import"}) // of a header: its macros are those of an #include
        for (std::size_t at = 0; (at = text.find("\n" + import, at)) != std::string::npos;)
            text.replace(at + 1, import.size(), "#include");
    std::string all;
    std::vector<std::size_t> digits(macros.size());
    for (bool more = true; more;) {
        std::string definitions = begin;
        for (std::size_t i = 0; i < macros.size(); ++i)
            if (!values[digits[i]].empty())
                definitions += "#define " + macros[i] + " " + values[digits[i]] + "\n";
        all += "@@\n";
        if (!assumed.empty()) {
            const std::string check = "#if !(" + assumed + ")\n@-1\n#endif\n";
            all += definitions + check + "#include \"header.h\"\n" + check;
        }
        all += definitions + "#line 1\n" + text;
        more = false;
        for (std::size_t i = 0; i < digits.size() && !more; ++i) {
            digits[i] = (digits[i] + 1) % values.size();
            more = digits[i] != 0;
        }
    }
    std::vector<std::set<int>> result;
    std::istringstream lines(preprocessed(all, includedText));
    for (std::string line; std::getline(lines, line);)
        if (line == "@@")
            result.emplace_back();
        else if (line.starts_with('@'))
            result.back().insert(std::stoi(line.substr(1)));
    return result;
}

bool isReached(const Branch& branch, const std::set<int>& entered) {
    return (branch.parent < 0 || entered.contains(branch.parent)) &&
           std::ranges::none_of(branch.earlier, [&](int other) { return entered.contains(other); });
}

std::size_t offsetOf(const std::string& text, std::uint64_t line, std::uint64_t column) {
    std::size_t at = 0;
    for (; line > 1; --line)
        at = text.find('\n', at) + 1;
    for (; column > 1; --column) // of a character of one or more bytes
        for (++at; (static_cast<unsigned char>(text[at]) & 0xC0U) == 0x80U;)
            ++at;
    return at;
}

} // namespace VT::Testing
