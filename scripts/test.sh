#!/usr/bin/env bash
# Builds the library and runs all its tests.
#
#    scripts/test.sh [--asan] [CTEST-OPTION...]
#    scripts/test.sh --tsan
#
# --asan builds with AddressSanitizer and UndefinedBehaviorSanitizer. What else is given goes to
# ctest: scripts/test.sh -R Runner. --tsan builds VORN_JSON_DB::Table alone with ThreadSanitizer, and
# runs the one test that has threads.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

name="test"
options=(-DCMAKE_BUILD_TYPE=Release)
if [[ ${1:-} == --asan ]]; then
    shift
    name=asan
    options=(-DCMAKE_BUILD_TYPE=Debug -DVORNJSONDB_SANITIZE=ON)
fi

if [[ ${1:-} == --tsan ]]; then
    need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}"
    configure tsan -DCMAKE_BUILD_TYPE=Debug -DCMAKE_CXX_FLAGS="-fsanitize=thread -O1" \
        -DBUILD_TESTING=ON "${together[@]}"
    build_quietly tsan vornjsondb_table_threads
    TSAN_OPTIONS=halt_on_error=1 build/tsan/tests/table/vornjsondb_table_threads
    exit
fi

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}"
configure "$name" "${options[@]}" "${together[@]}" -DBUILD_TESTING=ON
build "$name"

export UBSAN_OPTIONS=print_stacktrace=1
cd "build/$name"
ctest --output-on-failure --parallel "$jobs" "$@"
