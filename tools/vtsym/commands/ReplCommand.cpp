// vtsym repl
#include "tools/vtsym/answers/Session.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/LineEditor.hpp"

#include <unistd.h>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(On a terminal lines are edited, with a history and completion of names by Tab.  Otherwise every line of standard input is
answered as by the other commands.

Examples:
  vtsym repl
  printf 'A>2 && A<4\nans || A>3\n:tree\n' | vtsym repl)";

/// Talks with the user; true, for nobody asks a dialogue how it went.
bool talk(Session& session, Console& console) {
    LineEditor editor("> ", [&session]() -> const std::set<std::string>& { return session.words(); });
    while (const std::optional<std::string> line = editor.read()) {
        std::string out;
        try {
            session.answer(*line, out);
        } catch (...) {
            const TextError error = currentTextError();
            console.words(errorText(*line, error, console.wordStyle()));
            continue;
        }
        if (session.ended())
            break;
        if (!out.empty())
            console.data(out + "\n");
        console.flush();
    }
    return true;
}

} // namespace

Command addRepl(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("repl", "Answer conditions and commands as they are typed");
    const auto options = std::make_shared<TextOptions>();
    addSourceOption(*command, *options);
    command->footer(examples);
    return {command, [options](Console& console) {
                Session session(*options, console.dataStyle());
                if (isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1)
                    return talk(session, console);
                const auto answer = [&](const std::string& line, std::string& out) {
                    if (!session.ended())
                        session.answer(line, out);
                };
                return answerTexts(*options, console, {answer});
            }};
}

} // namespace vtsym
