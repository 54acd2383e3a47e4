// Changes of documents, against an editor of UTF-16 code units that shares no code with the server.
#include "host/Text.hpp"
#include "tests/lsp/LanguageClient.hpp"

#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

/// A document as an editor has it.
class Editor {
public:
    explicit Editor(std::u16string text) : text_(std::move(text)) {}

    [[nodiscard]] std::string utf8() const { return cvt_ustring_string(text_); }

    /// Replaces a part of the text that is chosen at random, and returns the change as the protocol has it.
    Json change(std::mt19937_64& random, const std::u16string& text) {
        std::size_t begin = below(random, text_.size() + 1);
        std::size_t end = std::min(text_.size(), begin + below(random, 4) * below(random, 12));
        const auto whole = [&](std::size_t at) { // not inside of a character or a line end
            const bool isInside =
                at > 0 && at < text_.size() &&
                ((text_[at] >= 0xDC00 && text_[at] < 0xE000) || (text_[at] == u'\n' && text_[at - 1] == u'\r'));
            return isInside ? at - 1 : at;
        };
        begin = whole(begin);
        end = std::max(begin, whole(end));
        Json result{{"range", {{"start", place(random, begin)}, {"end", place(random, end)}}},
                    {"text", cvt_ustring_string(text)}};
        text_.replace(begin, end - begin, text);
        return result;
    }

    static std::size_t below(std::mt19937_64& random, std::size_t bound) {
        return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random);
    }

private:
    /// The place of a code unit; sometimes one that means the same: beyond the end of its line, or inside of its pair.
    [[nodiscard]] Json place(std::mt19937_64& random, std::size_t at) const {
        std::size_t line = 0;
        std::size_t begin = 0;
        for (std::size_t i = 0; i < at; ++i) {
            const bool isEnd =
                text_[i] == u'\n' || (text_[i] == u'\r' && (i + 1 == text_.size() || text_[i + 1] != u'\n'));
            line += isEnd ? 1U : 0U;
            begin = isEnd ? i + 1 : begin;
        }
        std::size_t character = at - begin;
        const char16_t here = at < text_.size() ? text_[at] : u'\n';
        if (below(random, 3) == 0 && (here == u'\n' || here == u'\r'))
            character += below(random, 100);
        else if (here >= 0xD800 && here < 0xDC00 && below(random, 2) == 0)
            ++character;
        return {{"line", line}, {"character", character}};
    }

    std::u16string text_;
};

Json notification(const char* method, Json params) {
    return {{"jsonrpc", "2.0"}, {"method", method}, {"params", std::move(params)}};
}

/// The diagnostics that the server sends about a document next.
Json diagnosticsOf(LanguageClient& client, const std::string& uri) {
    const Json message = client.receive();
    EXPECT_EQ(message["method"], "textDocument/publishDiagnostics") << message.dump();
    EXPECT_EQ(message["params"]["uri"], uri);
    Json diagnostics = message["params"]["diagnostics"];
    for (Json& each : diagnostics)
        if (each.contains("relatedInformation"))
            for (Json& related : each["relatedInformation"])
                related["location"].erase("uri");
    return diagnostics;
}

void expectEqualDocuments(const std::string& name, const std::u16string& start,
                          const std::vector<std::u16string>& parts) {
    const TemporaryFolder place;
    LanguageClient client(place);
    client.send({{"jsonrpc", "2.0"}, {"id", 1}, {"method", "initialize"}, {"params", fullAbilities("/nowhere")}});
    client.receive();
    std::mt19937_64 random(11);
    Editor editor(start);
    const std::string edited = "file:///nowhere/edited" + name;
    const std::string opened = "file:///nowhere/opened" + name;
    const auto open = [&](const std::string& uri) {
        client.send(notification(
            "textDocument/didOpen",
            {{"textDocument", {{"uri", uri}, {"languageId", ""}, {"version", 1}, {"text", editor.utf8()}}}}));
        return diagnosticsOf(client, uri);
    };
    open(edited);
    std::size_t found = 0;
    for (int i = 0; i < 150; ++i) {
        Json changes = Json::array();
        for (std::size_t n = 1 + Editor::below(random, 3); n > 0; --n)
            changes.push_back(editor.change(random, parts[Editor::below(random, parts.size())]));
        client.send(notification("textDocument/didChange", {{"textDocument", {{"uri", edited}, {"version", i + 2}}},
                                                            {"contentChanges", changes}}));
        const Json incremental = diagnosticsOf(client, edited);
        ASSERT_EQ(incremental, open(opened)) << editor.utf8();
        client.send(notification("textDocument/didClose", {{"textDocument", {{"uri", opened}}}}));
        EXPECT_EQ(diagnosticsOf(client, opened), Json::array());
        found += incremental.size();
    }
    EXPECT_GT(found, 40U);
}

TEST(DocumentEdits, OfSourcesLeaveWhatOpeningTheTextFinds) {
    std::u16string start;
    for (int i = 0; i < 12; ++i)
        start += u"/* \U0001F600 \u00e4 */ #if A > 2 && B /* \U0001F680 */\r\n#if A > 1 \U0001F600\nint x;\n#else\nint "
                 u"y;\n#endif\n#endif\n";
    expectEqualDocuments(".c", start,
                         {u"", u"", u"\U0001F600", u"\n", u"\r\n", u"#if 0\n", u"#endif\n", u"\u20ac", u"A",
                          u" && A > 0", u"\n#elif A > 5\n", u"/*", u"*/", u"\n#if A && !A\n\n#endif\n", u"\n#else\n"});
}

TEST(DocumentEdits, OfModelsLeaveWhatOpeningTheTextFinds) {
    std::u16string start = u"{\"blocks\": [";
    for (char16_t i = u'a'; i < u'm'; ++i)
        start += (i == u'a' ? u"" : u",\r\n") + std::u16string(u"{\"name\": \"\U0001F600 ") + i +
                 u"\", \"choices\": [{\"name\": \"\u00e4\", \"condition\": \"A > 2 && A > 1\"}, {\"name\": \"b\", "
                 u"\"condition\": \"A == 3\"}]}";
    expectEqualDocuments(".json", start + u"]}", {u"", u" ", u"\U0001F600", u"\n", u"1", u"\"", u"{", u"]"});
}

} // namespace
} // namespace VT::Testing
