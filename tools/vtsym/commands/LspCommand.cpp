// vtsym lsp: a language server on standard input and output.
//
// What has arrived is read before it is answered, and diagnostics wait until nothing more has arrived: so cancellations
// are seen, and of several keys the last one counts.  What arrives while a source is scanned may end that scan.
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/lsp/LanguageServer.hpp"
#include "tools/vtsym/lsp/MessageFraming.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <array>
#include <cerrno>
#include <functional>
#include <poll.h>
#include <system_error>
#include <unistd.h>

namespace vtsym {

namespace {

constexpr const char* lspNotes =
    R"(An editor starts this command and talks to it on standard input and output by the language server protocol.  It reports
the findings of scan in C and C++ sources and those of check in models while they are typed, says under which condition a
line is built, dims what no build has, and applies proposals.  A file .vtsym.toml in the folder that is edited has the
settings of scan.  docs/editor.md shows how to set up editors.

Exit status: 0 the editor ended the server in order, 1 it did not.

Examples:
  vtsym lsp
  printf 'Content-Length: 33\r\n\r\n{"jsonrpc":"2.0","method":"exit"}' | vtsym lsp)";

/// Reads what arrives on standard input.
class Input {
public:
    /// Reads once.  With `waits`, until something arrives; otherwise only what is there.  Returns false where nothing
    /// is.  Throws std::system_error where the system refuses.
    bool read(FrameReader& frames, bool waits) {
        pollfd input{STDIN_FILENO, POLLIN, 0};
        while (!hasEnded_) {
            const int ready = poll(&input, 1, waits ? -1 : 0);
            if (ready == 0)
                return false;
            const ssize_t got = ready < 0 ? -1 : ::read(STDIN_FILENO, part_.data(), part_.size());
            if (got < 0 && errno == EINTR)
                continue;
            if (got < 0)
                throw std::system_error(errno, std::generic_category(), "standard input cannot be read");
            hasEnded_ = got <= 0;
            if (hasEnded_)
                return false;
            frames.feed({part_.data(), static_cast<std::size_t>(got)});
            return true;
        }
        return false;
    }

    [[nodiscard]] bool hasEnded() const noexcept { return hasEnded_; }

private:
    std::array<char, std::size_t{1} << 16U> part_{};
    bool hasEnded_ = false;
};

bool serve(Console& console) {
    FrameReader frames;
    const auto input = std::make_unique<Input>();
    std::function<void()> takeAll;
    LanguageServer server(
        [&console](const std::string& message) {
            console.out(framed(message));
            console.flush();
        },
        [&takeAll] { takeAll(); });
    const auto take = [&] {
        while (server.waiting() < mostWaiting) {
            const std::optional<ReceivedFrame> frame = frames.next();
            if (!frame)
                return;
            if (frame->isFault)
                server.receiveFault(frame->text);
            else
                server.receive(frame->text);
        }
    };
    takeAll = [&] {
        take();
        while (server.waiting() < mostWaiting && input->read(frames, false))
            take();
    };
    while (!server.hasEnded()) {
        takeAll();
        if (server.waiting() > 0)
            server.handleNext();
        else if (!server.publishNext() && !input->read(frames, true))
            break; // the editor is gone
    }
    return server.wasShutDown();
}

} // namespace

void addLsp(CommandLine& program) {
    Command& command =
        program.add("lsp", "Serve an editor: findings, conditions and proposals while you type", lspNotes);
    command.run = [](Console& console) { return serve(console); };
}

} // namespace vtsym
