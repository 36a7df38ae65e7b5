#!/usr/bin/env bash
# Measures everything and writes docs/performance.md: builds the benchmarks, runs them, and puts
# tables and plots into the report.
#
#    scripts/bench.sh [--full] [--report]
#
# --full also measures a million rows, which takes two minutes and 2 GB of memory more. --report
# measures nothing and writes the report from the results of the last run, in build/bench.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

largest='/1000000(/|$)'
measure=yes
for argument; do
    case $argument in
        --full) largest='^$' ;;
        --report) measure=no ;;
        *)
            echo "usage: scripts/bench.sh [--full] [--report]" >&2
            exit 2
            ;;
    esac
done

peer_packages=(libsqlitecpp-dev libsoci-dev libboost-dev libpoco-dev qtbase5-dev
    libqt5sql5-sqlite)
need_packages python3:python3 gnuplot-nox:gnuplot
results=build/bench

if [[ $measure == yes ]]; then
    need_packages "${compiler_packages[@]}" "${library_packages[@]}" libbenchmark-dev \
        "${peer_packages[@]}" "${command_packages[@]}" iso-codes sqlite3:sqlite3 \
        sqlite-utils:sqlite-utils
    configure bench -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=OFF \
        -DVORNJSONDB_TABLE=ON -DVORNJSONDB_COMMAND=ON -DVORNJSONDB_BENCHMARKS=ON
    build bench
    dpkg-query -W -f '${Package} ${Version}\n' "${library_packages[@]}" "${peer_packages[@]}" \
        libc6 >"$results/packages.txt"
    "${CXX:-g++}" --version | sed -n 1p >"$results/compiler.txt"

    # The report shows a missed goal; the measurement goes on.
    "$results/bench/vornjsondb_ratios" --json "$results/ratios.json" || true
    median=(--benchmark_report_aggregates_only=true --benchmark_out_format=json)
    "$results/bench/vornjsondb_peers" "${median[@]}" --benchmark_repetitions=15 \
        --benchmark_enable_random_interleaving=true --benchmark_out="$results/peers.json"
    "$results/bench/vornjsondb_scale" "${median[@]}" --benchmark_repetitions=7 \
        --benchmark_min_time=0.05 --benchmark_filter="-$largest" \
        --benchmark_out="$results/scale.json"
    python3 -B bench/command/command.py "$results/cli/vornjsondb" "$results/command.json"
    scripts/bench-size.sh | tee "$results/sizes.txt"
    scripts/bench-instructions.sh || true
    cp build/release/bench/instructions.txt "$results/instructions.txt"
fi

python3 -B bench/report/report.py "$results" docs
