# promise: the tests run the lines and both sides of the branches of base/ and parser/
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# The report is build/coverage/html/index.html; build/coverage/open.txt lists the branches of which a side never ran.  The reasons
# of those that stay open are in tests/campaign/uncovered.txt.  Tests of tools and packages run other programs and are left out.
suites='agreement choices core cover decide embedded eval fuzz host memory parser preprocessor print scan service simplify transform util variants'
[ "$short" = no ] || suites='core parser print simplify'
# shellcheck disable=SC2046,SC2086 # words on purpose
build coverage "program tests z3 coverage" $(printf 'test_%s ' $suites)
coverage=$root/build/coverage
rm -rf "$coverage/profiles"
mkdir -p "$coverage/profiles" "$coverage/html"
# shellcheck disable=SC2016,SC2086 # the first is expanded by the inner shell; words on purpose
printf '%s\n' $suites | LLVM_PROFILE_FILE=$coverage/profiles/%p.profraw xargs -P "$(nproc)" -I '{}' \
    sh -c '"$1/tests/test_$2" --gtest_brief=1 >"$1/$2.log" 2>&1 || echo "$2" >>"$1/profiles/failed"' - "$coverage" '{}'
# shellcheck disable=SC2086 # words on purpose
objects=$(printf -- "-object $coverage/tests/test_%s " $suites)
llvm-profdata merge -sparse "$coverage"/profiles/*.profraw -o "$coverage/all.profdata"
sources="$root/base $root/parser"
# shellcheck disable=SC2086
{
    llvm-cov show "$coverage/tests/test_core" -instr-profile="$coverage/all.profdata" $objects -format=html -show-branches=count -output-dir="$coverage/html" $sources
    llvm-cov export "$coverage/tests/test_core" -instr-profile="$coverage/all.profdata" $objects -skip-expansions $sources >"$coverage/all.json"
}
/usr/bin/python3 "$root/tests/campaign/coverage.py" "$root" "$coverage/all.json" "$root/tests/campaign/uncovered.txt" >"$coverage/open.txt"
tail -n 1 "$coverage/open.txt"
if [ -f "$coverage/profiles/failed" ]; then
    echo "coverage: tests failed in $(tr '\n' ' ' <"$coverage/profiles/failed")"
    exit 1
fi
