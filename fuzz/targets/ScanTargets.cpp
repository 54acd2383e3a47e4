// Sources: directives that the input chooses, compared with an interpreter of them under every definition of three
// macros; and any bytes.
#include "base/scan/SourceScan.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <array>
#include <functional>
#include <map>
#include <tuple>

namespace VT::Fuzz {

namespace {

/// What macros are defined as; those that are not defined are left out.
using Macros = std::map<std::string, std::int64_t>;

const std::array<std::string, 3> names{"A", "B", "C"};

/// A part of a condition: its text, and whether it holds.
struct Part {
    std::string text;
    std::function<bool(const Macros&)> holds;
};

std::int64_t valueIn(const Macros& macros, const std::string& name) {
    const auto found = macros.find(name);
    return found == macros.end() ? 0 : found->second;
}

Part comparison(Choices& choices) {
    static const std::array<std::pair<const char*, bool (*)(std::int64_t, std::int64_t)>, 6> operators{{
        {" == ", [](std::int64_t a, std::int64_t b) { return a == b; }},
        {"!=", [](std::int64_t a, std::int64_t b) { return a != b; }},
        {" < ", [](std::int64_t a, std::int64_t b) { return a < b; }},
        {"<=", [](std::int64_t a, std::int64_t b) { return a <= b; }},
        {" > ", [](std::int64_t a, std::int64_t b) { return a > b; }},
        {">=", [](std::int64_t a, std::int64_t b) { return a >= b; }},
    }};
    const std::string name = choices.of(names);
    const std::string other = choices.of(names);
    const auto constant = static_cast<std::int64_t>(choices.below(5)) - 1;
    const auto& operation = choices.of(operators);
    const auto compare = operation.second;
    const std::string right = operation.first + std::to_string(constant);
    switch (choices.below(6)) {
    case 0:
        return {"defined(" + name + ")", [=](const Macros& all) { return all.contains(name); }};
    case 1:
        return {name, [=](const Macros& all) { return valueIn(all, name) != 0; }};
    case 2:
        return {name + " + " + other + right,
                [=](const Macros& all) { return compare(valueIn(all, name) + valueIn(all, other), constant); }};
    case 3:
        return {"(" + name + " & 3)" + right,
                [=](const Macros& all) { return compare(valueIn(all, name) & 3, constant); }};
    case 4:
        return {name + "*2 - " + other + right,
                [=](const Macros& all) { return compare(valueIn(all, name) * 2 - valueIn(all, other), constant); }};
    default:
        return {name + right, [=](const Macros& all) { return compare(valueIn(all, name), constant); }};
    }
}

Part condition(Choices& choices) {
    Part whole = comparison(choices);
    for (std::size_t more = choices.below(4); more > 0; --more) {
        const Part next = comparison(choices);
        const Part first = whole;
        const bool isAnd = choices.below(2) == 0;
        const bool isNegated = choices.below(4) == 0;
        whole.text = (isNegated ? "!(" : "(") + first.text + (isAnd ? " && " : " || ") + next.text + ")";
        whole.holds = [=](const Macros& all) {
            return (isAnd ? first.holds(all) && next.holds(all) : first.holds(all) || next.holds(all)) != isNegated;
        };
    }
    return whole;
}

enum class LineKind : std::uint8_t { If, Elif, Else, Endif, Define, Undefine };

struct Line {
    LineKind kind;
    Part condition = {};
    std::string macro = {};
    std::int64_t value = 0;
};

/// A file of directives and what each line of it is.
struct Source {
    std::string text;
    std::vector<Line> lines;

