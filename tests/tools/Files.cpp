// Files that the program reads and writes: bounds, what is not a file, and failures.
#include "tests/support/Workplace.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;

/// What a shell script writes, in which `vtsym` is the program.
ProgramResult shell(const Workplace& place, const std::string& script) {
    place.write("script", "vtsym() { '" VTSYM_PROGRAM "' \"$@\"; }\n" + script);
    ProgramResult result;
    result.status = place.run("sh ./script >out 2>words");
    result.output = place.read("out");
    result.words = place.read("words");
    return result;
}

struct Row {
    std::string script;
    int status;
    std::string output; ///< a part of it; none for nothing
    std::string words;  ///< a part of them; none for silence
};

void expectRows(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        SCOPED_TRACE(row.script);
        const Workplace place;
        place.write("c.c", "#if A\n#if A\n#endif\n#endif\n"); // 27 bytes
        place.write("m", R"({"blocks": [{"name": "b", "condition": "A && !A"}]})");
        const ProgramResult result = shell(place, row.script);
        EXPECT_EQ(result.status, row.status);
        EXPECT_THAT(result.output, HasSubstr(row.output));
        EXPECT_EQ(result.output.empty(), row.output.empty()) << result.output;
        EXPECT_THAT(result.words, HasSubstr(row.words));
        EXPECT_EQ(result.words.empty(), row.words.empty()) << result.words;
    }
}

const std::string finding = "c.c:2: '#if A' always holds";

// Endless and huge files would not end in time if more than their beginnings were read.
TEST(Files, AreReadUpToABound) {
    expectRows({
        {"truncate -s 1T big.c; vtsym scan big.c", 2, "", "big.c: is not a text"},
        {"yes '#if A' | head -c 9000 >big.c; truncate -s 1T big.c; vtsym scan big.c c.c", 2, finding,
         "big.c: is larger than 64 MiB: --max-size allows more\n"},
        {"yes '{}' | head -c 9000 >big; truncate -s 1T big; vtsym check big", 2, "", "big: is larger than 64 MiB"},
        {"truncate -s 1T big; vtsym check big", 2, "", "big: is not a text"},
        {"vtsym scan /dev/zero", 2, "", "/dev/zero: is not a text"},
        {"yes | vtsym scan --max-size 1M /dev/stdin", 2, "", "/dev/stdin: is larger than 1 MiB"},
        {"yes | vtsym check --max-size=2K /dev/stdin", 2, "", "/dev/stdin: is larger than 2 KiB"},
        {"vtsym scan --max-size 26 c.c", 1, finding, ""},
        {"vtsym scan --max-size 25 c.c", 2, "", "c.c: is larger than 25 bytes"},
        {"cat c.c | vtsym scan --max-size 26 /dev/stdin", 1, "'#if A' always holds", ""},
        {"cat c.c | vtsym scan --max-size 25 /dev/stdin", 2, "", "larger than 25 bytes"},
        {"mkfifo pipe; cat c.c >pipe & vtsym scan pipe", 1, "pipe:2: '#if A' always holds", ""},
        {"{ head -c 67108865 /dev/zero | tr '\\0' x; echo; echo A; } | vtsym simplify", 1, "\nA\n",
         "line 1: The line is longer than 64 MiB."},
        {"vtsym scan --max-size 0 c.c", 2, "", "'0' is not a size"},
        {"vtsym scan --max-size 8388608T c.c", 2, "", "'8388608T' is not a size"},
        {"vtsym scan --max-size 99999999999G c.c", 2, "", "'99999999999G' is not a size"},
    });
}

TEST(Files, BelowDirectoriesAreRegular) {
    expectRows({
        {"mkfifo a.c; ln -s /dev/zero b.c; ln -s d.c d.c; ln -s . e; ln -s e/e/e/c.c f.c; mkdir g.c; vtsym scan .", 1,
         finding, ""},
        {"ln -s d.c d.c; vtsym scan c.c d.c", 2, finding, "d.c: cannot be read: Too many levels"},
        {"mkdir x y; mkdir x/z; cp c.c x; ln -s ../x/z y/l; vtsym scan y/l/../c.c", 1, "y/l/../c.c:2:", ""},
        {"vtsym scan ./c.c .//c.c .", 1, finding, ""},
        {"vtsym scan c.c /proc/self/mem", 2, finding, "/proc/self/mem: cannot be read: "},
        {"vtsym scan c.c ''", 2, finding, "cannot be read: No such file"},
        {"mkdir empty; vtsym scan empty", 2, "", "empty: there is no C or C++ file"},
        {"name=$(head -c 200 /dev/zero | tr '\\0' d); for i in 1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 17 18 19 20 21 "
         "22 23; "
         "do mkdir $name; cd $name; done; cd \"${PWD%%/ddd*}\"; vtsym scan .; status=$?; rm -rf $name; exit $status",
         2, finding, "cannot be read: File name too long"},
    });
}

TEST(Files, AreNotLost) {
    expectRows({
        {"vtsym check .", 2, "", ".: is a folder: name a file in it\n"},
        {"vtsym check nowhere", 2, "", "nowhere: cannot be read: No such file"},
        {"cp m was; vtsym check --html m m; cmp m was && exit 9", 9, "", "m: is the model: name another file"},
        {"cp m was; vtsym check --html ./m m; cmp m was && exit 9", 9, "", "./m: is the model"},
        {"cp m was; ln -s m l; vtsym check --html l m; cmp m was && exit 9", 9, "", "l: is the model"},
        {"cp m was; ln m l; vtsym check --html m l; cmp m was && exit 9", 9, "", "m: is the model"},
        {"cp m was; vtsym check --html m /dev/stdin <m; cmp m was && exit 9", 9, "", "m: is the model"},
        {"cp m page; vtsym check --html page m && false; grep -c '</html>' page", 0, "m:1: b is never active", ""},
        {"vtsym check --html /dev/full m", 2, "never active", "/dev/full: cannot be written: No space"},
        {"vtsym check --html . m", 2, "never active", ".: cannot be written: Is a directory"},
        {"vtsym check --html page m >&-; echo $? >status; grep -c '</html>' page; grep -c '^m:1' page; exit $(cat "
         "status)",
         2, "1\n0\n", "standard output cannot be written"},
        {"vtsym check m >/dev/full", 2, "", "standard output cannot be written"},
        {"vtsym scan --sarif c.c >/dev/full", 2, "", "standard output cannot be written"},
        {"vtsym convert --to pp 'x > .5' 2>/dev/full", 1, "x > 0.5", ""},
        {"vtsym scan --summary c.c 2>/dev/full", 2, finding, ""},
        {"vtsym convert --to pp 'x > .5' 2>&-", 0, "x > 0.5", ""},
        {"vtsym simplify <&-", 1, "", "standard input cannot be read"},
    });
}

} // namespace
} // namespace VT::Testing
