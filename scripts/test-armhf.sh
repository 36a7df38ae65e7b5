#!/usr/bin/env bash
# Cross-builds the library and its tests for 32-bit ARM and runs the tests in the emulator.
#
#    scripts/test-armhf.sh [CTEST-OPTION...]
#
# What is given goes to ctest. Each test program is one test of it, so that a single one is named
# another way: GTEST_FILTER='Runner*' scripts/test-armhf.sh -R vornjsondb_tests
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/armhf-sysroot.sh

need_packages g++-arm-linux-gnueabihf qemu-user:qemu-arm cmake:cmake \
    pkg-config:pkg-config iso-codes
make_armhf_sysroot
export PKG_CONFIG_LIBDIR=$armhf_sysroot/usr/lib/arm-linux-gnueabihf/pkgconfig
configure armhf -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=ON "${together[@]}" \
    -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchain-armhf.cmake" \
    -DVORNJSONDB_ARMHF_SYSROOT="$armhf_sysroot" -DVORNJSONDB_COMMAND=OFF \
    -DVORNJSONDB_TESTS_BY_PROGRAM=ON -DVORNJSONDB_CAMPAIGN_SCALE=150
build armhf

# Emulated, each of these tests would take minutes, and the second handle's campaigns ten.
export VORNJSONDB_QUERY_ROUNDS=10 VORNJSONDB_TEXT_STEP=20
cd build/armhf
ctest --output-on-failure --parallel "$jobs" --exclude-regex '^campaign_table' "$@"
