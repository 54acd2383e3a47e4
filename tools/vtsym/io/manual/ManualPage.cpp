// Writes the manual page with the macros of man(7): the program, then a section for each command with its options,
// notes and examples.  The page carries no date, so that the same program always writes the same page.
#include "tools/vtsym/io/manual/ManualPage.hpp"

#include <sstream>
#include <string_view>

namespace vtsym {

namespace {

/// A text that roff prints as it is written; dashes stay dashes that can be copied.
std::string escaped(std::string_view text) {
    std::string result;
    for (const char c : text) {
        switch (c) {
        case '\\':
            result += "\\e";
            break;
        case '-':
            result += "\\-";
            break;
        case '\'':
            result += "\\(aq";
            break;
        case '^':
            result += "\\(ha";
            break;
        case '~':
            result += "\\(ti";
            break;
        case '`':
            result += "\\(ga";
            break;
        default:
            result += c;
        }
    }
    return result.starts_with('.') ? "\\&" + result : result;
}

/// "\fB\-\-to\fR \fILANGUAGE\fR".
std::string heading(const OptionEntry& option) {
    if (option.isPositional())
        return "\\fI" + escaped(option.names.front()) + "\\fR" + (option.repeats ? " ..." : "");
    std::string result;
    for (const std::string& name : option.names)
        result += (result.empty() ? "\\fB" : ", \\fB") + escaped(name) + "\\fR";
    return option.value.empty() ? result : result + " \\fI" + escaped(option.value) + "\\fR";
}

/// Paragraphs, and examples as they are written.
void writeNotes(const std::string& notes, std::string& page) {
    std::istringstream stream(notes);
    stream.exceptions(std::ios::badbit); // or it would end early where memory runs out
    bool inExample = false;
    bool begins = true; // a paragraph
    for (std::string line; std::getline(stream, line);) {
        const bool isExample = line.starts_with(' ');
        if (isExample != inExample)
            page.append(isExample ? ".PP\n.EX\n" : ".EE\n");
        else if (!isExample && begins && !line.empty())
            page.append(".PP\n");
        inExample = isExample;
        begins = line.empty();
        if (!line.empty())
            page.append(escaped(line)).append("\n");
    }
    if (inExample)
        page.append(".EE\n");
}

void writeOptions(const CommandEntry& command, std::string& page) {
    for (const OptionEntry& option : command.options)
        page.append(".TP\n").append(heading(option)).append("\n").append(escaped(option.description)).append(".\n");
}

/// "vtsym simplify [OPTIONS] [TEXT ...]".
void writeSynopsis(const std::string& program, const CommandEntry& command, std::string& page) {
    page.append("\\fB" + escaped(program) + " " + escaped(command.name) + R"(\fR [\fIOPTIONS\fR])");
    for (const OptionEntry& option : command.options)
        if (option.isPositional())
            page.append(option.isRequired ? " " : " [").append(heading(option)).append(option.isRequired ? "" : "]");
    page.append("\n");
}

} // namespace

std::string manualPage(const ProgramEntry& program) {
    const std::string& name = program.program.name;
    std::string page = ".\\\" Written by `" + name + " man`.\n.TH VTSYM 1 \"\" \"" + name + " " +
                       escaped(program.version) + "\" \"User Commands\"\n";
    page.append(".SH NAME\n" + name + " \\- simplify, compare and check conditions over integers\n.SH SYNOPSIS\n");
    page.append(".nf\n");
    for (const CommandEntry& command : program.commands)
        writeSynopsis(name, command, page);
    page.append(".fi\n.SH DESCRIPTION\n" + escaped(program.program.description) + "\n");
    writeNotes(program.program.notes, page);
    page.append(".SH OPTIONS\n");
    writeOptions(program.program, page);
    page.append(".SH COMMANDS\n");
    for (const CommandEntry& command : program.commands) {
        page.append(".SS " + escaped(command.name) + "\n" + escaped(command.description) + ".\n");
        writeOptions(command, page);
        writeNotes(command.notes, page);
    }
    return page;
}

} // namespace vtsym
