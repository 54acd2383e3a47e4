// Splits a definition at its first =, reads both sides, and binds the name in the table.
// A side that cannot be read is an error of the command line, with the message of the reader.
#include "tools/vtsym/commands/Definitions.hpp"

#include "base/core/Nodes.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/ErrorText.hpp"

namespace vtsym {

namespace {

/// Splits NAME=VALUE at its first =.
Definition definitionOf(const std::string& assignment) {
    const std::size_t equals = assignment.find('=');
    if (equals == std::string::npos || equals == 0)
        throw UsageError("-D", quotedArgument(assignment) + " is not NAME=VALUE");
    return {assignment.substr(0, equals), assignment.substr(equals + 1)};
}

VT::SymbolicExprId readSide(const ReadExpression& read, const std::string& text, const std::string& what) {
    try {
        return read(text);
    } catch (...) {
        throw UsageError("-D", what + " cannot be read: " + currentTextError().message);
    }
}

} // namespace

void addDefinitions(Command& command, Definitions& definitions) {
    const auto take = [&definitions](const std::vector<std::string>& assignments) {
        for (const std::string& assignment : assignments)
            definitions.push_back(definitionOf(assignment));
    };
    command.addArguments(
        {"-D", "Define a symbol, or a member A.B, as an expression in the language of the texts", "NAME=VALUE"}, take);
}

void bindDefinitions(VT::SymbolicExprTable& table, const Definitions& definitions, const ReadExpression& read) {
    for (const Definition& definition : definitions) {
        const VT::SymbolicExprId name = readSide(read, definition.name, "the name " + quotedArgument(definition.name));
        const VT::SymbolicExpr* const node = table.get(name);
        const bool isSymbol =
            node != nullptr && (node->op() == VT::SymbolicOp::String || node->op() == VT::SymbolicOp::MemberValue);
        if (!isSymbol || name == table.getIdTRUE() || name == table.getIdFALSE())
            throw UsageError("-D", quotedArgument(definition.name) +
                                       " cannot be defined; write a name, or a member such as A.B");
        if (definition.value.empty())
            throw UsageError("-D",
                             quotedArgument(definition.name + "=") + " has no value; write an expression after =");
        table.registerValueId(name,
                              readSide(read, definition.value, "the value of " + quotedArgument(definition.name)));
    }
}

} // namespace vtsym
