// vtsym symbols: the names in conditions, by kind.
// Definitions do not apply here, so every member counts as unbound.
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <algorithm>
#include <array>
#include <sstream>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* symbolsNotes =
    R"(Symbols are listed as Quill writes them, each once, in the order of their first occurrence.

Examples:
  vtsym symbols 'Mode == 1 && P.gear > f(x)'
  vtsym symbols --kinds functions 'defined(A) && B'
  vtsym symbols --json < conditions.txt)";

using VT::VCSymbolType;

/// The words of --kinds.
constexpr std::array<std::pair<const char*, VCSymbolType>, 3> kindWords{{
    {"identifiers", VCSymbolType::Identifier},
    {"members", VCSymbolType::UnboundMember}, // nothing binds values here
    {"functions", VCSymbolType::FunctionName},
}};

struct SymbolsOptions : TextOptions {
    std::vector<std::string> kinds;
};

std::vector<std::string> kindNames() {
    std::vector<std::string> names;
    names.reserve(std::size(kindWords));
    for (const auto& [word, kind] : kindWords)
        names.emplace_back(word);
    return names;
}

/// The kinds named in comma-separated lists.
std::vector<std::string> kindsIn(const std::vector<std::string>& lists) {
    std::vector<std::string> kinds;
    for (const std::string& list : lists) {
        std::istringstream words(list + ",");
        words.exceptions(std::ios::badbit); // or it would end early where memory runs out
        for (std::string word; std::getline(words, word, ',');) {
            requireOneOf("--kinds", word, kindNames());
            kinds.push_back(word);
        }
    }
    return kinds;
}

VT::VCSymbolTypes kindsOf(const SymbolsOptions& options) {
    VT::VCSymbolTypes kinds;
    for (const auto& [word, kind] : kindWords)
        if (std::ranges::find(options.kinds, word) != options.kinds.end())
            kinds.set(kind);
    return kinds;
}

struct SymbolLister {
    explicit SymbolLister(const SymbolsOptions& given) : options(given) {}

    void answer(const std::string& text, std::string& out) {
        conditions.makeRoomFor(text);
        std::string list;
        for (const std::string& symbol : conditions.symbols(conditions.parse(options, text), kindsOf(options))) {
            list.append(list.empty()   ? ""
                        : options.json ? ","
                                       : " ")
                .append(options.json ? jsonString(symbol) : symbol);
        }
        if (options.json)
            appendMember(out, "symbols", "[" + list + "]");
        else
            out.append(list);
    }

    const SymbolsOptions& options;
    Conditions conditions;
};

} // namespace

void addSymbols(CommandLine& program) {
    Command& command = program.add("symbols", "List the symbols of conditions", symbolsNotes);
    const auto options = std::make_shared<SymbolsOptions>();
    addTextOptions(command, *options);
    const auto take = [options](const std::vector<std::string>& lists) { options->kinds = kindsIn(lists); };
    command.addArguments(
        {"--kinds", "Kinds, with commas: identifiers, members, functions (the first two unless given)", "KIND,..."},
        take);
    command.run = [options](Console& console) {
        if (options->kinds.empty())
            options->kinds = {"identifiers", "members"};
        return answerTexts(*options, console, [&] { return answeringBy(std::make_shared<SymbolLister>(*options)); });
    };
}

} // namespace vtsym
