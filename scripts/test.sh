#!/usr/bin/env bash
# Builds the library and runs all its tests.
#
#    scripts/test.sh [--asan] [CTEST-OPTION...]
#
# --asan builds with AddressSanitizer and UndefinedBehaviorSanitizer. What else is given goes to
# ctest: scripts/test.sh -R Runner
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

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}"
configure "$name" "${options[@]}" -DBUILD_TESTING=ON
build "$name"

export UBSAN_OPTIONS=print_stacktrace=1
cd "build/$name"
ctest --output-on-failure --parallel "$jobs" "$@"
