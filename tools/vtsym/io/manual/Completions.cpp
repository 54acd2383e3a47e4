// Writes completion scripts: a table of the commands, options and words, and what the shell needs to look them up.
// Files are completed where an argument is one; texts of conditions are not completed.
#include "tools/vtsym/io/manual/Completions.hpp"

#include <algorithm>
#include <string_view>

namespace vtsym {

namespace {

/// A word in single quotes of a shell, with further bytes escaped before.
std::string shellWord(std::string_view text, std::string_view escaped = {}) {
    std::string result = "'";
    for (const char c : text) {
        if (escaped.find(c) != std::string_view::npos)
            result += '\\';
        result += c == '\'' ? "'\\''" : std::string(1, c);
    }
    return result + "'";
}

std::string joined(const std::vector<std::string>& words) {
    std::string result;
    for (const std::string& word : words)
        result += (result.empty() ? "" : " ") + word;
    return result;
}

/// The names of the options that fulfil a condition.
template <class Condition>
std::vector<std::string> namesOf(const CommandEntry& command, Condition condition) {
    std::vector<std::string> names;
    for (const OptionEntry& option : command.options)
        if (!option.isPositional() && condition(option))
            names.insert(names.end(), option.names.begin(), option.names.end());
    return names;
}

std::vector<std::string> namesOf(const std::vector<CommandEntry>& commands) {
    std::vector<std::string> names;
    names.reserve(commands.size());
    for (const CommandEntry& command : commands)
        names.push_back(command.name);
    return names;
}

bool takesFiles(const CommandEntry& command) {
    return std::ranges::any_of(command.options,
                               [](const OptionEntry& option) { return option.isPositional() && option.takesFiles(); });
}

// ---- bash

/// The rows of the table of one command: `find COMMAND/OPTION` is what comes after it.
void writeBashRows(const CommandEntry& command, std::string_view name, std::string& script) {
    const auto row = [&script, name](const std::vector<std::string>& options, const std::string& answer) {
        for (const std::string& option : options)
            script.append("    ").append(name).append("/").append(option).append(") ").append(answer).append(" ;;\n");
    };
    for (const OptionEntry& option : command.options) {
        if (option.isPositional() || option.value.empty())
            continue;
        row(option.names, option.takesFiles()    ? "files=1"
                          : option.words.empty() ? "words="
                                                 : "words=" + shellWord(joined(option.words)));
    }
    script.append("    ").append(name).append("/*)\n        options=");
    script.append(shellWord(joined(namesOf(command, [](const OptionEntry&) { return true; })))).append("\n");
    if (takesFiles(command))
        script.append("        files=1\n");
    script.append("        ;;\n");
}

std::string bashScript(const ProgramEntry& program) {
    const std::string& name = program.program.name;
    const std::string commands = joined(namesOf(program.commands));
    std::string script = "# Completion of " + name + " in bash; written by `" + name + " completion bash`.\n";
    script.append(R"(
_vtsym() {
    local current=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
    local command='' options='' words='' files='' ended='' word i
    # bash takes = for a word of its own: --to=c is three words
    if [[ $current == '=' ]]; then
        current=''
    elif [[ $before == '=' ]] && ((COMP_CWORD >= 2)); then
        before=${COMP_WORDS[COMP_CWORD - 2]}
    fi
    for ((i = 1; i < COMP_CWORD; ++i)); do
        word=${COMP_WORDS[i]}
        [[ $word == -- ]] && before='' ended=1 # only texts and files come after it
        if [[ -z $command && " )" +
                  commands + R"( " == *" $word "* ]]; then
            command=$word
        fi
    done
    case $command/$before in
)");
    writeBashRows(program.program, "", script);
    for (const CommandEntry& command : program.commands)
        writeBashRows(command, command.name, script);
    script.append("    esac\n    COMPREPLY=()\n    [[ -n $command ]] || words=" + shellWord(commands));
    script.append(R"(
    [[ $current == -* && -z $ended ]] && words=$options files=''
    if [[ -n $files ]]; then
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -- "$current")
    else
        mapfile -t COMPREPLY < <(compgen -W "$words" -- "$current")
    fi
} && complete -F _vtsym vtsym
)");
    return script;
}

// ---- zsh

/// What the shell completes as the argument: ":LANGUAGE:(c quill)".  A text has an empty list, because a message
/// instead of one would keep the only match among the options from being inserted.
std::string zshArgument(const OptionEntry& option) {
    return ":" + option.value + ":" + (option.takesFiles() ? "_files" : "(" + joined(option.words) + ")");
}

void writeZshArguments(const CommandEntry& command, std::string_view indent, std::string& script) {
    for (const OptionEntry& option : command.options) {
        const std::string before = option.repeats ? "*" : "";
        if (option.isPositional()) {
            script.append(" \\\n").append(indent).append(shellWord(before + zshArgument(option)));
            continue;
        }
        const std::string others = option.repeats ? "" : "(" + joined(option.names) + ")";
        for (const std::string& name : option.names) {
            const bool takesAssignment = !option.value.empty() && name.starts_with("--");
            std::string text = others;
            text.append(before).append(name).append(takesAssignment ? "=[" : "[").append(option.description) += ']';
            script.append(" \\\n").append(indent);
            script.append(shellWord(option.value.empty() ? text : text + zshArgument(option)));
        }
    }
    script.append("\n");
}

std::string zshScript(const ProgramEntry& program) {
    const std::string& name = program.program.name;
    std::string script =
        "#compdef " + name + "\n# Completion of " + name + " in zsh; written by `" + name + R"( completion zsh`.

_vtsym() {
    local curcontext="$curcontext" state line ret=1
    typeset -A opt_args
    local -a commands
    commands=(
)";
    for (const CommandEntry& command : program.commands)
        script.append("        ").append(shellWord(command.name + ":" + command.description)).append("\n");
    script.append("    )\n    _arguments -C '(-)1:command:->command' '(-)*::argument:->argument'");
    writeZshArguments(program.program, "        ", script);
    script.append(R"(    [[ $? == 0 ]] && ret=0
    case $state in
    command) _describe command commands && ret=0 ;;
    argument)
        case $words[1] in
)");
    for (const CommandEntry& command : program.commands) {
        script.append("        ").append(command.name).append(")\n            _arguments");
        writeZshArguments(command, "                ", script);
        script.append("            ret=$?\n            ;;\n");
    }
    script.append(R"(        esac
        ;;
    esac
    return ret
}

if [[ $funcstack[1] == _vtsym ]]; then
    _vtsym "$@"
else
    compdef _vtsym vtsym
fi
)");
    return script;
}

