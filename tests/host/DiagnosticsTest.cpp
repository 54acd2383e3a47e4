#include "host/Diagnostics.hpp"

#include "host/Messages.hpp"

#include <gtest/gtest.h>

#include <set>
#include <type_traits>

namespace {

constexpr const char* parseError = "Vantor:Variants:ExpressionParseError";

VT::HostDiagnostic parseErrorOf(const std::string& text, std::size_t offset) {
    return vtsvCreateDiagnostic(parseError, {text, std::string(offset + 1, ' ') + "^"}, "", offset);
}

TEST(Diagnostics, CarryWhatTheyWereMadeOf) {
    const std::vector<VT::DiagnosticArgument> arguments{std::string("A == "), std::int64_t{-7}, 0.5};
    const VT::HostDiagnostic made = vtsvCreateDiagnostic("Some:Id", arguments, "Additional.", 5);
    try {
        vtsvThrowIExceptionFromDiagnostic(made);
    } catch (const std::runtime_error& error) {
        const auto* caught = dynamic_cast<const VT::HostDiagnostic*>(&error);
        ASSERT_NE(caught, nullptr);
        EXPECT_EQ(caught->messageId(), "Some:Id");
        EXPECT_EQ(caught->arguments(), arguments);
        EXPECT_EQ(caught->additionalText(), "Additional.");
        EXPECT_EQ(caught->offset(), 5U);
        EXPECT_STREQ(caught->what(), "Some:Id: \"A == \", -7, 0.5 Additional.");
    }
    EXPECT_EQ(vtsvCreateDiagnostic(parseError, {}, "").offset(), std::nullopt);
    static_assert(std::is_nothrow_copy_constructible_v<VT::HostDiagnostic>, "what is thrown is copied");
}

TEST(Diagnostics, ParseErrorsSayWhereAndWhat) {
    const struct {
        std::string text;
        std::size_t offset;
        std::string sentence;
    } cases[] = {
        {"A === 3", 4, R"(The condition "A === 3" cannot be read at byte 5, before "= 3".)"},
        {"A\n\x1b[2J", 1, R"(The condition "A\x0a\x1b[2J" cannot be read at byte 2, before "\x0a\x1b[2J".)"},
        {"A", 7, R"(The condition "A" cannot be read at byte 8.)"},
    };

    for (const auto& [text, offset, sentence] : cases)
        EXPECT_EQ(parseErrorOf(text, offset).what(), sentence);
    EXPECT_STREQ(vtsvCreateDiagnostic(parseError, {std::int64_t{3}}, "").what(), // a misfit is shown
                 "Vantor:Variants:ExpressionParseError: 3");
    const VT::HostDiagnostic nowhere = vtsvCreateDiagnostic(parseError, {std::string("A"), std::string("^")}, "");
    EXPECT_STREQ(nowhere.what(), R"(The condition "A" cannot be read at an unknown place.)");
}

TEST(Diagnostics, SentencesAreBoundedWhateverTheArguments) {
    const std::string huge(3'000'000, 'x');
    EXPECT_LT(std::string(parseErrorOf(huge, 1'000'000).what()).size(), 200U);
    const std::vector<VT::DiagnosticArgument> many(1000, huge.substr(0, 10000));
    EXPECT_LT(std::string(vtsvCreateDiagnostic(huge, many, "").what()).size(), 1000U);
}

TEST(Messages, RowsAreSound) {
    std::set<std::string_view> ids;
    for (const VT::MessageInfo& row : VT::messageCatalogue()) {
        EXPECT_TRUE(ids.insert(row.id).second) << row.id << " has two rows";
        EXPECT_EQ(VT::findMessage(row.id), &row);
        std::string_view rest = row.sentence;
        for (std::size_t open = rest.find('{'); open != std::string_view::npos; open = rest.find('{')) {
            const std::size_t close = rest.find('}', open);
            ASSERT_NE(close, std::string_view::npos) << row.id;
            const std::string_view name = rest.substr(open + 1, close - open - 1);
            const bool known = name == "place" || (name.size() == 1 && name[0] >= '0' &&
                                                   static_cast<std::size_t>(name[0] - '0') < row.arguments.size());
            EXPECT_TRUE(known) << row.id << " speaks of {" << name << '}';
            rest.remove_prefix(close + 1);
        }
    }
    EXPECT_FALSE(ids.empty());
    EXPECT_EQ(VT::findMessage("Vantor:Variants:"), nullptr);
}

TEST(FatalDiagnostic, EndsTheProcessWithOneLine) {
    EXPECT_EXIT(vtsvFatalDiagnostic("index out of bounds", "base/core/Nodes.cpp", 47, "getInput"),
                testing::KilledBySignal(SIGABRT),
                "^vtsym: fatal: index out of bounds \\(base/core/Nodes.cpp:47, getInput\\)\n$");
}

} // namespace