    void add(Line line, const std::string& words) {
        lines.push_back(std::move(line));
        text += words + "\n";
    }
};

Source chosenSource(Choices& choices) {
    Source source;
    std::vector<bool> open; ///< chains, and whether they had #else
    for (int left = 60; !choices.areUsedUp() && left > 0; --left) {
        const std::size_t kind = choices.below(8);
        if (kind < 3 && open.size() < 6) {
            const Part chosen = condition(choices);
            source.add({LineKind::If, chosen}, "#if " + chosen.text);
            open.push_back(false);
        } else if (kind < 5 && !open.empty() && !open.back()) {
            const Part chosen = condition(choices);
            source.add({LineKind::Elif, chosen}, "#elif " + chosen.text);
        } else if (kind == 5 && !open.empty() && !open.back()) {
            source.add({LineKind::Else}, "#else");
            open.back() = true;
        } else if (kind == 6) {
            const std::string macro = choices.of(names);
            const auto value = static_cast<std::int64_t>(choices.below(4)) - 1;
            if (choices.below(2) == 0)
                source.add({LineKind::Undefine, {}, macro}, "#undef " + macro);
            else
                source.add({LineKind::Define, {}, macro, value},
                           "#undef " + macro + "\\\n\n#define " + macro + " (" + std::to_string(value) + ")");
        } else if (!open.empty()) {
            source.add({LineKind::Endif}, "#endif");
            open.pop_back();
        }
    }
    for (; !open.empty(); open.pop_back())
        source.add({LineKind::Endif}, "#endif");
    return source;
}

/// What happened at a branch: whether its directive was reached, and whether it was entered.
struct Passed {
    bool isReached = false;
    bool isEntered = false;
    Macros macros = {};
};

/// Interprets the lines under definitions, as a preprocessor does.
std::vector<Passed> interpret(const Source& source, Macros macros) {
    struct Chain {
        bool isLive; ///< what is around it is entered
        bool isDone; ///< one of its branches was entered
        bool isIn;
    };

    std::vector<Passed> passed(source.lines.size());
    std::vector<Chain> chains;
    const auto isLive = [&] { return chains.empty() || chains.back().isIn; };
    for (std::size_t i = 0; i < source.lines.size(); ++i) {
        const Line& line = source.lines[i];
        if (line.kind == LineKind::Endif) {
            chains.pop_back();
            continue;
        }
        if (line.kind == LineKind::Define || line.kind == LineKind::Undefine) {
            if (isLive() && line.kind == LineKind::Define)
                macros[line.macro] = line.value;
            else if (isLive())
                macros.erase(line.macro);
            continue;
        }
        if (line.kind == LineKind::If)
            chains.push_back({isLive(), false, false});
        Chain& chain = chains.back();
        const bool isReached = chain.isLive && !chain.isDone;
        chain.isIn = isReached && (line.kind == LineKind::Else || line.condition.holds(macros));
        chain.isDone = chain.isDone || chain.isIn;
        passed[i] = {isReached, chain.isIn, macros};
    }
    return passed;
}

/// Whether a proposed condition holds; nothing for one that is not of the grammar.
std::optional<bool> holdsProposed(const std::string& text, const Macros& macros) {
    SymbolicExprTable table;
    const Testing::ParseAnswer answer = Testing::parse(table, text, true, false);
    if (answer.error)
        return std::nullopt;
    const auto value = Testing::Truth(table, answer.id, Testing::Arithmetic::C).under(macros);
    return value ? std::optional(*value != 0) : std::nullopt;
}

void demandFinding(const BranchFinding& finding, const Source& source, std::size_t index,
                   const std::vector<std::vector<Passed>>& worlds) {
    for (const std::vector<Passed>& world : worlds) {
        const Passed& at = world[index];
        demand(finding.kind != BranchFindingKind::Dead || !at.isEntered, "a dead branch is never entered",
               finding.directive + "\n" + source.text);
        if (!at.isReached || finding.proposed.empty() || finding.kind == BranchFindingKind::Dead)
            continue;
        const auto proposed = holdsProposed(finding.proposed, at.macros);
        demand(!proposed || *proposed == at.isEntered, "a proposed condition enters in the same cases",
               finding.directive + " -> " + finding.proposed + "\n" + source.text);
    }
}

/// The same for builds in which some condition of the file holds before it, each of three by itself; and what all of
/// them have in common is the same for a scanner that is asked for nothing else.
void demandAlternatives(const Source& source, const std::vector<std::size_t>& lineOf,
                        const std::vector<Macros>& definitions, const std::vector<std::vector<Passed>>& worlds) {
    SourceScanner scanner;
    std::vector<Part> assumed;
    for (const Line& line : source.lines)
        if (!line.condition.text.empty() && assumed.size() < 3)
            assumed.push_back(line.condition);
    for (const Part& each : assumed) {
        scanner.beginAlternative();
        demand(!scanner.assume(each.text), "a condition can be assumed", each.text);
    }
    const auto keyOf = [](const BranchFinding& finding) {
        return std::tuple(finding.region.line, finding.kind, finding.proposed, finding.configurations);
    };
    std::vector<decltype(keyOf({}))> inAll;
    SourceScanner other(scanner);
    scanner.scan(source.text, false, [&](const BranchFinding& finding) {
        if (finding.configurations.empty() || finding.configurations.size() == assumed.size())
            inAll.push_back(keyOf(finding));
        for (const std::size_t alternative : finding.configurations) {
            std::vector<std::vector<Passed>> such;
            for (std::size_t i = 0; i < worlds.size(); ++i)
                if (assumed[alternative].holds(definitions[i]))
                    such.push_back(worlds[i]);
            demandFinding(finding, source, lineOf[finding.region.line - 1], such);
        }
    });
    other.reportCommonOnly(true);
    std::size_t at = 0;
    other.scan(source.text, false, [&](const BranchFinding& finding) {
        demand(at < inAll.size() && inAll[at] == keyOf(finding), "what is common is in all", source.text);
        ++at;
    });
    demand(at == inAll.size(), "all that is common is found", source.text);
}

} // namespace

void fuzzScan(Input input) {
    Choices choices(input);
    const Source source = chosenSource(choices);
    std::vector<std::size_t> lineOf; ///< index of a line's directive by its number in the text, which begins at 1
    for (std::size_t i = 0; i < source.lines.size(); ++i)
        lineOf.insert(lineOf.end(), source.lines[i].kind == LineKind::Define ? 3 : 1, i);
    std::vector<Macros> definitions;
    std::vector<std::vector<Passed>> worlds;
    static constexpr std::array<std::int64_t, 5> values{-2, -1, 0, 1, 2}; // -2 for what is not defined
    for (const std::int64_t a : values)
        for (const std::int64_t b : values)
            for (const std::int64_t c : values) {
                Macros macros;
                for (const auto& [name, value] : {std::pair(names[0], a), {names[1], b}, {names[2], c}})
                    if (value != -2)
                        macros[name] = value;
                worlds.push_back(interpret(source, macros));
                definitions.push_back(std::move(macros));
            }
    SourceScanner scanner;
    scanner.scan(source.text, false, [&](const BranchFinding& finding) {
        demand(finding.region.line >= 1 && finding.region.line <= lineOf.size(), "a finding is in the file");
        demandFinding(finding, source, lineOf[finding.region.line - 1], worlds);
    });
    demandAlternatives(source, lineOf, definitions, worlds);
}

void fuzzScanBytes(Input input) {
    const std::string_view text(reinterpret_cast<const char*>(input.data()), input.size());
    const auto lines = static_cast<std::uint64_t>(std::ranges::count(text, '\n') + std::ranges::count(text, '\r')) + 1;
    for (const bool isCpp : {false, true}) {
        SourceScanner scanner({.strictIncludes = isCpp, .why = !isCpp});
        std::uint64_t last = 0;
        scanner.scan(text, isCpp, [&](const BranchFinding& finding) {
            demand(finding.region.line >= last && finding.region.line <= lines && finding.region.column >= 1,
                   "findings are in the order of lines");
            demand(finding.region.endLine >= finding.region.line, "a region ends after it begins");
            last = finding.region.line;
        });
    }
}

} // namespace VT::Fuzz
