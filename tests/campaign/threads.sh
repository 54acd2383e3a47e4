# promise: separate tables, and what the program does in parallel, have no race, under ThreadSanitizer
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# Rounds are as many as fit the minutes, at least one: the order of threads differs from round to round.  The short form is that of
# ./test, which runs the same tests without the sanitizer.
[ "$short" = no ] || {
    echo 'threads: nothing beyond ./test in the short form'
    exit 0
}
build sanitize-thread "program tests z3" test_threads
rounds=0
end=$(($(date +%s) + minutes * 60))
while [ "$rounds" -eq 0 ] || [ "$(date +%s)" -lt "$end" ]; do
    (cd "$root" && quietly "$root/build/threads.log" ctest --preset sanitize-thread) || exit 1
    rounds=$((rounds + 1))
done
echo "threads: $rounds rounds of $(sed -n 's/.* tests failed out of //p' "$root/build/threads.log") tests under ThreadSanitizer, 0 races"
