// Looks up a line that begins with a colon in one table of commands; every other line is a condition.
//
// A value is put in the place of its name before a condition is simplified, so `:let` costs a walk over each condition.
// Errors are placed in the whole line, not in the part that a command takes.
#include "tools/vtsym/answers/Session.hpp"

#include "base/core/Nodes.hpp"
#include "host/Diagnostics.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/answers/Explanation.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"
#include "tools/vtsym/io/ErrorText.hpp"

#include <algorithm>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* lastResult = "ans";
constexpr std::size_t shownWordBytes = 80; ///< of an unknown command

std::string_view trimmed(std::string_view text) {
    constexpr const char* blanks = " \t\r";
    const std::size_t begin = text.find_first_not_of(blanks);
    return begin == std::string_view::npos ? std::string_view()
                                           : text.substr(begin, text.find_last_not_of(blanks) - begin + 1);
}

} // namespace

struct Session::CommandRow {
    const char* word;
    const char* argument;
    const char* help;
    void (*run)(Session&, std::string_view argument, std::string& out);
};

// Without TEXT, a command applies to the last result.
const Session::CommandRow Session::commands[] = {
    {":quill", "[TEXT]", "show as Quill; without TEXT, switch to Quill",
     [](Session& session, std::string_view text, std::string& out) { session.showIn("quill", text, out); }},
    {":c", "[TEXT]", "show as C; without TEXT, switch to C",
     [](Session& session, std::string_view text, std::string& out) { session.showIn("c", text, out); }},
    {":pp", "[TEXT]", "show as the condition of a preprocessor directive",
     [](Session& session, std::string_view text, std::string& out) { session.showDirective(text, out); }},
    {":tree", "[TEXT]", "draw as a tree",
     [](Session& session, std::string_view text, std::string& out) { session.showTree(text, out); }},
    {":explain", "[TEXT]", "show how it is simplified",
     [](Session& session, std::string_view text, std::string& out) { session.explain(text, out); }},
    {":symbols", "[TEXT]", "list its symbols",
     [](Session& session, std::string_view text, std::string& out) { session.listSymbols(text, out); }},
    {":let", "NAME=VALUE", "replace NAME by VALUE from now on",
     [](Session& session, std::string_view text, std::string& out) { session.let(text, out); }},
    {":help", "", "show this list", [](Session& session, std::string_view, std::string& out) { session.help(out); }},
    {":quit", "", "leave; so does the end of the input",
     [](Session& session, std::string_view, std::string&) { session.ended_ = true; }},
};

Session::Session(TextOptions options, const Style& style) : options_(std::move(options)), style_(style) {
    for (const CommandRow& command : commands)
        words_.insert(command.word);
    words_.insert(lastResult);
}

void Session::answer(const std::string& line, std::string& out) {
    line_ = line;
    const std::string_view text = trimmed(line);
    if (text.empty())
        return;
    if (!text.starts_with(':')) {
        show(text, options_, out);
        return;
    }
    const std::size_t end = std::min(text.find_first_of(" \t"), text.size());
    commandOf(text.substr(0, end)).run(*this, trimmed(text.substr(end)), out);
}

const Session::CommandRow& Session::commandOf(std::string_view word) {
    for (const CommandRow& command : commands)
        if (word == command.word)
            return command;
    throw CommandError("There is no command " + VT::shownText(word, shownWordBytes) + "; :help lists them.");
}

/// Reads a part of the line.
VT::SymbolicExprId Session::parse(std::string_view text) const {
    try {
        return conditions_.parse(options_, std::string(text));
    } catch (const VT::HostDiagnostic&) {
        throw CommandError(currentTextError(), static_cast<std::size_t>(text.data() - line_.data()));
    }
}

/// Reads a part of the line and replaces names by their values.
VT::SymbolicExprId Session::read(std::string_view text) {
    const VT::SymbolicExprId condition = parse(text);
    for (std::string& symbol :
         conditions_.symbols(condition, {VT::VCSymbolType::Identifier, VT::VCSymbolType::UnboundMember}))
        words_.insert(std::move(symbol));
    const auto whole = values_.find(condition);
    return whole != values_.end() ? whole->second
                                  : VT::SymbolicExprReplacement(conditions_.service().table(), values_)(condition);
}

/// The condition that a command applies to: its text or, without one, the last result.
VT::SymbolicExprId Session::subject(std::string_view text) {
    if (!text.empty())
        return read(text);
    if (!result_)
        throw CommandError("There is no result yet: enter a condition first.");
    return *result_;
}

void Session::show(std::string_view text, const TextOptions& options, std::string& out) {
    const VT::SymbolicExprId condition = subject(text);
    const VT::SymbolicExprId result = conditions_.shortest(options, condition);
    out.append(style_.good(conditions_.printShortest(options, result, condition)));
    keep(result);
}

void Session::keep(VT::SymbolicExprId result) {
    bind(lastResult, result);
    result_ = result;
}

void Session::bind(const std::string& name, VT::SymbolicExprId value) {
    values_[VT::SymbolicString(conditions_.service().table(), name).getId(conditions_.service().table())] = value;
}

void Session::showIn(const char* language, std::string_view text, std::string& out) {
    TextOptions options = options_;
    options.to = language;
    if (!text.empty()) {
        show(text, options, out);
        return;
    }
    if (result_)
        out.append(style_.good(conditions_.print(options, *result_)));
    options_.from = options_.to = language;
}

void Session::showDirective(std::string_view text, std::string& out) {
    TextOptions options = options_;
    options.to = "pp";
    const VT::SymbolicExprId condition = subject(text);
    out.append(style_.good(conditions_.print(options, condition)));
    for (const std::string& warning : conditions_.warnings(options, condition))
        out.append("\nwarning: ").append(warning);
}

void Session::showTree(std::string_view text, std::string& out) {
    appendDrawing(conditions_.service().table(), subject(text), style_, out);
}

void Session::explain(std::string_view text, std::string& out) {
    Explanation explanation(conditions_, options_, subject(text), true);
    explanation.shorten();
    explanation.appendText(style_, out);
    keep(explanation.result());
}

void Session::listSymbols(std::string_view text, std::string& out) {
    const char* gap = "";
    for (const std::string& symbol :
         conditions_.symbols(subject(text), {VT::VCSymbolType::Identifier, VT::VCSymbolType::UnboundMember})) {
        out.append(gap).append(symbol);
        gap = " ";
    }
}

void Session::let(std::string_view assignment, std::string& out) {
    const std::size_t equals = assignment.find('=');
    const std::string name(trimmed(assignment.substr(0, equals)));
    if (equals == std::string::npos || !isName(name))
        throw CommandError("A definition is written :let NAME=VALUE.");
    const VT::SymbolicExprId value = read(trimmed(assignment.substr(equals + 1)));
    out.append(name).append(" = ").append(conditions_.print(options_, value));
    bind(name, value);
    words_.insert(name);
}

void Session::help(std::string& out) const {
    out.append("A condition is answered by its shortest form, which `ans` refers to afterwards.");
    for (const CommandRow& command : commands) {
        std::string usage = std::string(command.word) + " " + command.argument;
        usage.resize(std::max<std::size_t>(usage.size(), 18), ' ');
        out.append("\n  ").append(usage).append(command.help);
    }
}

} // namespace vtsym
