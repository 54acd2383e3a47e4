// Files of chains within each other, with macros of a small world, as many as are asked for.
#pragma once

#include "base/scan/changes/BranchMeanings.hpp"

#include <algorithm>
#include <array>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {

inline const std::vector<std::string> macros{"A", "B", "C"};
/// What files define by them.
inline const std::vector<std::string> derived{"D", "E"};
/// Everything that files define.
inline const std::vector<std::string> defined{"A", "B",    "C",      "D",   "E",  "VAL",
                                              "F", "JOIN", "JOINED", "POP", "DO", "\u00e9"};
/// What a macro is defined as; empty where it is not.
using Values = std::vector<std::string>;
inline const Values allValues{"", "(-1)", "0", "1", "2", "3u", "18446744073709551615u"};
inline const std::string includedText = "#ifndef A\n#define A 2\n#endif\n";

struct Branch {
    std::size_t line;
    int parent; ///< -1 for none
    std::vector<int> earlier;
    bool isElse;
    bool isKept; ///< a comment suppresses its findings
};

/// A file of chains within each other.  Each branch holds its number after an @.
class RandomSource {
public:
    /// With `plain`, conditions are those that are decided completely, and nothing changes macros on the way.
    RandomSource(std::mt19937_64& random, bool plain) : random_(random), plain_(plain) {
        if (!plain) {
            std::ranges::shuffle(values, random);
            values.resize(4);
            add("#define F(x) " + oneOf("x", "(x)", "x + 1", "x || C", "V%:%:x", "!x", "JOIN(V, AL)"));
            add("#define JOIN(a, b) JOINED(a, b)\n#define JOINED(a, b) a ## b");
            add("#define DO(x) _Pragma(#x)");
            if (theme_ == Theme::Pops && below(4) == 0)
                add("#define POP DO(pop_macro(\"" + macro() + "\"))");
            for (const std::string& name : derived) {
                favourites_[name] = body(name);
                add("#define " + name + " " + body(name));
            }
        }
        for (int i = 0; i < 3; ++i)
            addChain(-1, 0);
    }

    /// What a build says about the macros: an option or a file that defines one of them, a condition.
    struct Build {
        std::string macro;   ///< empty where nothing is defined
        std::string value;   ///< one of the values
        std::string option;  ///< for -D; empty for -U and for a file
        std::string file;    ///< of definitions
        std::string assumed; ///< empty for nothing
    };

    Build build() {
        Build made;
        if (below(4) != 0) {
            made.macro = macros[below(macros.size())];
            made.value = values[below(values.size())];
            const std::string body = oneOf(made.value, "(" + made.value + ")", made.value + " + 0", "SAME");
            const std::string definition = "#define " + made.macro + " " + body + "\n";
            if (made.value.empty())
                made.file = below(2) == 0 ? "" : "#define " + made.macro + " 1\n#undef " + made.macro + "\n";
            else if (below(2) == 0 && body != "SAME")
                made.option = made.macro + "=" + body;
            else
                made.file = oneOf("#define SAME " + made.value + "\n" + definition,
                                  "#define SAME " + made.value + "\n#if SAME == " + made.value + "\n" + definition +
                                      "#else\n#define " + made.macro + " 7\n#endif\n",
                                  "#if UNKNOWN\n#define " + made.macro + " 7\n#else\n#endif\n#define SAME " +
                                      made.value + "\n#undef " + made.macro + "\n" + definition);
        }
        if (below(3) != 0)
            made.assumed = oneOf(atom(), atom() + " || " + atom(), "!(" + atom() + " && " + atom() + ")");
        const bool isOdd =
            made.assumed.find("#m") != std::string::npos || made.assumed.find("not") != std::string::npos ||
            std::ranges::any_of(derived,
                                [&](const std::string& each) { return made.assumed.find(each) != std::string::npos; });
        if (isOdd || made.assumed.find_first_of("FJ\\\u00e9") != std::string::npos)
            made.assumed.clear(); // not about A, B and C alone
        return made;
    }

    /// The text with another condition of one branch.
    struct Rewritten {
        std::string text;
        ChangedLines lines;
    };

