// Sessions of editors, as data: what a client sends, and what the server answers.
//
// Lines of tests/data/lsp/*.txt:
//     == NAME                   a session in an empty folder
//     file NAME "text"          a file in the folder
//     > MESSAGE                 is sent; `> initialize` stands for that of a client that can show everything
//     + MESSAGE                 is sent together with the next one
//     raw "bytes"               is sent without a frame
//     < MESSAGE                 is the next one of the server; members that are not written may be any
//     end STATUS                the input ends, the server says nothing more, and ends with the status
// FOLDER stands for the path of the folder.
#include "tests/lsp/LanguageClient.hpp"

#include <boost/algorithm/string.hpp>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

/// What differs between a message and what is expected, with the way to it; empty for nothing.
std::string difference(const Json& expected, const Json& got, const std::string& way = {}) {
    if (expected.is_object() && got.is_object()) {
        for (const auto& [name, value] : expected.items()) {
            const auto member = got.find(name);
            const std::string found =
                member == got.end() ? way + "/" + name + " is missing" : difference(value, *member, way + "/" + name);
            if (!found.empty())
                return found;
        }
        return {};
    }
    if (expected.is_array() && got.is_array() && expected.size() == got.size()) {
        for (std::size_t i = 0; i < expected.size(); ++i)
            if (const std::string found = difference(expected[i], got[i], way + "/" + std::to_string(i));
                !found.empty())
                return found;
        return {};
    }
    return expected == got ? "" : way + " is " + got.dump() + " rather than " + expected.dump();
}

struct Step {
    std::string kind;
    std::string text;
    std::size_t line;
};

struct Session {
    std::string name;
    std::vector<Step> steps;
};

std::vector<Session> sessionsOf(const std::filesystem::path& file) {
    std::vector<Session> sessions;
    std::ifstream stream(file);
    std::size_t number = 0;
    for (std::string line; std::getline(stream, line);) {
        ++number;
        if (line.empty() || line.starts_with('#'))
            continue;
        const std::size_t blank = line.find(' ');
        const std::string kind = line.substr(0, blank);
        const std::string text = blank == std::string::npos ? "" : line.substr(blank + 1);
        if (kind == "==")
            sessions.push_back({text, {}});
        else
            sessions.back().steps.push_back({kind, text, number});
    }
    return sessions;
}

void play(const Session& session, const std::string& file) {
    const TemporaryFolder place;
    std::string folder = place.path("");
    while (folder.size() > 1 && folder.ends_with('/'))
        folder.pop_back();
    LanguageClient client(place);
    std::string pending;
    bool hasEnded = false;
    for (const Step& step : session.steps) {
        SCOPED_TRACE(file + ":" + std::to_string(step.line) + ": " + session.name);
        const std::string text = boost::algorithm::replace_all_copy(step.text, "FOLDER", folder);
        if (step.kind == "file") {
            const std::size_t blank = text.find(' ');
            place.write(text.substr(0, blank), Json::parse(text.substr(blank + 1)).get<std::string>());
        } else if (step.kind == ">" && text == "initialize") {
            client.send({{"jsonrpc", "2.0"}, {"id", 0}, {"method", "initialize"}, {"params", fullAbilities(folder)}});
            ASSERT_EQ(difference({{"id", 0}, {"result", {{"serverInfo", {{"name", "vtsym"}}}}}}, client.receive()), "");
        } else if (step.kind == ">" || step.kind == "+") {
            pending += framed(text);
            if (step.kind == ">")
                client.write(std::exchange(pending, ""));
        } else if (step.kind == "raw") {
            client.write(Json::parse(text).get<std::string>());
        } else if (step.kind == "<") {
            const Json got = client.receive();
            ASSERT_EQ(difference(Json::parse(text), got), "") << got.dump();
        } else if (step.kind == "end") {
            hasEnded = true;
            const int status = client.finish();
            EXPECT_EQ(client.receive(), Json(nullptr));
            EXPECT_EQ(status, std::stoi(text));
        } else {
            FAIL() << "there is no step " << step.kind;
        }
    }
    EXPECT_TRUE(hasEnded) << session.name;
}

TEST(LanguageSessions, AreAnsweredAsRecorded) {
    std::size_t played = 0;
    for (const auto& entry : std::filesystem::directory_iterator(VTSYM_TEST_DATA "/lsp"))
        for (const Session& session : sessionsOf(entry.path())) {
            play(session, entry.path().filename());
            ++played;
        }
    EXPECT_GT(played, 20U);
}

} // namespace
} // namespace VT::Testing
