// What the reader of models says about members: each sentence ends with what to write.
#include "host/embedded/ModelMembers.hpp"

#include "host/Text.hpp"

namespace VT::Embedded {

namespace {

constexpr std::size_t shownQuoteBytes = 80;
constexpr const char* integerWanted = "write an integer of 32 bits";

} // namespace

std::string inQuotes(std::string_view text) {
    std::string result = "\"";
    return result.append(shownText(text, shownQuoteBytes)).append("\"");
}

std::string valueWanted(const Member& member) {
    switch (member.shape) {
    case Shape::Text:
        return "write a text in quotes";
    case Shape::Integer:
        return integerWanted;
    case Shape::Object:
        return R"(write an object, {"NAME": {"values": [1, 2]}})";
    case Shape::List:
        return "write a list, [...]";
    default:
        return "write the path of a block, or a list of such paths";
    }
}

std::string elementWanted(Part list) {
    switch (list) {
    case Part::Values:
        return integerWanted;
    case Part::Symbols:
        return R"(write an object, {"values": [1, 2]} or {"min": 0, "max": 9})";
    case Part::Destinations:
        return "write the path of a block, such as \"Engine/Diesel\"";
    case Part::Ports:
        return R"(write a port, {"name": ..., "from": ..., "to": ...})";
    default:
        return R"(write a block, {"name": ..., "condition": ...})";
    }
}

std::string noMember(Part part, std::string_view name) {
    std::string known;
    for (const Member& each : members)
        if (each.in == part && each.name != "$schema")
            known.append(known.empty() ? "" : ", ").append(each.name);
    return "there is no member " + inQuotes(name) + "; " + std::string(nameOf(part)) + " has " + known;
}

} // namespace VT::Embedded
