#!/usr/bin/env bash
# Fuzzes the library with libFuzzer under AddressSanitizer and UndefinedBehaviorSanitizer, after a
# replay of the corpora in fuzz/corpus, and prints what was tried.
#
#    scripts/fuzz.sh [--seconds N | --long | --replay] [--record] [TARGET...]
#
# Each target runs its share of 100 seconds, N seconds, with --long 10 minutes, or not at all beyond the
# replay.
# What a run finds new lies in build/fuzz/corpus/TARGET, an input that breaks a promise in
# build/fuzz/findings. --record puts the figures of each target's last run into docs/reliability.md.
# shellcheck disable=SC2317  # each calls the functions by their names
set -euo pipefail
export LC_ALL=C # [a-z] are the small letters alone
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

seconds=""
record=""
targets=()
while (($# > 0)); do
    case $1 in
        --seconds) seconds=$2 && shift ;;
        --long) seconds=600 ;;
        --replay) seconds=0 ;;
        --record) record=yes ;;
        *) targets+=("$1") ;;
    esac
    shift
done
# A target's file begins with a small letter, what the targets share with a capital one.
mapfile -t all_targets < <(cd fuzz && printf '%s\n' [a-z]*.cpp | sed 's/\.cpp$//')
seconds=${seconds:-$((100 / ${#all_targets[@]}))}
if ((${#targets[@]} == 0)); then
    targets=("${all_targets[@]}")
fi
for target in "${targets[@]}"; do
    if [[ ! " ${all_targets[*]} " == *" $target "* ]]; then
        sed -n '2,/^# shellcheck/{/^# shellcheck/!p}' "$0" >&2
        exit 2
    fi
done

need_packages clang-14:clang++-14 libclang-rt-14-dev "${library_packages[@]}" libcsv-dev \
    libutf8proc-dev rapidjson-dev

folder=build/fuzz
mkdir -p "$folder/objects" "$folder/findings" "$folder/figures"
compiler=(clang++-14)
if command -v ccache >/dev/null; then
    compiler=(ccache clang++-14)
fi
flags=(-std=c++17 -O1 -g -fno-omit-frame-pointer -fno-sanitize-recover=all -Iinclude -I/usr/include/jsoncpp)
# An empty stack of RapidJSON adds to a null pointer when it first grows.
flags+=(-fsanitize-ignorelist=fuzz/ignored.txt)
sanitizers=address,undefined

# each FUNCTION ARGUMENT... calls the function once for each argument, as many at a time as there are
# processors, and fails when one of the calls did. Every child is waited for by its number: asking
# for "the next one that ends" misses one that has already ended.
each() {
    local function=$1 argument status=0
    local -a running=()
    shift
    for argument; do
        if ((${#running[@]} == jobs)); then
            wait "${running[0]}" || status=1
            running=("${running[@]:1}")
        fi
        "$function" "$argument" &
        running+=($!)
    done
    for argument in "${running[@]}"; do
        wait "$argument" || status=1
    done
    return "$status"
}

object_of() {
    local name=${1//\//_}
    printf '%s/objects/%s.o' "$folder" "${name%.cpp}"
}

compile() {
    "${compiler[@]}" "${flags[@]}" "-fsanitize=fuzzer-no-link,$sanitizers" -c "$1" -o "$(object_of "$1")"
}

link_target() {
    local -a objects=()
    local source
    for source in "fuzz/$1.cpp" "${shared_sources[@]}"; do
        objects+=("$(object_of "$source")")
    done
    clang++-14 "-fsanitize=fuzzer,$sanitizers" -o "$folder/$1" "${objects[@]}" -ljsoncpp -lsqlite3 -lcsv -lutf8proc
}

# run_target TARGET runs one target and prints a line of figures, or what went wrong.
run_target() {
    local target=$1 log=$folder/$1.log grown=$folder/corpus/$1 found=0 TIMEFORMAT='%R %U %S'
    # Long inputs are replayed, but not grown. What takes longer is mutated less often.
    local -a options=("-timeout=20" "-rss_limit_mb=2048" "-artifact_prefix=$folder/findings/$1-")
    local -a growth=("-max_len=1024" "-entropic_scale_per_exec_time=1" "-max_total_time=$seconds")
    if [[ -e fuzz/dictionary/$target.dict ]]; then
        options+=("-dict=fuzz/dictionary/$target.dict")
    fi
    mkdir -p "$grown"
    "$folder/$target" "${options[@]}" -max_len=4096 -runs=0 "fuzz/corpus/$target" >"$log" 2>&1 || found=1
    : >"$log.time"
    if ((found == 0 && seconds > 0)); then
        {
            time "$folder/$target" "${options[@]}" "${growth[@]}" "$grown" "fuzz/corpus/$target" \
                >"$log" 2>&1 || found=1
        } 2>"$log.time"
    fi
    figures "$target" "$found" "$log" >"$folder/figures/$target"
    if ((found > 0)); then
        grep -aE 'broken promise|ERROR|runtime error|^    #[0-9] ' "$log" | head -n 30 || true
        printf '%-12s FAILED, see %s\n' "$target" "$log"
        return 1
    fi
    awk '
        $2 == 0 { printf "%-12s %9d runs  %5d edges\n", $1, $3, $6 }
        $2 != 0 { printf "%-12s %9d runs  %5d edges  %4d s, %d a second, %d a second of processor time\n",
            $1, $3, $6, $2, $4, $5 }' "$folder/figures/$target"
}

# figures TARGET FINDINGS LOG prints: target, seconds, runs, runs a second, runs a second of processor
# time, edges, findings, date.
figures() {
    awk -v target="$1" -v findings="$2" -v date="$(date +%F)" '
        FILENAME ~ /time$/ { seconds = $1; busy = $2 + $3; next }
        /^#[0-9]+\t/ { runs = substr($1, 2) }
        / cov: / { for (i = 1; i < NF; ++i) if ($i == "cov:") edges = $(i + 1) }
        function rate(time) { return time > 0 ? runs / time : 0 }
        END {
            printf "%s %d %d %d %d %d %d %s\n", target, seconds, runs, rate(seconds), rate(busy), edges, findings, date
        }
    ' "$3.time" "$3"
}

# A table of all figures, for the documentation: those of each target's last run.
report() {
    printf '| target | date | seconds | runs | a second | a second of processor time | edges | findings |\n'
    printf '|---|---|--:|--:|--:|--:|--:|--:|\n'
    (cd "$folder/figures" && cat "${all_targets[@]}") |
        awk '{ printf "| %s | %s | %d | %d | %d | %d | %d | %d |\n", $1, $8, $2, $3, $4, $5, $6, $7 }'
}

# The folders whose sources all targets share, and the command's readers, which know nothing of the command.
libraries=(src table)
mapfile -t shared_sources < <(find "${libraries[@]}" fuzz tests/support/JsonHelpers.cpp -name '*.cpp' ! -path 'fuzz/[a-z]*' | sort)
readers=(ByteSource GuessFormat Inference Interrupt JsonHandler JsonLinesReader JsonReader JsonText LineBuffer
    MemberNames Numbers Readers SeparatedReader Utf8)
readers=("${readers[@]/#/cli/input/}")
write_unified "$folder/unified" "${shared_sources[@]}" "${readers[@]/%/.cpp}"
shared_sources=("$folder"/unified/*.cpp)
sources=("${targets[@]/#/fuzz/}")
each compile "${shared_sources[@]}" "${sources[@]/%/.cpp}"
each link_target "${targets[@]}"

# Of each allocation only the caller is kept: through libraries without frame pointers the stacks
# never end the same way, and remembering them all takes more time than the library does. A finding
# that needs more is run again by hand, without these options.
export ASAN_OPTIONS=detect_leaks=1:malloc_context_size=1:quarantine_size_mb=16
export UBSAN_OPTIONS=print_stacktrace=1
# Not as a condition: inside one, a command that fails would go unnoticed.
set +e
(
    set -e
    each run_target "${targets[@]}"
)
status=$?
set -e
if [[ -n $record ]]; then
    need_packages python3:python3
    report | scripts/figures.py docs/reliability.md fuzzing
fi
exit "$status"
