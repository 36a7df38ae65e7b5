#!/usr/bin/env bash
# Changes one thing in src/ at a time, and runs the tests against each changed library: a change that
# no test notices is a survivor, and fails the check. Nothing in src/ is touched.
#
#    scripts/mutate.sh [--table] [--count N | --all] [--seconds N] [--seed N] [--only TEXT]
#                      [--kind KIND] [--lines] [--record]
#
# Without an option 12 changes are tried, for 90 seconds at most. --table changes table/ instead, and
# runs its tests. --only keeps the files whose name holds TEXT; --kind keeps "structure" (statements,
# conditions and calls that are dropped, doubled, exchanged, hoisted or sunk), "text" (characters of texts) or
# "other" (operators, numbers, conditions). --lines lists the changes and tries none; --record puts the
# figures into docs/reliability.md.
#
# The seed, which decides what is drawn, comes from the commit if it is not given.
#
# A change that nobody can tell from the original is marked at its line, see scripts/mutants.py.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}" python3:python3
configure_debug
tests=vornjsondb_tests
for option; do
    if [[ $option == --table ]]; then
        tests=vornjsondb_table_tests
    fi
done
build_quietly debug "$tests" vornjsondb

seed=$(git rev-parse --short=7 HEAD 2>/dev/null || echo 1)
exec python3 scripts/mutate.py --folder build/debug --jobs "$jobs" --seed "$((16#$seed))" "$@"
