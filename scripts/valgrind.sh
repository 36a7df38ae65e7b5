#!/usr/bin/env bash
# Runs the tests under valgrind's memcheck: invalid accesses, uninitialised values and
# leaks fail the run.
#
#    scripts/valgrind.sh [GTEST-OPTION...]
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}" valgrind:valgrind
configure_debug
build debug vornjsondb_tests

# A process for each core and not one for each test, because the start of valgrind costs more than most
# tests. What a forked child leaks is its parent's, so that it keeps silent; a new process of the tests
# is looked at, too. The tests have an operator new of their own, which must stay in its place.
tests=$PWD/build/debug/tests/vornjsondb_tests
export VORNJSONDB_TEST_PROGRAM=$tests GTEST_TOTAL_SHARDS=$jobs
shards=()
for ((shard = 0; shard < jobs; ++shard)); do
    GTEST_SHARD_INDEX=$shard valgrind --quiet --error-exitcode=99 --leak-check=full \
        --errors-for-leak-kinds=definite,indirect --trace-children=yes \
        --child-silent-after-fork=yes --soname-synonyms=somalloc=nouserintercepts \
        "$tests" --gtest_brief=1 "$@" &
    shards+=($!)
done
wait_all "${shards[@]}"
