#!/usr/bin/env bash
# Runs one campaign: a program that makes one kind of thing go wrong again and again.
#
#    scripts/campaign.sh memory|io|crash|locks|model [--long] [--record] [--seed N] [OPTION...]
#
# memory  each allocation of each operation fails in turn, under AddressSanitizer and LeakSanitizer;
#         --long also without them, every allocation. --scale N takes fewer.
# io      calls of the file system fail, are cut short or interrupted. --scale N takes fewer.
# crash   a writing process is killed. --count KILLS
# locks   locks at a known attempt, signals, a caller's busy handler, eight processes on one file.
#         --count SECONDS
# model   random sequences of all operations beside a model of the library. --count SEQUENCES;
#         "sequence S" in the output runs alone with --seed S --count 1.
#
# All but model then run with the operations of VORN_JSON_DB::Table as well.
#
# --record puts the figures into docs/reliability.md.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

name=${1:-}
if [[ ! -e tests/campaigns/${name^}Campaign.cpp ]]; then
    sed -n '2,/^set/{/^#/p}' "$0" >&2
    exit 2
fi
shift
options=()
long=""
record=""
for option; do
    case $option in
        --record) record=yes ;;
        --long) long=yes && options+=(--long) ;;
        *) options+=("$option") ;;
    esac
done

# run FOLDER CMAKE-OPTION... builds the campaigns in one of the folders of scripts/test.sh, and runs them
# side by side. The command, which they do not need, stays part of the folder.
run() {
    local folder=$1 program status=0
    local -a campaigns=()
    configure "$@" -DBUILD_TESTING=ON "${together[@]}" -DVORNJSONDB_COMMAND=ON
    build_quietly "$folder" "${programs[@]/#/vornjsondb_campaign_}"
    for program in "${programs[@]}"; do
        UBSAN_OPTIONS=print_stacktrace=1 "build/$folder/tests/campaigns/vornjsondb_campaign_$program" \
            "${options[@]}" >"build/campaign-$program.txt" &
        campaigns+=($!)
    done
    wait_all "${campaigns[@]}" || status=1
    for program in "${programs[@]}"; do
        printf '== %s\n' "$program"
        cat "build/campaign-$program.txt"
    done
    return "$status"
}

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" "${test_packages[@]}"
programs=("$name")
if [[ $name != model ]]; then
    programs+=("table_$name")
fi
if [[ $name == memory ]]; then
    run asan -DCMAKE_BUILD_TYPE=Debug -DVORNJSONDB_SANITIZE=ON
fi
if [[ $name != memory || -n $long ]]; then
    run "test" -DCMAKE_BUILD_TYPE=Release
fi
if [[ -n $record ]]; then
    need_packages python3:python3
    for program in "${programs[@]}"; do
        {
            printf '```\n%s: %s\n' "$(date +%F)" "scripts/campaign.sh $name ${options[*]}"
            grep '^  ' "build/campaign-$program.txt"
            printf '```\n'
        } | scripts/figures.py docs/reliability.md "campaign-$program"
    done
fi
