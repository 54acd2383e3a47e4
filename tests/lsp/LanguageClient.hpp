// A client of `vtsym lsp` that plays what a test says.
#pragma once

#include "tests/support/TemporaryFolder.hpp"

#include <nlohmann/json.hpp>

#include <optional>
#include <string>
#include <sys/types.h>

namespace VT::Testing {

using Json = nlohmann::json;

/// A message in its frame.
std::string framed(const std::string& content);

/// Starts the program, and talks to it through pipes.  Answers are waited for a minute at most.
class LanguageClient {
public:
    explicit LanguageClient(const TemporaryFolder& place);
    LanguageClient(const LanguageClient&) = delete;
    LanguageClient& operator=(const LanguageClient&) = delete;
    ~LanguageClient();

    /// Writes bytes at once, so that the server reads up to 4096 of them together.
    void write(const std::string& bytes);

    void send(const Json& message) { write(framed(message.dump())); }

    /// The next message of the server; null where it ended, or said nothing that is a message.
    Json receive();
    /// Ends the input and returns the exit status; above 128 where a signal ended the server.
    int finish();

private:
    int input_ = -1;
    int output_ = -1;
    pid_t child_ = -1;
    std::string received_;
};

/// The parameters of initialize, of a client that can show everything.
Json fullAbilities(const std::string& folder);

} // namespace VT::Testing
