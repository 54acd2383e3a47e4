#include "tests/lsp/LanguageClient.hpp"

#include <array>
#include <csignal>
#include <fcntl.h>
#include <poll.h>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

namespace VT::Testing {

namespace {

constexpr int patience = 60'000; ///< milliseconds

}

std::string framed(const std::string& content) {
    return "Content-Length: " + std::to_string(content.size()) + "\r\n\r\n" + content;
}

LanguageClient::LanguageClient(const TemporaryFolder& place) {
    std::signal(SIGPIPE, SIG_IGN);
    std::array<int, 2> in{};
    std::array<int, 2> out{};
    if (pipe2(in.data(), O_CLOEXEC) != 0 || pipe2(out.data(), O_CLOEXEC) != 0)
        throw std::runtime_error("there are no pipes");
    const std::string folder = place.path("");
    child_ = fork();
    if (child_ == 0) {
        dup2(in[0], STDIN_FILENO);
        dup2(out[1], STDOUT_FILENO);
        if (chdir(folder.c_str()) == 0)
            execl(VTSYM_PROGRAM, "vtsym", "lsp", nullptr);
        _exit(127);
    }
    close(in[0]);
    close(out[1]);
    input_ = in[1];
    output_ = out[0];
}

LanguageClient::~LanguageClient() {
    if (child_ > 0) {
        kill(child_, SIGKILL);
        waitpid(child_, nullptr, 0);
    }
    close(input_);
    close(output_);
}

void LanguageClient::write(const std::string& bytes) {
    for (std::size_t at = 0; at < bytes.size();) {
        const ssize_t written = ::write(input_, bytes.data() + at, bytes.size() - at);
        if (written <= 0)
            return; // the server is gone, which finish() shows
        at += static_cast<std::size_t>(written);
    }
}

Json LanguageClient::receive() {
    while (true) {
        const std::size_t header = received_.find("\r\n\r\n");
        if (header != std::string::npos && received_.starts_with("Content-Length: ")) {
            const std::size_t length = std::stoul(received_.substr(16));
            if (received_.size() >= header + 4 + length) {
                const std::string content = received_.substr(header + 4, length);
                received_.erase(0, header + 4 + length);
                return Json::parse(content, nullptr, false);
            }
        }
        std::array<char, 65536> part{};
        pollfd output{output_, POLLIN, 0};
        const ssize_t got = poll(&output, 1, patience) == 1 ? read(output_, part.data(), part.size()) : 0;
        if (got <= 0)
            return nullptr;
        received_.append(part.data(), static_cast<std::size_t>(got));
    }
}

int LanguageClient::finish() {
    close(input_);
    input_ = -1;
    int status = 0;
    waitpid(child_, &status, 0);
    child_ = -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

Json fullAbilities(const std::string& folder) {
    return {{"processId", nullptr},
            {"rootUri", "file://" + folder},
            {"capabilities",
             {{"workspace", {{"workspaceEdit", {{"documentChanges", true}}}}},
              {"textDocument",
               {{"hover", {{"contentFormat", {"plaintext"}}}},
                {"documentSymbol", {{"hierarchicalDocumentSymbolSupport", true}}},
                {"codeAction", {{"codeActionLiteralSupport", {{"codeActionKind", {{"valueSet", {"quickfix"}}}}}}}},
                {"publishDiagnostics", {{"relatedInformation", true}, {"tagSupport", {{"valueSet", {1, 2}}}}}}}}}}};
}

} // namespace VT::Testing
