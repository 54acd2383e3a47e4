// vtsym operators: prints the operator table, expanded from operators.def, as columns or as JSON.
// A new row of the table appears here without an edit.
#include "base/core/Operators.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>
#include <array>
#include <string_view>
#include <vector>

namespace vtsym {

namespace {

constexpr const char* operatorsNotes = R"(A smaller precedence binds tighter.

Examples:
  vtsym operators
  vtsym operators --json | jq 'select(.c == "%")')";

/// The names of the forms in which operators are written, by operator code.
constexpr auto formNames = std::to_array<std::string_view>({
#define VTSYM_OPERATOR(Code, Name, Class, Shape, Quill, C, QuillCall, Prec, Assoc, Form, ...) #Form,
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
});

std::string_view formName(const VT::OperatorInfo& row) {
    return formNames[static_cast<std::size_t>(row.op)];
}

std::string_view associativityName(const VT::OperatorInfo& row) {
    return row.associativity == VT::OpAssociativity::Left ? "left" : "right";
}

std::string_view operatorName(VT::SymbolicOp op) {
    return op == VT::SymbolicOp::None ? std::string_view() : VT::operatorInfo(op).name;
}

using Cells = std::array<std::string, 9>;

Cells cellsOf(const VT::OperatorInfo& row) {
    return {std::to_string(static_cast<int>(row.op)),
            std::string(row.name),
            std::string(row.quill),
            std::string(row.c),
            std::string(row.quillCall),
            std::to_string(row.precedence),
            std::string(associativityName(row)),
            std::string(formName(row)),
            std::string(row.meaning)};
}

std::string table(const Style& style) {
    std::vector<Cells> lines{{"code", "name", "Quill", "C", "call", "prec", "assoc", "form", "meaning"}};
    for (const VT::OperatorInfo& row : VT::operatorTable())
        lines.push_back(cellsOf(row));
    std::array<std::size_t, std::tuple_size_v<Cells>> widths{};
    for (const Cells& cells : lines)
        for (std::size_t i = 0; i < cells.size(); ++i)
            widths[i] = std::max(widths[i], cells[i].size());
    std::string out;
    for (const Cells& cells : lines) {
        std::string line;
        for (std::size_t i = 0; i < cells.size(); ++i) {
            const std::string blanks(widths[i] - cells[i].size(), ' ');
            const bool toTheRight = i == 0 || i == 5;
            line.append(i == 0 ? "" : "  ").append(toTheRight ? blanks + cells[i] : cells[i] + blanks);
        }
        line.resize(line.find_last_not_of(' ') + 1);
        out.append(&cells == &lines.front() ? style.strong(line) : line).append("\n");
    }
    return out;
}

std::string jsonOf(const VT::OperatorInfo& row) {
    std::string json = "{\"op\":" + std::to_string(static_cast<int>(row.op));
    const auto text = [&json](std::string_view name, std::string_view value) {
        appendMember(json, name, jsonString(value));
    };
    text("name", row.name);
    text("kind", row.className);
    text("quill", row.quill);
    text("c", row.c);
    text("call", row.quillCall);
    appendMember(json, "precedence", std::to_string(row.precedence));
    text("associativity", associativityName(row));
    text("form", formName(row));
    text("negated", operatorName(row.negated));
    text("mirrored", operatorName(row.mirrored));
    appendMember(json, "boolean", row.boolean ? "true" : "false");
    text("meaning", row.meaning);
    return json + "}\n";
}

} // namespace

void addOperators(CommandLine& program) {
    Command& command = program.add("operators", "List the operators of expressions", operatorsNotes);
    const auto json = std::make_shared<bool>(false);
    command.addFlag("--json", "Answer with one JSON object per operator", *json);
    command.run = [json](Console& console) {
        if (*json) {
            for (const VT::OperatorInfo& row : VT::operatorTable())
                console.out(jsonOf(row));
        } else {
            console.out(table(console.outStyle()));
        }
        console.flush();
        return true;
    };
}

} // namespace vtsym
