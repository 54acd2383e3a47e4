# promise: the seeds of the fuzz targets read nothing uninitialised, under Valgrind's memcheck
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
build test "program tests z3 memcheck" test_fuzz
seeds=$(cat "$root"/fuzz/seeds/*.txt | wc -l)
filter='*'
[ "$short" = no ] || filter='*quill_conditions:*c_grammar'
valgrind --quiet --error-exitcode=9 --leak-check=full "$root/build/test/tests/test_fuzz" --gtest_brief=1 --gtest_filter="$filter"
echo "memcheck: $("$root/build/test/tests/test_fuzz" --gtest_list_tests --gtest_filter="$filter" | grep -c '^  ') targets, $seeds seeds in all, 0 errors"
