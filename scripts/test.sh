#!/usr/bin/env bash
# Builds libraries and command, and runs all their tests.
#
#    scripts/test.sh [--asan] [CTEST-OPTION...]
#    scripts/test.sh --tsan
#
# --asan builds with AddressSanitizer and UndefinedBehaviorSanitizer; each test program is then one
# test. What else is given goes to ctest: scripts/test.sh -R Runner. --tsan builds
# VORN_JSON_DB::Table alone with ThreadSanitizer, and runs the one test that has threads.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

name="test"
options=(-DCMAKE_BUILD_TYPE=Release)
if [[ ${1:-} == --asan ]]; then
    shift
    name=asan
    options=(-DCMAKE_BUILD_TYPE=Debug -DVORNJSONDB_SANITIZE=ON -DVORNJSONDB_TESTS_BY_PROGRAM=ON)
fi

if [[ ${1:-} == --tsan ]]; then
    need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}"
    configure tsan -DCMAKE_BUILD_TYPE=Debug -DCMAKE_CXX_FLAGS="-fsanitize=thread -O1" \
        -DBUILD_TESTING=ON -DVORNJSONDB_TABLE=ON "${together[@]}" -DVORNJSONDB_COMMAND=OFF
    build_quietly tsan vornjsondb_table_threads
    TSAN_OPTIONS=halt_on_error=1 build/tsan/tests/table/vornjsondb_table_threads
    exit
fi

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" \
    "${test_packages[@]}" "${command_test_packages[@]}"
configure "$name" "${options[@]}" -DBUILD_TESTING=ON "${together[@]}" -DVORNJSONDB_COMMAND=ON
build "$name"

export UBSAN_OPTIONS=print_stacktrace=1
cd "build/$name"
# One more than there are processors, because some tests mostly wait.
ctest --output-on-failure --parallel "$((jobs + 1))" "$@"
