#include "tools/vtsym/Pairs.hpp"

#include "host/Diagnostics.hpp"
#include "tools/vtsym/ErrorText.hpp"
#include "tools/vtsym/Json.hpp"

#include <algorithm>

namespace vtsym {

namespace {

VT::SymbolicExprId readPart(const Conditions& conditions, const TextOptions& options, const std::string& text,
                            std::size_t begin) {
    try {
        return conditions.parse(options, text);
    } catch (const VT::HostDiagnostic&) {
        throw CommandError(currentTextError(), begin);
    }
}

std::string nameOf(const Conditions& conditions, const TextOptions& options, VT::SymbolicExprId unknown) {
    VT::VCService& service = conditions.service();
    return options.fromQuill() ? service.printQExprWithConversion(unknown) : service.printCExprNoConversion(unknown);
}

/// Makes one text of two arguments, in which a tab is a blank like any other.
void joinArguments(PairOptions& options) {
    if (options.first.empty() || (options.first == "-" && options.second.empty()))
        return;
    if (options.second.empty())
        throw CLI::ValidationError("two conditions are needed; the one that always holds is true");
    std::ranges::replace(options.first, '\t', ' ');
    std::ranges::replace(options.second, '\t', ' ');
    options.texts = {options.first + "\t" + options.second};
}

} // namespace

void addPairOptions(CLI::App& command, PairOptions& options, const std::string& first, const std::string& second) {
    command
        .add_option(first, options.first,
                    "Two conditions; without any, or with -, every line of standard input is two, separated by a tab")
        ->transform(withoutMark, "")
        ->type_name("");
    command.add_option(second, options.second)->transform(withoutMark, "")->type_name("");
    addSourceOption(command, options);
    command.add_flag("--json", options.json, "Answer with one JSON object per pair");
    addBitsOption(command, options.bits32);
    command.callback([&options] { joinArguments(options); });
}

ConditionPair readPair(const Conditions& conditions, const TextOptions& options, const std::string& text) {
    const std::size_t tab = text.find('\t');
    if (tab == std::string::npos || text.find('\t', tab + 1) != std::string::npos)
        throw CommandError("Two conditions are separated by one tab.");
    ConditionPair pair{text.substr(0, tab), text.substr(tab + 1), VT::invalidId, VT::invalidId};
    pair.first = readPart(conditions, options, pair.firstText, 0);
    pair.second = readPart(conditions, options, pair.secondText, tab + 1);
    return pair;
}

std::string witnessText(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness) {
    std::string text;
    for (const VT::UnknownValue& each : witness) {
        text.append(text.empty() ? "" : ", ").append(nameOf(conditions, options, each.unknown));
        text.append("=").append(std::to_string(each.value));
    }
    return text.empty() ? "always" : text;
}

std::string witnessJson(const Conditions& conditions, const TextOptions& options, const VT::Witness& witness) {
    std::string json;
    for (const VT::UnknownValue& each : witness) {
        json.append(json.empty() ? "" : ",").append(jsonString(nameOf(conditions, options, each.unknown)));
        json.append(":").append(std::to_string(each.value));
    }
    return "{" + json + "}";
}

} // namespace vtsym