    Rewritten rewritten() {
        std::vector<std::size_t> candidates;
        for (std::size_t i = 0; i < branches.size(); ++i)
            if (!branches[i].isElse)
                candidates.push_back(i);
        const std::size_t at = candidates[below(candidates.size())];
        const Branch& branch = branches[at];
        std::size_t begin = 0;
        for (std::size_t line = 1; line < branch.line; ++line)
            begin = text.find('\n', begin) + 1;
        const std::size_t end = text.find("@" + std::to_string(at) + "\n", begin);
        const std::string fresh = std::string(branch.earlier.empty() ? "#if " : "#elif ") + condition(2) + "\n";
        const auto lines = [](const std::string& part) {
            return static_cast<std::uint64_t>(std::ranges::count(part, '\n'));
        };
        return {text.substr(0, begin) + fresh + text.substr(end),
                {branch.line, lines(text.substr(begin, end - begin)), branch.line, lines(fresh)}};
    }

    std::string text;
    std::vector<Branch> branches;
    Values values = allValues; ///< of A, B and C

private:
    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

    template <class... Texts>
    std::string oneOf(const Texts&... texts) {
        const std::string all[] = {texts...};
        return all[below(sizeof...(texts))];
    }

    std::string macro() { return macros[below(few_ ? 1 : macros.size())]; }

    /// A macro that a condition or a definition names.
    std::string name() {
        return plain_ || below(few_ ? 2 : 3) != 0 ? macro() : derived[below(few_ ? 1 : derived.size())];
    }

    /// What a macro is defined as: by others such that no call is expanded within itself, and `defined` is no argument.
    std::string body(const std::string& macroName) {
        const std::string place = oneOf("(__LINE__ % 2)", "__LINE__ % 3", "__COUNTER__", "(__COUNTER__ & 1)");
        const std::string constant = moves_ ? place : oneOf("1", "2");
        if (macroName == "VAL")
            return constant;
        const auto favourite = favourites_.find(macroName);
        if (favourite != favourites_.end() && below(4) != 0)
            return favourite->second;
        if (below(3) == 0)
            return oneOf("JOIN(V, AL)", "V ## AL", constant);
        const bool mayTest = std::ranges::find(derived, macroName) != derived.end();
        if (mayTest && below(4) == 0)
            return oneOf("defined(A)", "defined B || C", "!defined " + name(), "E");
        const std::string operand = macroName == "C" ? "C" : mayTest ? name() : macro();
        const std::string call = macroName == "C" ? "JOIN(V, AL)" : "F(" + macro() + ")";
        return oneOf("1", "(" + operand + ")", operand, "-" + operand, operand + " - 1", "C || " + operand,
                     "C == " + operand, call, "(" + call + " + 1)");
    }

    /// What changes macros, or looks as if it did.
    std::string change() {
        const std::string name = oneOf(macro(), macro(), "D", "E", "VAL", "VAL");
        const std::string pop = "pop_macro(\\\"" + name + "\\\")\")";
        const std::string changes[] = {
            "#undef " + name,
            "#undef " + name + "\n#define " + name + " " + body(name),
            "#undef " + name + "\n#define " + name + " " + body(name),
            "#\\\nun\\\ndef /* */ " + name,
            "#include \"header.h\"",
            oneOf("import \"header.h\";", "export import \"header.h\";"),
            "#pragma push_macro(\"" + name + "\")\n#define " + name + " 7",
            "#pragma pop_macro(\"" + name + "\")",
            "x; _Pragma(\"" + pop,
            "_Pra\\\ngma\n(\"" + pop,
            text.find("define POP") != std::string::npos ? "POP" : "DO(pop_macro(\"" + macro() + "\"))",
            oneOf("#define \u00e9 1", "#undef \\u00e9", "#undef " + macro() + "\u00a0"),
            oneOf("#assert m(x)", "#unassert m"),
            oneOf("#assert m(x)", "#unassert m"),
            oneOf("/*\n#undef " + name + " */", "s = '\"'; // \\\n#undef " + name),
        };
        return changes[theme_ != Theme::None && below(2) == 0 ? static_cast<std::size_t>(theme_) - below(3)
                                                              : below(15)];
    }

