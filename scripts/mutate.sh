#!/usr/bin/env bash
# Changes one operator, constant, character of a text, condition or statement of src/ at a time, and
# runs the tests against each changed library: a change that no test notices is a survivor. Nothing
# in src/ is touched.
#
#    scripts/mutate.sh [--count N] [--seconds N] [--seed N] [--only TEXT] [--lines]
#
# Without an option 12 changes are tried, for 90 seconds at most. --only keeps the files whose name
# holds TEXT; --lines lists all possible changes and tries none. Survivors that cannot be told apart
# from the original stand in tests/mutants/equivalent.txt, each with its reason; any other fails.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}" python3:python3
configure mutate -DCMAKE_BUILD_TYPE=Debug -DBUILD_TESTING=ON -DVORNJSONDB_EXAMPLES=OFF \
    -DCMAKE_EXE_LINKER_FLAGS=-Wl,--enable-new-dtags
build_quietly mutate vornjsondb_tests

exec python3 scripts/mutate.py --folder build/mutate --jobs "$jobs" "$@"
