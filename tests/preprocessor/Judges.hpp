// The real preprocessor and the real compiler.
#pragma once

#include "tests/support/oracles/Truth.hpp"

#include <string>
#include <vector>

namespace VT::Testing {

/// Writes one file of conditions, each decided under the definitions before it.
class Preprocessor {
public:
    /// Replaces all definitions.  A name is defined as its bare value, S.x under the name S_x, and a function, whatever
    /// its arguments.
    void define(const Assignment& values, const std::vector<std::string>& functions = {});

    void ask(const std::string& condition) { file_ += "#if " + condition + "\n1\n#else\n0\n#endif\n"; }

    /// A 1 or 0 for each condition, in order; throws std::runtime_error with the preprocessor's words.
    [[nodiscard]] std::vector<std::int64_t> decide() const;

private:
    std::string file_;
    std::vector<std::string> defined_;
};

/// What the preprocessor makes of a file; a header of the given text is there as "header.h".  Throws std::runtime_error
/// with the preprocessor's words.
[[nodiscard]] std::string preprocessed(const std::string& file, const std::string& header);

/// Compiles expressions and computes them.
class Compiler {
public:
    struct Question {
        std::size_t expression;
        std::vector<std::int64_t> values; ///< of the variables
    };

    /// The variables are of type int.
    Compiler(std::string declarations, std::vector<std::string> variables)
        : declarations_(std::move(declarations)),
          variables_(std::move(variables)) {}

    void add(const std::string& expression) { expressions_.push_back(expression); }

    [[nodiscard]] std::vector<std::int64_t> compute(const std::vector<Question>& questions) const;

private:
    [[nodiscard]] std::string program() const;

    std::string declarations_;
    std::vector<std::string> variables_;
    std::vector<std::string> expressions_;
};

} // namespace VT::Testing
