// vtsym man and vtsym completion: the manual page and the completions of shells, which packages install.
// The help does not list them.
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/manual/Completions.hpp"
#include "tools/vtsym/io/manual/ManualPage.hpp"

namespace vtsym {

namespace {

constexpr const char* manualNotes =
    R"(Examples:
  vtsym man > vtsym.1
  vtsym man | man -l -)";

constexpr const char* completionNotes =
    R"(Packages install these scripts.  Without a package, source the script in the start file of the shell.

Examples:
  vtsym completion fish > ~/.config/fish/completions/vtsym.fish
  source <(vtsym completion bash))";

} // namespace

void addManual(CommandLine& program) {
    Command& command = program.add("man", "Write the manual page", manualNotes);
    command.hide();
    command.run = [&program](Console& console) {
        console.out(manualPage(program.entries()));
        console.flush();
        return true;
    };
}

void addCompletion(CommandLine& program) {
    Command& command = program.add("completion", "Write the completions of a shell", completionNotes);
    command.hide();
    const auto shell = std::make_shared<std::string>();
    command.addChoice({"SHELL", "bash, zsh or fish"}, completionShells(),
                      [shell](const std::string& word) { *shell = word; });
    command.require("SHELL");
    command.run = [&program, shell](Console& console) {
        console.out(completionScript(program.entries(), *shell));
        console.flush();
        return true;
    };
}

} // namespace vtsym
