#include "tools/vtsym/commands/Definitions.hpp"

#include "base/core/Nodes.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/ErrorText.hpp"

namespace vtsym {

namespace {

/// The two sides of NAME=VALUE, which stands with its first =.
Definition definitionOf(const std::string& assignment) {
    const std::size_t equals = assignment.find('=');
    if (equals == std::string::npos || equals == 0)
        throw CLI::ValidationError("-D", quotedArgument(assignment) + " is not NAME=VALUE");
    return {assignment.substr(0, equals), assignment.substr(equals + 1)};
}

VT::SymbolicExprId readSide(const ReadExpression& read, const std::string& text, const std::string& what) {
    try {
        return read(text);
    } catch (...) {
        throw CLI::ValidationError("-D", what + " cannot be read: " + currentTextError().message);
    }
}

} // namespace

void addDefinitions(CLI::App& command, Definitions& definitions) {
    const auto take = [&definitions](const std::vector<std::string>& assignments) {
        for (const std::string& assignment : assignments)
            definitions.push_back(definitionOf(assignment));
    };
    addArguments(command, "-D", take,
                 "Give a symbol, or a member such as A.B, a value, which is an expression in the language of the texts")
        ->type_name("NAME=VALUE");
}

void bindDefinitions(VT::SymbolicExprTable& table, const Definitions& definitions, const ReadExpression& read) {
    for (const Definition& definition : definitions) {
        const VT::SymbolicExprId name = readSide(read, definition.name, "the name " + quotedArgument(definition.name));
        const VT::SymbolicExpr* const node = table.get(name);
        const bool isSymbol =
            node != nullptr && (node->op() == VT::SymbolicOp::String || node->op() == VT::SymbolicOp::MemberValue);
        if (!isSymbol || name == table.getIdTRUE() || name == table.getIdFALSE())
            throw CLI::ValidationError("-D",
                                       quotedArgument(definition.name) + " is not a name that can be given a value");
        if (definition.value.empty())
            throw CLI::ValidationError("-D", quotedArgument(definition.name + "=") + " gives no value");
        table.registerValueId(name,
                              readSide(read, definition.value, "the value of " + quotedArgument(definition.name)));
    }
}

} // namespace vtsym
