#!/usr/bin/env bash
# Fuzzes the library with libFuzzer under AddressSanitizer and UndefinedBehaviorSanitizer, after a
# replay of the corpora in fuzz/corpus, and prints what was tried.
#
#    scripts/fuzz.sh [--seconds N | --long | --replay] [TARGET...]
#
# Each target runs 20 seconds, N seconds, with --long 10 minutes, or not at all beyond the replay.
# What a run finds new lies in build/fuzz/corpus/TARGET, an input that breaks a promise in
# build/fuzz/findings.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

seconds=20
targets=()
while (($# > 0)); do
    case $1 in
        --seconds) seconds=$2 && shift ;;
        --long) seconds=600 ;;
        --replay) seconds=0 ;;
        *) targets+=("$1") ;;
    esac
    shift
done
if ((${#targets[@]} == 0)); then
    targets=(definition record query rows percent plain time)
fi

need_packages clang-14:clang++-14 libclang-rt-14-dev binutils:objcopy "${library_packages[@]}"

folder=build/fuzz
mkdir -p "$folder/objects" "$folder/findings"
compiler=(clang++-14)
if command -v ccache >/dev/null; then
    compiler=(ccache clang++-14)
fi
flags=(-std=c++17 -O1 -g -fno-omit-frame-pointer -fno-sanitize-recover=all -Iinclude -I/usr/include/jsoncpp)
sanitizers=address,undefined

object_of() {
    local name=${1//\//_}
    printf '%s/objects/%s.o' "$folder" "${name%.cpp}"
}

compile() {
    local -a more=()
    if [[ $1 == src/util/util.cpp ]]; then
        # Red zones would take the static below its name.
        more=(-mllvm -asan-globals=0)
    fi
    "${compiler[@]}" "${flags[@]}" "-fsanitize=fuzzer-no-link,$sanitizers" "${more[@]}" \
        -c "$1" -o "$(object_of "$1")"
}

build_targets() {
    local -a sources=() objects=()
    local source cache target
    mapfile -t sources < <(find src -name '*.cpp' | LC_ALL=C sort)
    for source in "${sources[@]}" fuzz/FuzzHost.cpp "${targets[@]/%/.cpp}"; do
        [[ $source == */* ]] || source=fuzz/$source
        compile "$source" &
        while (($(jobs -rp | wc -l) >= jobs)); do
            wait -n
        done
    done
    # Until the last has ended, each with its own status.
    while (($(jobs -rp | wc -l) > 0)); do
        wait -n
    done

    # The cache of member types is a static of its function; the fuzz host empties it.
    cache=$(nm "$(object_of src/util/util.cpp)" | awk '$3 ~ /^_ZZN12VORN_JSON_DB7recType.*E5jType$/ { print $3 }')
    objcopy "--redefine-sym=$cache=vornjsondb_fuzz_type_cache" --globalize-symbol=vornjsondb_fuzz_type_cache \
        "$(object_of src/util/util.cpp)"

    for source in "${sources[@]}" fuzz/FuzzHost.cpp; do
        objects+=("$(object_of "$source")")
    done
    for target in "${targets[@]}"; do
        clang++-14 "-fsanitize=fuzzer,$sanitizers" -o "$folder/$target" \
            "$(object_of "fuzz/$target.cpp")" "${objects[@]}" -ljsoncpp -lsqlite3
    done
}

# run_target TARGET prints one line of figures; the log of the last run is kept.
run_target() {
    local target=$1 log=$folder/$1.log grown=$folder/corpus/$1 left=$seconds runs=0 coverage
    local -a slice
    local -a options=("-max_len=4096" "-timeout=20" "-rss_limit_mb=2048" "-print_final_stats=1"
        "-artifact_prefix=$folder/findings/$1-")
    if [[ -e fuzz/dictionary/$target.dict ]]; then
        options+=("-dict=fuzz/dictionary/$target.dict")
    fi
    mkdir -p "$grown"
    slice=("-runs=0" "fuzz/corpus/$target")
    while true; do
        if ! "$folder/$target" "${options[@]}" "${slice[@]}" >"$log" 2>&1; then
            grep -aE 'broken promise|ERROR|runtime error|^    #[0-9] ' "$log" | head -n 30
            printf '%-12s FAILED, see %s\n' "$target" "$log"
            return 1
        fi
        runs=$((runs + $(awk '/stat::number_of_executed_units/ { print $2 }' "$log")))
        if ((left <= 0)); then
            break
        fi
        # What the library keeps for the life of the process would grow without end.
        slice=("-max_total_time=$((left < 60 ? left : 60))" "$grown" "fuzz/corpus/$target")
        left=$((left - 60))
    done
    coverage=$(awk '/ cov: / { for (i = 1; i < NF; ++i) if ($i == "cov:") c = $(i + 1) } END { print c }' "$log")
    printf '%-12s %5d s  %9d runs  %5d edges  %4d checked-in inputs replayed\n' "$target" "$seconds" \
        "$runs" "$coverage" "$(find "fuzz/corpus/$target" -type f | wc -l)"
}

build_targets
export ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1
pids=()
for target in "${targets[@]}"; do
    run_target "$target" &
    pids+=($!)
    while (($(jobs -rp | wc -l) >= jobs)); do
        sleep 0.2
    done
done
status=0
for pid in "${pids[@]}"; do
    wait "$pid" || status=1
done
exit "$status"
