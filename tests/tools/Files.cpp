// Files that the program reads and writes: bounds, what is not a file, and failures.
#include "tests/tools/Program.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

const std::map<std::string, std::string> files{{"c.c", "#if A\n#if A\n#endif\n#endif\n"}, // 27 bytes
                                               {"m", R"({"blocks": [{"name": "b", "condition": "A && !A"}]})"}};
const std::string holds = ":2: '#if A' always holds, since '#if A' (line 1) holds here\n";
const std::string finding = "c.c" + holds;
const std::string never = "m:1: b is never active: A && !A never holds\n";

// Endless and huge files would not end in time if more than their beginnings were read.
TEST(Files, AreReadUpToABound) {
    expectRows(
        {
            {"truncate -s 1T big.c; vtsym scan big.c", "", "big.c: is not a text", 2},
            {"yes '#if A' | head -c 9000 >big.c; truncate -s 1T big.c; vtsym scan big.c c.c", finding,
             "big.c: is larger than 64 MiB: --max-size allows more\n", 2},
            {"yes '{}' | head -c 9000 >big; truncate -s 1T big; vtsym check big", "", "big: is larger than 64 MiB", 2},
            {"truncate -s 1T big; vtsym check big", "", "big: is not a text", 2},
            {"vtsym scan /dev/zero", "", "/dev/zero: is not a text", 2},
            {"yes | vtsym scan --max-size 1M /dev/stdin", "", "/dev/stdin: is larger than 1 MiB", 2},
            {"yes | vtsym check --max-size=2K /dev/stdin", "", "/dev/stdin: is larger than 2 KiB", 2},
            {"vtsym scan --max-size 26 c.c", finding, "", 1},
            {"vtsym scan --max-size 25 c.c", "", "c.c: is larger than 25 bytes", 2},
            {"cat c.c | vtsym scan --max-size 26 /dev/stdin", "/dev/stdin" + holds, "", 1},
            {"cat c.c | vtsym scan --max-size 25 /dev/stdin", "", "larger than 25 bytes", 2},
            {"mkfifo pipe; cat c.c >pipe & vtsym scan pipe", "pipe" + holds, "", 1},
            {"{ head -c 67108865 /dev/zero | tr '\\0' x; echo; echo A; } | vtsym simplify", "\nA\n",
             "line 1: The line is longer than 64 MiB.", 1},
            {"vtsym scan --max-size 0 c.c", "", "'0' is not a size", 2},
            {"vtsym scan --max-size 8388608T c.c", "", "'8388608T' is not a size", 2},
            {"vtsym scan --max-size 99999999999G c.c", "", "'99999999999G' is not a size", 2},
        },
        files);
}

TEST(Files, BelowDirectoriesAreRegular) {
    expectRows(
        {
            {"mkfifo a.c; ln -s /dev/zero b.c; ln -s d.c d.c; ln -s . e; ln -s e/e/e/c.c f.c; mkdir g.c; vtsym scan .",
             finding, "", 1},
            {"ln -s d.c d.c; vtsym scan c.c d.c", finding, "d.c: cannot be read: Too many levels", 2},
            {"mkdir x y; mkdir x/z; cp c.c x; ln -s ../x/z y/l; vtsym scan y/l/../c.c", "y/l/../" + finding, "", 1},
            {"vtsym scan ./c.c .//c.c .", finding, "", 1},
            {"vtsym scan c.c /proc/self/mem", finding, "/proc/self/mem: cannot be read: ", 2},
            {"vtsym scan c.c ''", finding, "cannot be read: No such file", 2},
            {"mkdir empty; vtsym scan empty", "", "empty: there is no C or C++ file", 2},
            {"name=$(head -c 200 /dev/zero | tr '\\0' d); for i in $(seq 23); do mkdir $name; cd $name; done; "
             "cd \"${PWD%%/ddd*}\"; vtsym scan .; status=$?; rm -rf $name; exit $status",
             finding, "cannot be read: File name too long", 2},
        },
        files);
}

TEST(Files, AreNotLost) {
    expectRows(
        {
            {"vtsym check .", "", ".: is a folder: name a file in it\n", 2},
            {"vtsym check nowhere", "", "nowhere: cannot be read: No such file", 2},
            {"cp m was; vtsym check --html m m; cmp m was && exit 9", "", "m: is the model: name another file", 9},
            {"cp m was; vtsym check --html ./m m; cmp m was && exit 9", "", "./m: is the model", 9},
            {"cp m was; ln -s m l; vtsym check --html l m; cmp m was && exit 9", "", "l: is the model", 9},
            {"cp m was; ln m l; vtsym check --html m l; cmp m was && exit 9", "", "m: is the model", 9},
            {"cp m was; vtsym check --html m /dev/stdin <m; cmp m was && exit 9", "", "m: is the model", 9},
            {"cp m page; vtsym check --html page m && false; grep -c '</html>' page", never + "1\n"},
            {"vtsym check --html /dev/full m", never, "/dev/full: cannot be written: No space", 2},
            {"vtsym check --html . m", never, ".: cannot be written: Is a directory", 2},
            {"vtsym check --html page m >&-; s=$?; grep -c '</html>' page; grep -c '^m:1' page; exit $s", "1\n0\n",
             "standard output cannot be written", 2},
            {"vtsym check m >/dev/full", "", "standard output cannot be written", 2},
            {"vtsym scan --sarif c.c >/dev/full", "", "standard output cannot be written", 2},
            {"vtsym simplify a >/dev/full", "", "vtsym: standard output cannot be written: ", 1},
            {"vtsym operators >/dev/full", "", "vtsym: standard output cannot be written: ", 1},
            {"vtsym --help >/dev/full", "", "vtsym: standard output cannot be written: ", 1},
            // The reader is gone before the program starts.
            {"for c in 'simplify a' operators --help; do { sleep 0.2; vtsym $c; echo $? >>s; } | :; done; cat s",
             "1\n1\n1\n"},
            {"vtsym convert --to pp 'x > .5' 2>/dev/full", "x > 0.5\n", "", 1},
            {"vtsym scan --summary c.c 2>/dev/full", finding, "", 2},
            {"vtsym convert --to pp 'x > .5' 2>&-", "x > 0.5\n"},
            {"vtsym simplify <&-", "", "standard input cannot be read", 1},
        },
        files);
}

} // namespace
} // namespace VT::Testing
