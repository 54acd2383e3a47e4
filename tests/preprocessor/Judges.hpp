// The real preprocessor and the real compiler.
#pragma once

#include "tests/support/TemporaryFolder.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

namespace VT::Testing {

/// Throws std::runtime_error with the words of a command that fails.
inline void run(const TemporaryFolder& place, const std::string& command) {
    if (place.run("{ " + command + "; } 2>words") != 0)
        throw std::runtime_error(command + ": " + place.read("words").substr(0, 2000));
}

inline std::vector<std::int64_t> numbers(const std::string& text) {
    std::istringstream stream(text);
    return {std::istream_iterator<std::int64_t>(stream), {}};
}

/// Writes one file of conditions, each decided under the definitions before it.
class Preprocessor {
public:
    /// Replaces all definitions.  A name is defined as its bare value, S.x under the name S_x, and a function, whatever
    /// its arguments.
    void define(const Assignment& values, const std::vector<std::string>& functions = {}) {
        for (const std::string& name : defined_)
            file_ += "#undef " + name + "\n";
        defined_.clear();
        for (const auto& [name, value] : values) {
            defined_.push_back(name);
            std::ranges::replace(defined_.back(), '.', '_');
            const bool isFunction = std::ranges::find(functions, name) != functions.end();
            file_ += "#define " + defined_.back() + (isFunction ? "(...) " : " ") + std::to_string(value) + "\n";
        }
    }

    void ask(const std::string& condition) { file_ += "#if " + condition + "\n1\n#else\n0\n#endif\n"; }

    /// A 1 or 0 for each condition, in order.  The command makes the file "decided" of "conditions.h".
    [[nodiscard]] std::vector<std::int64_t>
    decide(const std::string& command = "cpp -P -undef conditions.h decided") const {
        const TemporaryFolder place;
        place.write("conditions.h", file_);
        run(place, command);
        return numbers(place.read("decided"));
    }

private:
    std::string file_;
    std::vector<std::string> defined_;
};

/// What the preprocessor makes of a file; a header of the given text is there as "header.h".
inline std::string preprocessed(const std::string& file, const std::string& header) {
    const TemporaryFolder place;
    place.write("file.c", file);
    place.write("header.h", header);
    run(place, "cpp -P -w -undef -std=c2x file.c decided");
    return place.read("decided");
}

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

    [[nodiscard]] std::vector<std::int64_t> compute(const std::vector<Question>& questions) const {
        const TemporaryFolder place;
        place.write("program.c", program());
        std::ostringstream input;
        for (const Question& question : questions) {
            input << question.expression;
            for (const std::int64_t value : question.values)
                input << ' ' << value;
            input << '\n';
        }
        place.write("questions", input.str());
        run(place, "gcc -w -O0 -o program program.c && ./program <questions >answers");
        return numbers(place.read("answers"));
    }

private:
    [[nodiscard]] std::string program() const {
        std::string text = "#include <stdbool.h>\n#include <stdio.h>\n" + declarations_;
        std::string addresses;
        for (const std::string& variable : variables_)
            addresses += "&" + variable + ", ";
        text += "int *variables[] = {" + addresses + "};\n";
        std::string functions;
        for (std::size_t i = 0; i < expressions_.size(); ++i) {
            const std::string name = "f" + std::to_string(i);
            text += "long long " + name + "(void) { return " + expressions_[i] + "; }\n";
            functions += name + ", ";
        }
        return text + "long long (*functions[])(void) = {" + functions +
               "};\nint main(void) {\n  unsigned long f;\n  while (scanf(\"%lu\", &f) == 1) {\n"
               "    for (unsigned v = 0; v < sizeof variables / sizeof *variables; ++v) scanf(\"%d\", variables[v]);\n"
               "    printf(\"%lld\\n\", functions[f]());\n  }\n}\n";
    }

    std::string declarations_;
    std::vector<std::string> variables_;
    std::vector<std::string> expressions_;
};

} // namespace VT::Testing
