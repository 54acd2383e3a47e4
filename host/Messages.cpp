// Makes readable sentences of message ids and arguments.
//
// Method: the rows of host/Messages.def become a constant table, which is searched from the front; an error is rare.
// Every argument is shown quoted, escaped and cut, so the length of a sentence is bounded.
#include "host/Messages.hpp"

#include "host/Numbers.hpp"
#include "host/Text.hpp"

#include <algorithm>
#include <array>

namespace VT {

namespace {

constexpr std::size_t argumentBytes = 60; ///< shown of one argument
constexpr std::size_t placeBytes = 20;    ///< shown of what follows the place of an error
constexpr std::size_t argumentsShown = 8; ///< of a message that the catalogue does not know

template <MessageArgument... types>
constexpr std::array<MessageArgument, sizeof...(types)> argumentsOf{types...};

constexpr auto rows = [] {
    using enum MessageArgument;
#define VTSYM_UNWRAP(...) __VA_ARGS__
#define VTSYM_MESSAGE(Id, Arguments, Sentence) MessageInfo{Id, argumentsOf<VTSYM_UNWRAP Arguments>, Sentence},
    return std::to_array<MessageInfo>({
#include "host/Messages.def"
    });
#undef VTSYM_MESSAGE
#undef VTSYM_UNWRAP
}();

std::string quoted(std::string_view text, std::size_t bound) {
    return '"' + shownText(text, bound) + '"';
}

std::string shown(const DiagnosticArgument& argument) {
    if (const auto* text = std::get_if<std::string>(&argument))
        return quoted(*text, argumentBytes);
    if (const auto* integer = std::get_if<std::int64_t>(&argument))
        return std::to_string(*integer);
    return vtsv_dtoa(std::get<double>(argument), true);
}

/// The place in words: texts are bytes, so bytes are counted, from 1 as people do.
std::string place(std::span<const DiagnosticArgument> arguments, std::optional<std::size_t> offset) {
    if (!offset)
        return "an unknown place";
    const std::string number = std::to_string(*offset + 1);
    const auto* text = arguments.empty() ? nullptr : std::get_if<std::string>(&arguments[0]);
    if (text == nullptr || *offset > text->size())
        return "byte " + number;
    if (*offset == text->size())
        return "its end";
    return "byte " + number + ", before " + quoted(std::string_view(*text).substr(*offset), placeBytes);
}

std::string withArguments(std::string_view sentence, std::span<const DiagnosticArgument> arguments,
                          std::optional<std::size_t> offset) {
    std::string result;
    while (!sentence.empty()) {
        const std::size_t open = std::min(sentence.find('{'), sentence.size());
        result.append(sentence.substr(0, open));
        sentence.remove_prefix(open);
        const std::size_t close = sentence.find('}');
        if (close == std::string_view::npos)
            return result.append(sentence);
        const std::string_view name = sentence.substr(1, close - 1);
        result +=
            name == "place" ? place(arguments, offset) : shown(arguments[static_cast<std::size_t>(name[0] - '0')]);
        sentence.remove_prefix(close + 1);
    }
    return result;
}

} // namespace

std::span<const MessageInfo> messageCatalogue() {
    return rows;
}

const MessageInfo* findMessage(std::string_view id) {
    const auto* const row = std::ranges::find(rows, id, &MessageInfo::id);
    return row == rows.end() ? nullptr : row;
}

bool fits(const MessageInfo& message, std::span<const DiagnosticArgument> arguments) {
    return std::ranges::equal(message.arguments, arguments, {}, {}, [](const DiagnosticArgument& argument) {
        return static_cast<MessageArgument>(argument.index());
    });
}

std::string messageSentence(std::string_view id, std::span<const DiagnosticArgument> arguments,
                            std::optional<std::size_t> offset) {
    if (const MessageInfo* const message = findMessage(id); message != nullptr && fits(*message, arguments))
        return withArguments(message->sentence, arguments, offset);
    std::string sentence = shownText(id, argumentBytes);
    std::string_view separator = ": ";
    for (const DiagnosticArgument& argument : arguments.first(std::min(arguments.size(), argumentsShown))) {
        sentence.append(separator).append(shown(argument));
        separator = ", ";
    }
    return sentence;
}

} // namespace VT
