// The members of a model in a file, and their shapes: one table, which docs/model.schema.json describes.
#pragma once

#include <algorithm>
#include <array>
#include <cstdint>
#include <string>
#include <string_view>

namespace VT::Embedded {

/// A part of a model: an object, or a list of elements.
enum class Part : std::uint8_t { Model, Blocks, Choices, Block, Ports, Port, Destinations, Symbols, Symbol, Values };

/// What is written as the value of a member.
enum class Shape : std::uint8_t { Text, List, TextOrList, Integer, Object };

/// A member of an object.
struct Member {
    Part in;
    std::string_view name;
    Shape shape;
    Part list; ///< the part that its list or object is
};

inline constexpr std::array<Member, 19> members{{
    {Part::Model, "$schema", Shape::Text, {}},
    {Part::Model, "name", Shape::Text, {}},
    {Part::Model, "description", Shape::Text, {}},
    {Part::Model, "language", Shape::Text, {}},
    {Part::Model, "blocks", Shape::List, Part::Blocks},
    {Part::Model, "ports", Shape::List, Part::Ports},
    {Part::Model, "symbols", Shape::Object, Part::Symbols},
    {Part::Block, "name", Shape::Text, {}},
    {Part::Block, "description", Shape::Text, {}},
    {Part::Block, "condition", Shape::Text, {}},
    {Part::Block, "blocks", Shape::List, Part::Blocks},
    {Part::Block, "choices", Shape::List, Part::Choices},
    {Part::Block, "policy", Shape::Text, {}},
    {Part::Port, "name", Shape::Text, {}},
    {Part::Port, "from", Shape::Text, {}},
    {Part::Port, "to", Shape::TextOrList, Part::Destinations},
    {Part::Symbol, "values", Shape::List, Part::Values},
    {Part::Symbol, "min", Shape::Integer, {}},
    {Part::Symbol, "max", Shape::Integer, {}},
}};

/// Whether a part is an object with members of the table.
constexpr bool isObject(Part part) {
    return part == Part::Model || part == Part::Block || part == Part::Port || part == Part::Symbol;
}

/// The part in a sentence: "a block".
constexpr std::string_view nameOf(Part part) {
    return part == Part::Model   ? "a model"
           : part == Part::Block ? "a block"
           : part == Part::Port  ? "a port"
                                 : "a symbol";
}

/// The member of a part with a name; nullptr where there is none.
constexpr const Member* memberOf(Part part, std::string_view name) {
    const auto* const member =
        std::ranges::find_if(members, [&](const Member& each) { return each.in == part && each.name == name; });
    return member == members.end() ? nullptr : member;
}

/// What to write as the value of a member, or as an element of a list.
std::string valueWanted(const Member& member);
std::string elementWanted(Part list);
/// What is wrong with a name that no member of a part has.
std::string noMember(Part part, std::string_view name);
/// A text from a model in quotes, cut and fit for a terminal.
std::string inQuotes(std::string_view text);

} // namespace VT::Embedded
