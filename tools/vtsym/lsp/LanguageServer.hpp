// A server of the language server protocol, version 3.17, for one client.
#pragma once

#include "tools/vtsym/lsp/EditorAnswers.hpp"
#include "tools/vtsym/lsp/ProjectFolder.hpp"
#include "tools/vtsym/lsp/RpcMessages.hpp"

#include <deque>
#include <functional>
#include <list>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// Answers messages one by one.  Messages wait until handleNext(), so that a cancellation, which is taken at once,
/// finds the request that it is about.  Diagnostics are made by publishNext(), so that a caller who has further
/// messages can hand over those first: of several changes, the last one counts.  A document that takes long is left
/// where a change of it, its end, or a cancellation arrives meanwhile.
class LanguageServer {
public:
    /// Receives each message to the client, without its frame.
    using Send = std::function<void(const std::string& message)>;

    /// Hands over, with receive(), what has arrived since; called from time to time while a document is read.
    using Arrive = std::function<void()>;

    explicit LanguageServer(Send send, Arrive arrive = {}) : send_(std::move(send)), arrive_(std::move(arrive)) {}

    /// Takes a message of the client, or what is wrong with the stream.
    void receive(std::string_view message);
    void receiveFault(const std::string& sentence);

    [[nodiscard]] std::size_t waiting() const noexcept { return waiting_.size(); }

    /// Handles the message that has waited longest.
    void handleNext();
    /// Sends the diagnostics of a document that changed, or leaves it for what arrived; false where there is none.
    bool publishNext();

    /// Whether the client said goodbye, and whether it did so in order.
    [[nodiscard]] bool hasEnded() const noexcept { return state_ == State::Ended; }

    [[nodiscard]] bool wasShutDown() const noexcept { return wasShutDown_; }

private:
    enum class State : std::uint8_t { Fresh, Running, ShutDown, Ended };
    using Request = Json (LanguageServer::*)(const Json& params);
    using Notification = void (LanguageServer::*)(const Json& params);

    static const std::map<std::string, Request, std::less<>>& requests();
    static const std::map<std::string, Notification, std::less<>>& notifications();

    void handleRequest(const RpcMessage& message);
    void handleNotification(const RpcMessage& message);
    Json answer(const RpcMessage& message);
    void cancel(const Json& params);
    void log(const std::string& sentence);
    void publish(OpenDocument& document);
    void leaveFor(const OpenDocument& document);

    Json initialize(const Json& params);
    Json shutDown(const Json& params);
    Json hover(const Json& params);
    Json codeActions(const Json& params);
    Json documentSymbols(const Json& params);
    void open(const Json& params);
    void change(const Json& params);
    void save(const Json& params);
    void close(const Json& params);
    void changeFolders(const Json& params);
    void checkFiles(const Json& params);

    void readAbilities(const Json& capabilities);
    void addFolder(const std::string& uri);
    ProjectFolder& projectOf(const std::string& uri);
    void assign(OpenDocument& document);
    void refreshProjects();
    OpenDocument& documentOf(const Json& params);
    OpenDocument& analysed(const Json& params);
    void analyse(OpenDocument& document);

    Send send_;
    Arrive arrive_;
    Json answered_ = nullptr;  ///< the request that is worked on; null for none
    bool isCancelled_ = false; ///< it is
    std::size_t seen_ = 0;     ///< messages, of those that wait, that do not concern the document that is read
    State state_ = State::Fresh;
    bool wasShutDown_ = false;
    EditorAbilities abilities_;
    std::deque<RpcMessage> waiting_;
    std::list<ProjectFolder> projects_;
    std::map<std::string, OpenDocument> documents_; ///< by URI
    std::map<std::string, std::string> languages_;  ///< of open documents, as the editor has them
};

} // namespace vtsym
