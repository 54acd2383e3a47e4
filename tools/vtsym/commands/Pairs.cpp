// Joins two arguments into one text with a tab, so that arguments and lines are answered alike, and reads both parts of
// a text with offsets that count from its beginning.
#include "tools/vtsym/commands/Pairs.hpp"

#include "host/Diagnostics.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>

namespace vtsym {

namespace {

/// Reads the part of a text that begins at a byte; appends to the errors where it cannot be read.
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

/// Joins two arguments into one text; a tab inside of them becomes a blank.
void joinArguments(PairOptions& options) {
    if (!options.first || (options.first == "-" && !options.second))
        return;
    if (!options.second)
        throw UsageError("the second condition is missing; write true for one that always holds");
    std::ranges::replace(*options.first, '\t', ' ');
    std::ranges::replace(*options.second, '\t', ' ');
    options.texts = {*options.first + "\t" + *options.second};
}

} // namespace

void addPairOptions(Command& command, PairOptions& options, const std::string& first, const std::string& second) {
    command.addArgument({first, "A condition; without any, or with -, lines of standard input with two, a tab between"},
                        [&options](const std::string& text) { options.first = text; });
    command.addArgument({second, "The other condition"},
                        [&options](const std::string& text) { options.second = text; });
    addSourceOption(command, options);
    command.addFlag("--json", "Answer with one JSON object per pair", options.json);
    addJobsOption(command, options.jobs);
    addBitsOption(command, options.bits32);
    addAssumeOption(command, options.assumptions);
    command.addFlag("--why", "Say which operands, known facts and assumptions force the answer", options.why);
    command.afterOptions = [&options] {
        joinArguments(options);
        const Conditions checked(options.bits32, options, options.assumptions); // before any text is answered
    };
}

ConditionPair readPair(const Conditions& conditions, const TextOptions& options, const std::string& text) {
    const std::size_t tab = text.find('\t');
    if (tab == std::string::npos || text.find('\t', tab + 1) != std::string::npos)
        throw CommandError("This is not a pair: write two conditions with one tab between them.");
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
