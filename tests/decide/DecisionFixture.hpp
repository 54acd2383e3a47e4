// A table, a parser and a decider, and the truth of witnesses.
#pragma once

#include "base/decide/Decider.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace VT::Testing {

struct DecisionFixture {
    explicit DecisionFixture(const DecisionOptions& options = {}) : decider(table, options) { table.addBoolSymbols(); }

    SymbolicExprId parse(const std::string& text) { return SymbolicExprParser(table, true, true)(text); }

    [[nodiscard]] Assignment assignment(const Witness& witness) const {
        Assignment values;
        for (const auto& [unknown, value] : witness)
            values[decider.nameOf(unknown)] = value;
        return values;
    }

    /// Whether a condition holds for a witness, by the oracle.
    [[nodiscard]] bool holdsFor(SymbolicExprId id, const Decision& decision) const {
        return holds(table, id, assignment(decision.witness.value()));
    }

    /// "yes", "no" or "undecided", with the witness and the bound: "no: A=1 B=0".
    [[nodiscard]] std::string text(const Decision& decision) const {
        static const char* const answers[] = {"no", "yes", "undecided"};
        static const char* const bounds[] = {"", " steps", " terms", " no condition"};
        std::string result = answers[static_cast<std::size_t>(decision.answer)];
        result += bounds[static_cast<std::size_t>(decision.bound)];
        if (decision.witness)
            result += ":";
        for (const auto& [unknown, value] : decision.witness.value_or(Witness()))
            result += " " + decider.nameOf(unknown) + "=" + std::to_string(value);
        return result;
    }

    SymbolicExprTable table;
    Decider decider;
};

} // namespace VT::Testing
