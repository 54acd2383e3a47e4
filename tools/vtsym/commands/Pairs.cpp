#include "tools/vtsym/commands/Pairs.hpp"

#include "host/Diagnostics.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>

namespace vtsym {

namespace {

/// Reads the part of a text from begin to end; keeps the error where it cannot be read.
VT::SymbolicExprId readPart(const Conditions& conditions, const TextOptions& options, const std::string& part,
                            std::size_t begin, std::vector<TextError>& errors) {
    try {
        return conditions.parse(options, part);
    } catch (const VT::HostDiagnostic&) {
        TextError error = currentTextError();
        if (error.offset)
            *error.offset += begin;
        error.begin = begin;
        error.end = begin + part.size();
        errors.push_back(std::move(error));
        return VT::invalidId;
    }
}

std::string nameOf(const Conditions& conditions, const TextOptions& options, VT::SymbolicExprId unknown) {
    VT::VCService& service = conditions.service();
    return options.fromQuill() ? service.printQExprWithConversion(unknown) : service.printCExprNoConversion(unknown);
}

/// Makes one text of two arguments, in which a tab is a blank like any other.
void joinArguments(PairOptions& options) {
    if (!options.first || (options.first == "-" && !options.second))
        return;
    if (!options.second)
        throw CLI::ValidationError("two conditions are needed; the one that always holds is true");
    std::ranges::replace(*options.first, '\t', ' ');
    std::ranges::replace(*options.second, '\t', ' ');
    options.texts = {*options.first + "\t" + *options.second};
}

} // namespace

void addPairOptions(CLI::App& command, PairOptions& options, const std::string& first, const std::string& second) {
    addArgument(
        command, first, [&options](const std::string& text) { options.first = text; },
        "Two conditions; without any, or with -, every line of standard input is two, separated by a tab");
    addArgument(
        command, second, [&options](const std::string& text) { options.second = text; }, "");
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
    std::vector<TextError> errors;
    pair.first = readPart(conditions, options, pair.firstText, 0, errors);
    pair.second = readPart(conditions, options, pair.secondText, tab + 1, errors);
    if (!errors.empty())
        throw CommandError(std::move(errors));
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
