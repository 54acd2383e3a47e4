# promise: any input of the fuzz targets keeps every promise under AddressSanitizer and UndefinedBehaviorSanitizer
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign, which sets root, minutes, seed, short and target
#
# Each target begins with the seeds that are kept and has an equal share of the minutes.  A fault leaves its input in
# build/fuzz/found.  With --keep, what was learned is minimised and becomes the seeds.
build fuzz "program tests fuzz z3" vtsym_fuzz vtsym_seeds
fuzzer=$root/build/fuzz/fuzz
targets=$target
[ -n "$targets" ] || targets=$(VTSYM_FUZZ_TARGET='' "$fuzzer/vtsym_fuzz" 2>&1 | sed -n 's/.*one of: //p')
# shellcheck disable=SC2086 # words on purpose
seconds=$(awk -v minutes="$minutes" -v targets="$(echo $targets | wc -w)" 'BEGIN {print int(minutes * 60 / targets) + 1}')
found=$root/build/fuzz/found
mkdir -p "$found"
all=0
faults=0
for each in $targets; do
    case $each in
    c_grammar | decide | decide_32_bits | given) words=c longest=400 ;;
    quill_*) words=quill longest=4096 ;;
    scan_bytes) words=directives longest=4096 ;;
    *) words='' longest=512 ;;
    esac
    corpus=$root/build/fuzz/corpus/$each
    mkdir -p "$corpus"
    [ ! -f "$root/fuzz/seeds/$each.txt" ] || "$fuzzer/vtsym_seeds" unpack "$root/fuzz/seeds/$each.txt" "$corpus"
    log=$root/build/fuzz/$each.log
    status=0
    # Entropic scheduling costs more here than it finds: its book-keeping took two thirds of the time.
    VTSYM_FUZZ_TARGET=$each "$fuzzer/vtsym_fuzz" ${words:+-dict="$root/fuzz/words/$words.dict"} \
        -seed="$seed" -max_len="$longest" -max_total_time="$seconds" -timeout=10 -rss_limit_mb=256 -entropic=0 -reload=0 \
        -print_final_stats=1 -artifact_prefix="$found/$each-" "$corpus" >"$log" 2>&1 || status=$?
    runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log")
    all=$((all + ${runs:-0}))
    echo "$each: ${runs:-0} inputs, $(sed -n 's/^stat::peak_rss_mb: *//p' "$log") MB, slowest $(sed -n 's/^stat::slowest_unit_time_sec: *//p' "$log") s"
    if [ "$status" -ne 0 ]; then
        faults=$((faults + 1))
        grep -aE -A3 'runtime error|^broken|ERROR: ' "$log" | head -12
        echo "$each: the input is in build/fuzz/found, the report in build/fuzz/$each.log"
    elif [ "$keep" = yes ]; then
        rm -rf "$corpus.least"
        mkdir "$corpus.least"
        VTSYM_FUZZ_TARGET=$each "$fuzzer/vtsym_fuzz" -merge=1 -max_len="$longest" "$corpus.least" "$corpus" >>"$log" 2>&1
        "$fuzzer/vtsym_seeds" pack "$corpus.least" "$root/fuzz/seeds/$each.txt"
    fi
done
echo "fuzz: $all inputs, $faults faults, seed $seed"
[ "$faults" -eq 0 ]
