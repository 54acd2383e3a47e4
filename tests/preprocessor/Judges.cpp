#include "tests/preprocessor/Judges.hpp"

#include "tests/support/TemporaryFolder.hpp"

#include <algorithm>
#include <iterator>

namespace VT::Testing {

namespace {

void run(const Workplace& place, const std::string& command) {
    if (place.run("{ " + command + "; } 2>words") != 0)
        throw std::runtime_error(command + ": " + place.read("words").substr(0, 2000));
}

std::vector<std::int64_t> numbers(const std::string& text) {
    std::istringstream stream(text);
    return {std::istream_iterator<std::int64_t>(stream), {}};
}

} // namespace

void Preprocessor::define(const Assignment& values, const std::vector<std::string>& functions) {
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

std::vector<std::int64_t> Preprocessor::decide() const {
    const Workplace place;
    place.write("conditions.h", file_);
    run(place, "cpp -P -undef conditions.h decided");
    return numbers(place.read("decided"));
}

std::string preprocessed(const std::string& file, const std::string& header) {
    const Workplace place;
    place.write("file.c", file);
    place.write("header.h", header);
    run(place, "cpp -P -w -undef -std=c2x file.c decided");
    return place.read("decided");
}

std::string Compiler::program() const {
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

std::vector<std::int64_t> Compiler::compute(const std::vector<Question>& questions) const {
    const Workplace place;
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

} // namespace VT::Testing
