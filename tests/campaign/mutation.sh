# promise: the tests notice when the simplifier, decisions, printers, evaluation or the parser are changed
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# Every mutant is compiled in once, see tests/mutation, and has 10 s of tests, the likely ones first.  explained.txt there has the reasons of those that no test can find.
build test "program tests z3 mutation" vtsym_solver_0
mutated=$root/build/mutation/mutated
folders='base/simplify base/decide base/print base/eval parser'
[ "$short" = no ] || minutes=2 folders=base/simplify
# shellcheck disable=SC2086 # words on purpose
if [ "$(cat "$mutated/folders" 2>/dev/null)" != "$folders" ] || [ -n "$(cd "$root" && find $folders tests/mutation/mutate.py -newer "$mutated/mutants.txt" -type f)" ]; then
    rm -rf "$mutated" "$root/build/mutation/build.ninja" # which copies there are is looked up when it is written
    mkdir -p "$mutated"
    /usr/bin/python3 "$root/tests/mutation/mutate.py" "$root" "$mutated" "$root/build/test/compile_commands.json" $folders
    echo "$folders" >"$mutated/folders"
fi
build mutation program vtsym_mutants
"$root/build/mutation/tests/vtsym_mutants" "$mutated/mutants.txt" "$root/tests/mutation/explained.txt" --minutes "$minutes" --seed "$seed" --seconds 10
