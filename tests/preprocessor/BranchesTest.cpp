// Findings of a scan compared with a real preprocessor under every definition of the macros of a small world.
#include "base/scan/SourceScan.hpp"
#include "base/scan/changes/BranchMeanings.hpp"
#include "base/scan/regions/BuiltCondition.hpp"
#include "base/scan/report/Suppressions.hpp"
#include "tests/preprocessor/Judges.hpp"

#include <gtest/gtest.h>

#include <array>
#include <map>
#include <random>
#include <set>
#include <sstream>

namespace VT::Testing {
namespace {

const std::vector<std::string> macros{"A", "B", "C"};
/// What files define by them.
const std::vector<std::string> derived{"D", "E"};
/// Everything that files define.
const std::vector<std::string> defined{"A", "B", "C", "D", "E", "VAL", "F", "JOIN", "JOINED", "POP", "DO", "\u00e9"};
/// What a macro is defined as; empty where it is not.
using Values = std::vector<std::string>;
const Values allValues{"", "(-1)", "0", "1", "2", "3u", "18446744073709551615u"};
const std::string header = "#ifndef A\n#define A 2\n#endif\n";

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

/// The branches that are entered, for every definition.  With `assumed`, a -1 is among them where that condition does
/// not hold before the file, or after a header.
std::vector<std::set<int>> entered(std::string text, const Values& values, const std::string& assumed = {}) {
    const auto pragma = [](const std::string& what, const std::string& name) {
        return "#pragma " + what + "_macro(\"" + name + "\")\n";
    };
    std::size_t pushed = 2;
    for (std::size_t at = 0; (at = text.find("push_macro", at)) != std::string::npos; ++at)
        ++pushed;
    std::string begin; // leaves nothing of the definition before, and something to pop
    for (const std::string& name : defined) {
        for (std::size_t i = 0; i < pushed; ++i)
            begin += pragma("pop", name);
        begin += "#undef " + name + "\n";
    }
    for (const std::string& name : macros)
        for (const char* const value : {" 1\n", " 0\n"})
            begin += "#define " + name + value + pragma("push", name) + "#undef " + name + "\n";
    begin += "#unassert m\n";
    for (const std::string import : {"export import", "import"}) // of a header: its macros are those of an #include
        for (std::size_t at = 0; (at = text.find("\n" + import, at)) != std::string::npos;)
            text.replace(at + 1, import.size(), "#include");
    std::string all;
    std::vector<std::size_t> digits(macros.size());
    for (bool more = true; more;) {
        std::string definitions = begin;
        for (std::size_t i = 0; i < macros.size(); ++i)
            if (!values[digits[i]].empty())
                definitions += "#define " + macros[i] + " " + values[digits[i]] + "\n";
        all += "@@\n";
        if (!assumed.empty()) {
            const std::string check = "#if !(" + assumed + ")\n@-1\n#endif\n";
            all += definitions + check + "#include \"header.h\"\n" + check;
        }
        all += definitions + "#line 1\n" + text;
        more = false;
        for (std::size_t i = 0; i < digits.size() && !more; ++i) {
            digits[i] = (digits[i] + 1) % values.size();
            more = digits[i] != 0;
        }
    }
    std::vector<std::set<int>> result;
    std::istringstream lines(preprocessed(all, header));
    for (std::string line; std::getline(lines, line);)
        if (line == "@@")
            result.emplace_back();
        else if (line.starts_with('@'))
            result.back().insert(std::stoi(line.substr(1)));
    return result;
}

bool isReached(const Branch& branch, const std::set<int>& entered) {
    return (branch.parent < 0 || entered.contains(branch.parent)) &&
           std::ranges::none_of(branch.earlier, [&](int other) { return entered.contains(other); });
}

std::size_t offsetOf(const std::string& text, std::uint64_t line, std::uint64_t column) {
    std::size_t at = 0;
    for (; line > 1; --line)
        at = text.find('\n', at) + 1;
    for (; column > 1; --column) // of a character of one or more bytes
        for (++at; (static_cast<unsigned char>(text[at]) & 0xC0U) == 0x80U;)
            ++at;
    return at;
}

/// What is found with the knowledge of a build is true of every world that agrees with it.
void checkBuild(const RandomSource& source, const RandomSource::Build& build,
                std::map<BranchFindingKind, int>& counts) {
    const std::vector<std::set<int>> worlds = entered(source.text, source.values, build.assumed);
    BuildMacros known;
    bool isTaken = true;
    if (!build.option.empty())
        isTaken = known.define(build.option);
    else if (!build.file.empty())
        known.addFile("macros.h", build.file, false);
    else if (!build.macro.empty())
        isTaken = known.undefine(build.macro);
    ASSERT_TRUE(isTaken);
    SourceScanner scanner;
    ASSERT_TRUE(build.assumed.empty() || !scanner.assume(build.assumed)) << build.assumed;
    SourceFile file{source.text};
    file.configurations = {&known};
    scanner.scan(file, [&](const BranchFinding& finding) {
        ++counts[finding.kind];
        const auto branch =
            std::ranges::find(source.branches, static_cast<std::size_t>(finding.region.line), &Branch::line);
        ASSERT_NE(branch, source.branches.end());
        const int number = static_cast<int>(branch - source.branches.begin());
        for (std::size_t i = 0; i < worlds.size(); ++i) {
            std::size_t digits = i;
            for (const std::string& name : macros) {
                const std::string& value = source.values[digits % source.values.size()];
                if (name == build.macro && value != build.value && !finding.configurations.empty())
                    digits = ~std::size_t{0};
                if (digits == ~std::size_t{0})
                    break;
                digits /= source.values.size();
            }
            if (digits == ~std::size_t{0} || worlds[i].contains(-1))
                continue;
            const bool isIn = worlds[i].contains(number);
            const std::string shown = finding.directive + " with " + build.option + " " + build.file + " and " +
                                      build.assumed + "\n" + source.text;
            ASSERT_FALSE(finding.kind == BranchFindingKind::Dead && isIn) << shown;
            ASSERT_FALSE(finding.proposed == "1" && isReached(*branch, worlds[i]) && !isIn) << shown;
        }
    });
}

std::size_t commentsIn(const std::string& text) {
    std::size_t count = 0;
    for (std::size_t at = 0; (at = text.find("/*", at)) != std::string::npos; ++at)
        ++count;
    return count;
}

void checkSuppressions(const RandomSource& source) {
    std::set<std::uint64_t> expected;
    for (const Branch& branch : source.branches)
        if (branch.isKept)
            expected.insert(branch.line);
    std::set<std::uint64_t> read;
    for (const Suppression& suppression : readSuppressions(source.text)) {
        EXPECT_FALSE(suppression.isMalformed) << suppression.text;
        read.insert(suppression.line.value_or(0));
    }
    EXPECT_EQ(read, expected) << source.text;
}

void check(const RandomSource& source, bool plain, std::map<BranchFindingKind, int>& counts) {
    checkSuppressions(source);
    const std::vector<std::set<int>> worlds = entered(source.text, source.values);
    ASSERT_EQ(worlds.size(), plain ? 343U : 64U);
    std::map<int, BranchFindingKind> found;
    std::vector<BranchFinding> fixes;
    SourceScanner().scan(source.text, false, [&](const BranchFinding& finding) {
        ++counts[finding.kind];
        const auto branch =
            std::ranges::find(source.branches, static_cast<std::size_t>(finding.region.line), &Branch::line);
        ASSERT_NE(branch, source.branches.end());
        const int number = static_cast<int>(branch - source.branches.begin());
        found[number] = finding.proposed == "1" ? BranchFindingKind::AlwaysTrue : finding.kind;
        for (const std::set<int>& world : worlds) {
            const bool isIn = world.contains(number);
            ASSERT_FALSE(finding.kind == BranchFindingKind::Dead && isIn) << finding.directive << "\n" << source.text;
            ASSERT_FALSE(finding.proposed == "1" && isReached(*branch, world) && !isIn) << finding.directive << "\n"
                                                                                        << source.text;
        }
        if (finding.replaced)
            fixes.push_back(finding);
    });
    std::vector<SourceEdit> edits;
    for (const BranchFinding& fix : fixes)
        edits.push_back(fix.edit);
    const std::string mended = withEdits(source.text, edits); // all at once
    EXPECT_EQ(commentsIn(mended), commentsIn(source.text)) << mended;
    SourceScanner().scan(mended, false, [&](const BranchFinding& finding) {
        const std::size_t number = mended.find('@', offsetOf(mended, finding.region.line, finding.region.column));
        const int branch = std::stoi(mended.substr(number + 1));
        EXPECT_TRUE(!finding.replaced || !found.contains(branch)) << finding.directive << "\n"
                                                                  << source.text << "\n"
                                                                  << mended;
    });
    const bool moves = source.text.find("__COUNTER__") != std::string::npos || // changes where something is left out
                       source.text.find("__LINE__") != std::string::npos;
    EXPECT_TRUE(moves || entered(mended, source.values) == worlds) << source.text << "\nis not\n" << mended;
    for (std::size_t i = 0; plain && i < source.branches.size(); ++i) {
        const Branch& branch = source.branches[i];
        const int number = static_cast<int>(i);
        std::size_t lives = 0, reached = 0, in = 0; // worlds
        for (const std::set<int>& world : worlds) {
            lives += branch.parent < 0 || world.contains(branch.parent) ? 1U : 0U;
            reached += isReached(branch, world) ? 1U : 0U;
            in += world.contains(number) ? 1U : 0U;
        }
        const bool isDead = lives > 0 && in == 0;
        const bool always = !branch.isElse && reached > 0 && reached == in; // none is in that is not reached
        const auto is = [&](BranchFindingKind kind) { return found.contains(number) && found[number] == kind; };
        EXPECT_EQ(is(BranchFindingKind::Dead), isDead) << branch.line << "\n" << source.text;
        EXPECT_EQ(is(BranchFindingKind::AlwaysTrue), always) << branch.line << "\n" << source.text;
    }
}

class Branches : public ::testing::TestWithParam<bool> {};

TEST_P(Branches, AreWhatAPreprocessorMakesOfThem) {
    std::mt19937_64 random(GetParam() ? 1 : 2);
    std::map<BranchFindingKind, int> counts;
    for (int i = 0; i < (GetParam() ? 60 : 300) && !HasFailure(); ++i)
        check(RandomSource(random, GetParam()), GetParam(), counts);
    std::cout << "dead " << counts[BranchFindingKind::Dead] << ", always true " << counts[BranchFindingKind::AlwaysTrue]
              << ", removable " << counts[BranchFindingKind::Removable] << "\n";
    for (const auto& [kind, times] : counts)
        EXPECT_GT(times, 10);
}

/// The operands of a reason force a finding, and without any one of them another definition is there.
TEST(ReasonsOfBranches, AreTheFewestOperands) {
    std::mt19937_64 random(5);
    std::size_t asked = 0;
    for (int i = 0; i < 40 && !::testing::Test::HasFailure(); ++i) {
        const RandomSource source(random, true);
        std::string questions;
        std::vector<std::pair<bool, std::string>> expected; // whether the answer is yes for some definition
        const auto ask = [&](const std::vector<std::string>& operands, bool isYes) {
            std::string condition = "1";
            for (const std::string& operand : operands)
                condition += " && (" + operand + ")";
            questions += "#if " + condition + "\n@" + std::to_string(expected.size()) + "\n#endif\n";
            expected.emplace_back(isYes, condition);
        };
        SourceScanner({.why = true}).scan(source.text, false, [&](const BranchFinding& finding) {
            const bool isDead = finding.kind == BranchFindingKind::Dead;
            if ((!isDead && finding.proposed != "1") || finding.condition.empty() || finding.because.empty())
                return;
            EXPECT_TRUE(finding.isMinimal);
            std::vector<std::string> operands = finding.because;
            if (!isDead)
                operands.push_back("!(" + finding.condition + ")");
            ask(operands, false);
            for (std::size_t left = 0; left < finding.because.size(); ++left) {
                std::vector<std::string> others = operands;
                others.erase(others.begin() + static_cast<std::ptrdiff_t>(left));
                ask(others, true);
            }
        });
        std::set<int> answers;
        for (const std::set<int>& world : entered(questions, source.values))
            answers.insert(world.begin(), world.end());
        for (std::size_t question = 0; question < expected.size(); ++question)
            EXPECT_EQ(answers.contains(static_cast<int>(question)), expected[question].first)
                << expected[question].second << "\n"
                << source.text;
        asked += expected.size();
    }
    EXPECT_GT(asked, 500U);
}

TEST(ChangedBranches, AreBuiltInOtherCases) {
    std::mt19937_64 random(4);
    std::size_t reported = 0;
    std::size_t unchanged = 0;
    for (int i = 0; i < 60 && !::testing::Test::HasFailure(); ++i) {
        RandomSource source(random, true);
        const RandomSource::Rewritten fresh = source.rewritten();
        const std::vector<std::set<int>> before = entered(source.text, source.values);
        const std::vector<std::set<int>> after = entered(fresh.text, source.values);
        std::set<int> found;
        for (const ChangedBranch& changed : changedBranches(source.text, fresh.text, false, {fresh.lines})) {
            const std::size_t at = offsetOf(fresh.text, changed.region.line, 1);
            found.insert(std::stoi(fresh.text.substr(fresh.text.find('@', at) + 1)));
        }
        reported += found.size();
        for (std::size_t k = 0; k < source.branches.size(); ++k) {
            const int number = static_cast<int>(k);
            bool differs = false;
            for (std::size_t world = 0; world < before.size(); ++world)
                differs = differs || before[world].contains(number) != after[world].contains(number);
            unchanged += differs ? 0U : 1U;
            bool isReported = false; // or one around it
            for (int each = number; each >= 0; each = source.branches[static_cast<std::size_t>(each)].parent)
                isReported = isReported || found.contains(each);
            EXPECT_TRUE(differs ? isReported : !found.contains(number)) << number << "\n"
                                                                        << source.text << "\nand\n"
                                                                        << fresh.text;
        }
    }
    EXPECT_GT(reported, 30U);
    EXPECT_GT(unchanged, 100U);
}

TEST(BranchesOfBuilds, AreWhatAPreprocessorMakesOfThem) {
    std::mt19937_64 random(3);
    std::map<BranchFindingKind, int> counts;
    for (int i = 0; i < 300 && !::testing::Test::HasFailure(); ++i) {
        RandomSource source(random, false);
        checkBuild(source, source.build(), counts);
    }
    for (const auto& [kind, times] : counts)
        EXPECT_GT(times, 10);
}

INSTANTIATE_TEST_SUITE_P(PlainAndAny, Branches, ::testing::Bool());

/// The condition of a branch, asked at the end of the file, holds where the branch is entered.  Where macros change on
/// the way, it is asked only whether it is always or never so.
TEST(BuiltConditions, AreWhatAPreprocessorMakesOfThem) {
    constexpr int asked = 100'000; // is added to the number of a branch
    std::mt19937_64 random(23);
    std::size_t conditions = 0;
    std::size_t constants = 0;
    for (int file = 0; file < 60; ++file) {
        const bool isPlain = file % 2 == 0;
        RandomSource source(random, isPlain);
        const ConditionalRegions regions(source.text);
        std::string text = source.text;
        std::map<int, std::string> built;
        for (std::size_t i = 0; i < source.branches.size(); ++i) {
            const std::uint32_t region = regions.onLine(source.branches[i].line);
            if (region == ConditionalRegions::none)
                continue;
            const std::string condition = builtCondition(source.text, false, regions, region).condition;
            ASSERT_TRUE(!isPlain || !condition.empty()) << source.text << "branch " << i;
            const bool isConstant = condition == "0" || condition == "1";
            if (condition.empty() || (!isPlain && !isConstant))
                continue;
            ++(isConstant ? constants : conditions);
            built[static_cast<int>(i)] = condition;
            text += "#if " + condition + "\n@" + std::to_string(asked + static_cast<int>(i)) + "\n#endif\n";
        }
        for (const std::set<int>& entered : entered(text, source.values))
            for (const auto& [branch, condition] : built)
                ASSERT_EQ(entered.contains(branch), entered.contains(asked + branch))
                    << source.text << "branch " << branch << ": " << condition;
    }
    EXPECT_GT(conditions, 100U);
    EXPECT_GT(constants, 30U);
}

} // namespace
} // namespace VT::Testing
