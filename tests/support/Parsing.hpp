// One call of the condition parser with its answer as a value.
#pragma once

#include "host/Diagnostics.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <gtest/gtest.h>

#include <optional>
#include <string>

namespace VT::Testing {

struct ParseAnswer {
    SymbolicExprId id = invalidId;
    std::optional<HostDiagnostic> error;

    /// Where reading stopped: after the text, or the place of the error.
    [[nodiscard]] std::size_t stop(const std::string& text) const {
        return error ? error->offset().value() : text.size();
    }
};

inline ParseAnswer parse(SymbolicExprTable& table, const std::string& text, bool cOperators = true,
                         bool variantKeywords = true) {
    try {
        return {SymbolicExprParser(table, cOperators, variantKeywords)(text), std::nullopt};
    } catch (const HostDiagnostic& diagnostic) {
        return {invalidId, diagnostic};
    }
}

/// The expression of a text that must be one.
inline SymbolicExprId read(SymbolicExprTable& table, const std::string& text) {
    const ParseAnswer answer = parse(table, text);
    EXPECT_FALSE(answer.error) << text;
    return answer.id;
}

} // namespace VT::Testing