    std::string atom() {
        const std::string op = oneOf("==", "!=", "<", "<=", ">", ">=");
        const std::string common = below(4) == 0 ? oneOf("0", "1", "2") + " " + op + macro()
                                                 : macro() + " " + op + " " + oneOf("0", "0x1", "1L", "02", "0b10");
        const std::string odd = oneOf("#m(x)", "defined \u00e9", "defined(\\u00e9)");
        const std::string atoms[] = {
            "defined(" + name() + ")",
            "defined " + name(),
            name(),
            common,
            common,
            common,
            name() + " " + op + " " + name(), // from here on not in plain conditions
            name() + op + oneOf("-1", "1u", "0xFFFFFFFFFFFFFFFF", "'\\3'"),
            "(" + macro() + " & 1) " + op + " " + oneOf("0", "1"),
            macro() + "+1 " + op + " " + oneOf("2", macro() + "*2"),
            oneOf("F(" + macro() + ")", "F(AL)", "JOIN(V, AL)") + oneOf("", " " + op + " 1"),
            theme_ == Theme::Odd ? odd
                                 : oneOf("__has_include(<no//t.h>)", "__has_include ( <header//.h> )", odd, odd, odd,
                                         "not -" + macro(), "-" + macro()),
            derived[below(derived.size())] + op + "1",
        };
        return atoms[below(plain_ ? 6 : 13)];
    }

    std::string condition(std::size_t depth) {
        if (depth == 2 && !plain_ && below(2) == 0) { // some come again
            if (often_.empty() && theme_ == Theme::Odd)
                often_.push_back(oneOf("#m(x)", "defined \u00e9"));
            if (often_.empty() && theme_ == Theme::None && below(4) == 0)
                often_ = {"not -A", "-A"};
            if (often_.size() < 4)
                often_.push_back(below(2) == 0 ? atom() : derived[below(derived.size())]);
            return often_[below(often_.size())];
        }
        if (depth == 0 || below(3) == 0)
            return atom();
        if (below(4) == 0)
            return "!(" + condition(depth - 1) + ")";
        const std::string op = oneOf(" && ", " || ", "&& \\\n", oneOf(" /* c */ && ", "||/*\n*/", " &\\\n&"));
        return "(" + condition(depth - 1) + ")" + op + (below(2) == 0 ? atom() : "(" + condition(depth - 1) + ")");
    }

    std::string directive(bool first) {
        const std::string begin = oneOf("#", " # ", "%:") + (first ? "" : "el");
        const std::size_t kind = below(5);
        return begin + (kind == 0 ? "ifdef " + macro() : kind == 1 ? "ifndef " + macro() : "if " + condition(2));
    }

    void add(const std::string& line) { text += line + "\n"; }

    void addBranch(const std::string& directive, int parent, const std::vector<int>& earlier, std::size_t depth) {
        const int number = static_cast<int>(branches.size());
        const std::size_t keep = plain_ ? 9 : below(9);
        if (keep == 0)
            add(oneOf("// vtsym: keep, above", "/* vtsym: keep dead,\n above */  "));
        branches.push_back({static_cast<std::size_t>(std::ranges::count(text, '\n')) + 1, parent, earlier,
                            directive == "#else", keep < 2});
        add(directive + (keep == 1
                             ? oneOf(" // vtsym: keep, \\\n here", " /* vtsym: keep, here */", "/*vtsym:keep,here\n*/")
                         : keep == 2 ? " // a vtsym: keep, in prose"
                                     : ""));
        add("@" + std::to_string(number));
        for (std::size_t i = below(depth == 0 ? 3 : 2); i > 0 && depth < 3; --i) {
            if (!plain_ && below(3) == 0)
                add(below(60) == 0 ? "?\?=undef " + macro() : change());
            addChain(number, depth + 1);
        }
    }

    void addChain(int parent, std::size_t depth) {
        std::vector<int> earlier;
        for (std::size_t i = 0; i == 0 || below(2) == 0; ++i) {
            const int number = static_cast<int>(branches.size());
            addBranch(directive(i == 0), parent, earlier, depth);
            earlier.push_back(number);
        }
        if (below(2) == 0)
            addBranch("#else", parent, earlier, depth);
        add("#endif");
    }

    std::mt19937_64& random_;
    bool plain_;
    std::map<std::string, std::string> favourites_; ///< definitions that come again
    std::vector<std::string> often_;                ///< conditions that do
    /// What changes macros often, as the last of three kinds of changes.
    enum class Theme : std::uint8_t { None = 0, Pops = 10, Odd = 13 };
    Theme theme_ = plain_ ? Theme::None : std::array{Theme::None, Theme::Pops, Theme::Odd}[below(3)];
    bool moves_ = below(4) == 0;          ///< macros hang on places
    bool few_ = !plain_ && below(2) == 0; ///< conditions are about two of them
};

} // namespace VT::Testing