// ---- fish

void writeFishOptions(const CommandEntry& command, const std::string& start, std::string& script) {
    for (const OptionEntry& option : command.options) {
        std::string line = start;
        if (!option.isPositional())
            for (const std::string& name : option.names)
                line += name.starts_with("--") ? " -l " + name.substr(2) : " -s " + name.substr(1);
        if (option.takesFiles())
            line += option.isPositional() ? " -F" : " -rF";
        else if (option.isPositional())
            continue;
        else if (!option.words.empty())
            line += " -xa " + shellWord(joined(option.words));
        else if (!option.value.empty())
            line += " -x";
        script.append(line).append(option.isPositional() ? "" : " -d " + shellWord(option.description, "\\"));
        script.append("\n");
    }
}

std::string fishScript(const ProgramEntry& program) {
    const std::string& name = program.program.name;
    std::string script = "# Completion of " + name + " in fish; written by `" + name + " completion fish`.\n\n" +
                         "complete -c " + name + " -f\n";
    const std::string none =
        "complete -c " + name + " -n 'not __fish_seen_subcommand_from " + joined(namesOf(program.commands)) + "'";
    writeFishOptions(program.program, none, script);
    for (const CommandEntry& command : program.commands)
        script.append(none + " -a " + command.name + " -d " + shellWord(command.description, "\\") + "\n");
    for (const CommandEntry& command : program.commands)
        writeFishOptions(command, "complete -c " + name + " -n '__fish_seen_subcommand_from " + command.name + "'",
                         script);
    return script;
}

struct Shell {
    const char* name;
    std::string (*script)(const ProgramEntry&);
};

constexpr Shell shells[]{{"bash", bashScript}, {"zsh", zshScript}, {"fish", fishScript}};

} // namespace

const std::vector<std::string>& completionShells() {
    static const std::vector<std::string> names = [] {
        std::vector<std::string> result;
        for (const Shell& shell : shells)
            result.emplace_back(shell.name);
        return result;
    }();
    return names;
}

std::string completionScript(const ProgramEntry& program, const std::string& shell) {
    return std::ranges::find(shells, shell, &Shell::name)->script(program);
}

} // namespace vtsym
