# promise: the tests pass in any order, many times over and side by side
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# Rounds are as many as fit the minutes, at least one.  A failure counts as flaky when the test alone then passes.
build test "program tests z3" all
rounds=0
failures=0
filter=''
[ "$short" = no ] || filter='-R ^(core|simplify|service|parser)\.'
end=$(($(date +%s) + minutes * 60))
while [ "$rounds" -eq 0 ] || [ "$(date +%s)" -lt "$end" ]; do
    # shellcheck disable=SC2086 # words on purpose
    if ! ctest --test-dir "$root/build/test" --schedule-random --parallel 8 --output-on-failure $filter >"$root/build/flaky.log" 2>&1; then
        failures=$((failures + 1))
        tail -20 "$root/build/flaky.log"
        ctest --test-dir "$root/build/test" --rerun-failed --output-on-failure || :
    fi
    rounds=$((rounds + 1))
done
echo "flaky: $rounds rounds in random order with 8 at a time, $(sed -n 's/.* tests failed out of //p' "$root/build/flaky.log") tests, $failures rounds with failures"
[ "$failures" -eq 0 ]
