// Takes messages, keeps the order that the protocol prescribes, and hands requests to what answers them.
//
// Every request gets one answer, whatever happens while it is worked on; a notification gets none.
// Relies on: one thread.  A message is answered before the next one changes a document.
#include "tools/vtsym/lsp/LanguageServer.hpp"

#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>
#include <new>

namespace vtsym {

void LanguageServer::receive(std::string_view message) {
    Json id;
    try {
        RpcMessage read = readRpc(message, id);
        if (read.isResponse)
            return;
        if (!read.isRequest() && read.method == "$/cancelRequest")
            cancel(read.params);
        else
            waiting_.push_back(std::move(read));
    } catch (const RpcFault& fault) {
        send_(rpcError(id, fault.error(), fault.what()));
    } catch (const std::bad_alloc&) {
        send_(rpcError(nullptr, RpcError::InternalError, "there is not enough memory for a message"));
    }
}

void LanguageServer::receiveFault(const std::string& sentence) {
    send_(rpcError(nullptr, RpcError::ParseError, sentence));
}

/// Answers a request that still waits, and leaves the one that is worked on; one that was answered stays so.
void LanguageServer::cancel(const Json& params) {
    const Json* const id = memberAt(params, "id");
    isCancelled_ = isCancelled_ || (id != nullptr && !id->is_null() && *id == answered_);
    const auto request = id == nullptr ? waiting_.end() : std::ranges::find(waiting_, *id, &RpcMessage::id);
    if (request == waiting_.end() || !request->isRequest() || request->method == "initialize" ||
        request->method == "shutdown")
        return;
    send_(rpcError(request->id, RpcError::RequestCancelled, "the request was cancelled"));
    waiting_.erase(request);
    seen_ = 0;
}

void LanguageServer::handleNext() {
    const RpcMessage message = std::move(waiting_.front());
    waiting_.pop_front();
    if (message.isRequest())
        handleRequest(message);
    else
        handleNotification(message);
}

const std::map<std::string, LanguageServer::Request, std::less<>>& LanguageServer::requests() {
    static const std::map<std::string, Request, std::less<>> all{
        {"initialize", &LanguageServer::initialize},
        {"shutdown", &LanguageServer::shutDown},
        {"textDocument/hover", &LanguageServer::hover},
        {"textDocument/codeAction", &LanguageServer::codeActions},
        {"textDocument/documentSymbol", &LanguageServer::documentSymbols},
    };
    return all;
}

const std::map<std::string, LanguageServer::Notification, std::less<>>& LanguageServer::notifications() {
    static const std::map<std::string, Notification, std::less<>> all{
        {"textDocument/didOpen", &LanguageServer::open},
        {"textDocument/didChange", &LanguageServer::change},
        {"textDocument/didSave", &LanguageServer::save},
        {"textDocument/didClose", &LanguageServer::close},
        {"workspace/didChangeWorkspaceFolders", &LanguageServer::changeFolders},
        {"workspace/didChangeWatchedFiles", &LanguageServer::checkFiles},
        {"workspace/didChangeConfiguration", &LanguageServer::checkFiles},
    };
    return all;
}

Json LanguageServer::answer(const RpcMessage& message) {
    const bool isFirst = message.method == "initialize";
    if (state_ == State::Fresh && !isFirst)
        throw RpcFault(RpcError::ServerNotInitialized, "the first request has to be initialize");
    if (state_ == State::ShutDown)
        throw RpcFault(RpcError::InvalidRequest, "the server was shut down; only exit may follow");
    if (state_ != State::Fresh && isFirst)
        throw RpcFault(RpcError::InvalidRequest, "the server is initialized already");
    const auto request = requests().find(message.method);
    if (request == requests().end())
        throw RpcFault(RpcError::MethodNotFound, "there is no method '" + message.method + "'");
    return (this->*request->second)(message.params);
}

void LanguageServer::handleRequest(const RpcMessage& message) {
    std::string response;
    answered_ = message.id;
    try {
        response = rpcResult(message.id, answer(message));
    } catch (const RpcFault& fault) {
        response = rpcError(message.id, fault.error(), fault.what());
    } catch (const std::exception& error) {
        response = rpcError(message.id, RpcError::InternalError, error.what());
    }
    answered_ = nullptr;
    isCancelled_ = false;
    send_(response);
}

void LanguageServer::handleNotification(const RpcMessage& message) {
    if (message.method == "exit") {
        wasShutDown_ = state_ == State::ShutDown;
        state_ = State::Ended;
        return;
    }
    const auto notification = notifications().find(message.method);
    if (state_ != State::Running || notification == notifications().end())
        return;
    try {
        (this->*notification->second)(message.params);
    } catch (const std::exception& error) {
        log(message.method + ": " + error.what());
    }
}

void LanguageServer::log(const std::string& sentence) {
    send_(rpcNotification("window/logMessage", {{"type", 2}, {"message", sentence}}));
}

/// Takes what has arrived, and throws where the work on a document is of no use any more: it is cancelled, or what was
/// found would be that of an earlier text.
void LanguageServer::leaveFor(const OpenDocument& document) {
    if (!arrive_)
        return;
    arrive_();
    if (isCancelled_)
        throw RpcFault(RpcError::RequestCancelled, "the request was cancelled");
    for (; seen_ < waiting_.size(); ++seen_) {
        const RpcMessage& message = waiting_[seen_];
        const bool isOfText = message.method == "textDocument/didChange" || message.method == "textDocument/didClose" ||
                              message.method == "textDocument/didOpen";
        const Json* const uri = isOfText ? memberAt(message.params, "textDocument/uri") : nullptr;
        if (message.method == "exit" || message.method == "shutdown" || (uri != nullptr && *uri == document.uri))
            throw RpcFault(RpcError::ContentModified, "the document was changed while it was read");
    }
}

void LanguageServer::analyse(OpenDocument& document) {
    if (document.analysis)
        return;
    seen_ = 0;
    document.analysis = projectOf(document.uri).analyse(document, [this, &document] { leaveFor(document); });
}

/// Sends diagnostics, unless the document is left for what arrived.
void LanguageServer::publish(OpenDocument& document) {
    document.isSent = true; // what fails once is not tried again
    std::string message;
    try {
        analyse(document);
        message = rpcNotification("textDocument/publishDiagnostics", diagnosticsOf(document, abilities_));
    } catch (const RpcFault&) {
        document.isSent = false;
        return;
    } catch (const std::exception& error) {
        message = rpcNotification("window/logMessage", {{"type", 2}, {"message", document.uri + ": " + error.what()}});
    }
    send_(message);
}

bool LanguageServer::publishNext() {
    for (auto& [uri, document] : documents_) {
        if (document.isSent || document.kind == DocumentKind::Other)
            continue;
        publish(document);
        return true;
    }
    return false;
}

OpenDocument& LanguageServer::documentOf(const Json& params) {
    const auto document = documents_.find(textAt(params, "textDocument/uri"));
    if (document == documents_.end())
        throw RpcFault(RpcError::InvalidParams, "the document is not open");
    return document->second;
}

OpenDocument& LanguageServer::analysed(const Json& params) {
    OpenDocument& document = documentOf(params);
    analyse(document);
    return document;
}

} // namespace vtsym
