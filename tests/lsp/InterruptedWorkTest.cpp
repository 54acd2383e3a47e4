// Messages that arrive while a document is scanned, at each of its conditions in turn.
#include "tools/vtsym/lsp/LanguageServer.hpp"

#include <gtest/gtest.h>

namespace vtsym {
namespace {

constexpr const char* uri = "file:///a.c";
constexpr int conditions = 5;

Json notificationOf(const char* method, Json params) {
    return {{"jsonrpc", "2.0"}, {"method", method}, {"params", std::move(params)}};
}

Json requestOf(int id, const char* method, Json params) {
    Json request = notificationOf(method, std::move(params));
    request["id"] = id;
    return request;
}

Json opened(const char* document) {
    std::string text;
    for (int i = 0; i < conditions; ++i)
        text += "#if A > " + std::to_string(i) + "\n#endif\n";
    return notificationOf("textDocument/didOpen",
                          {{"textDocument", {{"uri", document}, {"languageId", "c"}, {"version", 1}, {"text", text}}}});
}

Json changed(const char* document) {
    return notificationOf("textDocument/didChange", {{"textDocument", {{"uri", document}, {"version", 2}}},
                                                     {"contentChanges", {{{"text", "#if A && !A\n#endif\n"}}}}});
}

Json hover(int id) {
    return requestOf(id, "textDocument/hover",
                     {{"textDocument", {{"uri", uri}}}, {"position", {{"line", 0}, {"character", 0}}}});
}

Json cancelled(int id) {
    return notificationOf("$/cancelRequest", {{"id", id}});
}

/// A server to which messages arrive as it asks for the nth time whether some did.
class Session {
public:
    void receive(const Json& message) { server_.receive(message.dump()); }

    void arrivesAt(int asked, Json message) {
        at_ = asked;
        message_ = std::move(message);
        asked_ = 0;
    }

    /// Handles all that waits; then sends diagnostics.
    void work() {
        do {
            while (server_.waiting() > 0)
                server_.handleNext();
        } while (server_.publishNext() || server_.waiting() > 0);
    }

    [[nodiscard]] int asked() const { return asked_; }

    /// What was sent: errors, results by their ids, diagnostics by their version and number.
    std::string take() {
        std::string all;
        for (const Json& sent : std::exchange(sent_, {})) {
            all += all.empty() ? "" : "; ";
            if (sent.contains("error"))
                all += sent["id"].dump() + ": " + sent["error"]["code"].dump();
            else if (sent.contains("id"))
                all += sent["id"].dump() + ": answered";
            else if (sent["params"].contains("diagnostics"))
                all += "version " + sent["params"].value("version", Json()).dump() + ": " +
                       std::to_string(sent["params"]["diagnostics"].size());
            else
                all += sent.dump();
        }
        return all;
    }

private:
    void arrive() {
        if (++asked_ == at_)
            receive(message_);
    }

    std::vector<Json> sent_;
    Json message_;
    int at_ = 0;
    int asked_ = 0;
    LanguageServer server_{[this](const std::string& message) { sent_.push_back(Json::parse(message)); },
                           [this] { arrive(); }};
};

void begin(Session& session) {
    session.receive(requestOf(0, "initialize", {{"capabilities", Json::object()}}));
    session.work();
    session.take();
    session.receive(opened(uri));
}

TEST(InterruptedWork, OnDiagnostics) {
    for (int at = 1; at <= conditions; ++at) {
        SCOPED_TRACE(at);
        Session session;
        begin(session);
        session.arrivesAt(at, changed(uri));
        session.work();
        EXPECT_EQ(session.take(), "version 2: 1");
        EXPECT_EQ(session.asked(), at + 1);
        session.receive(opened(uri));
        session.arrivesAt(at, notificationOf("textDocument/didClose", {{"textDocument", {{"uri", uri}}}}));
        session.work();
        EXPECT_EQ(session.take(), "version null: 0");
        EXPECT_EQ(session.asked(), at);
        session.receive(opened(uri));
        session.arrivesAt(at, requestOf(9, "shutdown", nullptr));
        session.work();
        EXPECT_EQ(session.take(), "9: answered");
        EXPECT_EQ(session.asked(), at);
    }
}

TEST(InterruptedWork, OnRequests) {
    for (int at = 1; at <= conditions; ++at) {
        SCOPED_TRACE(at);
        Session session;
        begin(session);
        session.receive(hover(1));
        session.arrivesAt(at, cancelled(1));
        session.work();
        EXPECT_EQ(session.take(), "1: -32800; version 1: 0");
        EXPECT_EQ(session.asked(), at + conditions);
        session.receive(opened(uri));
        session.receive(hover(2));
        session.arrivesAt(at, changed(uri));
        session.work();
        EXPECT_EQ(session.take(), "2: -32801; version 2: 1");
        // The identifier of a cancelled request may be used again.
        session.receive(opened(uri));
        session.receive(hover(1));
        session.work();
        EXPECT_EQ(session.take(), "1: answered; version 1: 0");
    }
}

TEST(InterruptedWork, NotByWhatIsAboutOthers) {
    Session session;
    begin(session);
    session.receive(hover(1));
    session.receive(hover(2));
    session.arrivesAt(2, cancelled(2));
    session.work();
    EXPECT_EQ(session.take(), "2: -32800; 1: answered; version 1: 0");
    session.receive(opened(uri));
    session.arrivesAt(3, opened("file:///b.c"));
    session.work();
    EXPECT_EQ(session.take(), "version 1: 0; version 1: 0");
    session.receive(opened(uri));
    session.receive(hover(3));
    session.arrivesAt(3, cancelled(4));
    session.work();
    EXPECT_EQ(session.take(), "3: answered; version 1: 0");
}

} // namespace
} // namespace vtsym
