# promise: the program writes the same bytes whichever compiler, optimisation, locale and stack it has
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# g++ -O1, g++ -O3 with checks, and clang -O0; the locales that the tests make; stacks of 256 KiB, 8 MiB and no bound.
build program "program z3" vtsym_program
build test "program tests z3" vtsym_program vtsym_test_locales
build clang "program fuzz z3" vtsym_program
work=$root/build/same
mkdir -p "$work"
sed 's/\r$//' "$root"/tests/data/corpus/*-conditions.txt >"$work/conditions.txt"
[ "$short" = no ] || sed -n '1~20p' "$work/conditions.txt" >"$work/few.txt"
[ "$short" = no ] || mv "$work/few.txt" "$work/conditions.txt"
awk 'NR>1 {print before "\t" $0} {before = $0}' "$work/conditions.txt" >"$work/pairs.txt"

# reports PROGRAM: everything that it writes, in one text.
reports() {
    cd "$root/examples" || exit
    for command in 'simplify --json' 'convert --to quill' 'convert --to pp' 'tree' 'symbols'; do
        # shellcheck disable=SC2086 # words on purpose
        "$1" $command <"$work/conditions.txt" 2>&1 || :
    done
    "$1" compare --json <"$work/pairs.txt" 2>&1 || :
    "$1" check --json --why model.json 2>&1 || :
    "$1" scan --sarif --why . 2>&1 || :
}

(reports "$root/build/program/bin/vtsym") >"$work/expected"
ways=0
different=0
for preset in program test clang; do
    for locale in C C.UTF-8 $(find "$root/build/test/locales" -mindepth 1 -maxdepth 1 -type d -printf '%f '); do
        for stack in 256 8192 unlimited; do
            (
                ulimit -s "$stack"
                export LOCPATH="$root/build/test/locales" LC_ALL="$locale"
                reports "$root/build/$preset/bin/vtsym"
            ) >"$work/got"
            ways=$((ways + 1))
            cmp "$work/expected" "$work/got" || {
                echo "same: $preset in the locale $locale with a stack of $stack KiB differs"
                different=$((different + 1))
            }
        done
    done
done
echo "same: $ways ways to run, $(wc -c <"$work/expected") bytes each, $different differ"
[ "$different" -eq 0 ]
