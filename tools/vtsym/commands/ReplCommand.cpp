// vtsym repl: a prompt on a terminal, one answer a line otherwise.
// The session answers; this reads lines and reports errors.
#include "tools/vtsym/answers/Session.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/LineEditor.hpp"

#include <unistd.h>

namespace vtsym {

namespace {

constexpr const char* replNotes =
    R"(On a terminal, lines are edited, with a history, and Tab completes names.  Otherwise every line of standard input is
answered by one line, as by the other commands.  :help lists the commands of the prompt.

Examples:
  vtsym repl
  printf 'A>2 && A<4\nans || A>3\n:tree\n' | vtsym repl)";

/// Answers the lines typed on a terminal.  Returns true, since errors in a dialogue are no failure of the program.
bool talk(Session& session, Console& console) {
    LineEditor editor("> ", [&session]() -> const std::set<std::string>& { return session.words(); });
    while (const std::optional<std::string> line = editor.read()) {
        std::string out;
        try {
            session.answer(*line, out);
        } catch (...) {
            const TextError error = currentTextError();
            console.err(errorText(*line, error, console.errStyle()));
            continue;
        }
        if (session.ended())
            break;
        if (!out.empty())
            console.out(out + "\n");
        console.flush();
    }
    return true;
}

} // namespace

void addRepl(CommandLine& program) {
    Command& command = program.add("repl", "Simplify conditions at a prompt", replNotes);
    const auto options = std::make_shared<TextOptions>();
    addSourceOption(command, *options);
    command.run = [options](Console& console) {
        Session session(*options, console.outStyle());
        if (isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1)
            return talk(session, console);
        const auto answer = [&](const std::string& line, std::string& out) {
            if (!session.ended())
                session.answer(line, out);
        };
        return answerOneByOne(*options, console, {answer});
    };
}

} // namespace vtsym
