// vtsym symbols
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <algorithm>
#include <array>
#include <sstream>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Symbols are listed as Quill writes them, in the order in which they first occur, each once.

Examples:
  vtsym symbols 'Mode == 1 && P.gear > f(x)'
  vtsym symbols --kinds functions 'defined(A) && B'
  vtsym symbols --json < conditions.txt)";

using VT::VCSymbolType;

/// The words of --kinds.
constexpr std::array<std::pair<const char*, VCSymbolType>, 3> kindWords{{
    {"identifiers", VCSymbolType::Identifier},
    {"members", VCSymbolType::UnboundMember}, // texts bind no values
    {"functions", VCSymbolType::FunctionName},
}};

struct SymbolsOptions : TextOptions {
    std::vector<std::string> kinds;
};

std::vector<std::string> kindNames() {
    std::vector<std::string> names;
    for (const auto& [word, kind] : kindWords)
        names.emplace_back(word);
    return names;
}

/// The words of lists with commas.
std::vector<std::string> kindsIn(const std::vector<std::string>& lists) {
    std::vector<std::string> kinds;
    for (const std::string& list : lists) {
        std::istringstream words(list + ",");
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

} // namespace

Command addSymbols(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("symbols", "List the symbols of conditions");
    const auto options = std::make_shared<SymbolsOptions>();
    addTextOptions(*command, *options);
    const auto take = [options](const std::vector<std::string>& lists) { options->kinds = kindsIn(lists); };
    addArguments(*command, "--kinds", take,
                 "Kinds to list, with commas between: identifiers, members, functions (the first two unless given)")
        ->type_name("KIND,...");
    command->footer(examples);
    return {command, [options](Console& console) {
                if (options->kinds.empty())
                    options->kinds = {"identifiers", "members"};
                Conditions conditions;
                const auto answer = [&](const std::string& text, std::string& out) {
                    conditions.makeRoomFor(text);
                    const auto symbols = conditions.symbols(conditions.parse(*options, text), kindsOf(*options));
                    std::string list;
                    for (const std::string& symbol : symbols) {
                        list.append(list.empty()    ? ""
                                    : options->json ? ","
                                                    : " ")
                            .append(options->json ? jsonString(symbol) : symbol);
                    }
                    if (options->json)
                        appendMember(out, "symbols", "[" + list + "]");
                    else
                        out.append(list);
                };
                return answerTexts(*options, console, {answer});
            }};
}

} // namespace vtsym
