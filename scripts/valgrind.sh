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
configure valgrind -DCMAKE_BUILD_TYPE=Debug -DBUILD_TESTING=ON -DVORNJSONDB_EXAMPLES=OFF \
    "${together[@]}" -DVORNJSONDB_COMMAND=OFF
build valgrind vornjsondb_tests

# All tests in one process, because the start of valgrind costs more than most tests. What a forked
# child leaks is its parent's, so that it keeps silent; a new process of the tests is looked at, too.
# The tests have an operator new of their own, which must stay in its place.
tests=$PWD/build/valgrind/tests/vornjsondb_tests
VORNJSONDB_TEST_PROGRAM=$tests valgrind --quiet --error-exitcode=99 --leak-check=full \
    --errors-for-leak-kinds=definite,indirect --trace-children=yes \
    --child-silent-after-fork=yes --soname-synonyms=somalloc=nouserintercepts \
    "$tests" --gtest_brief=1 "$@"
