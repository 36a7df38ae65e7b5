#!/usr/bin/env bash
# Prints the size of the stripped library in bytes: for amd64 and 32-bit ARM, -O2 and -Os.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/armhf-sysroot.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" \
    g++-arm-linux-gnueabihf:arm-linux-gnueabihf-g++ pkg-config:pkg-config
make_armhf_sysroot

# size NAME STRIP [CMAKE-OPTION...]
size() {
    local name=$1 strip=$2 stripped=build/$1/stripped.so
    shift 2
    configure "$name" -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=OFF "$@"
    build "$name" vornjsondb >/dev/null
    "$strip" --strip-all -o "$stripped" "build/$name/libvornjsondb.so"
    printf '%-10s %s\n' "${name#size-}" "$(stat -c %s "$stripped")"
}

size size-amd64-O2 strip -DCMAKE_BUILD_TYPE=Release
size size-amd64-Os strip -DCMAKE_BUILD_TYPE=MinSizeRel
export PKG_CONFIG_LIBDIR=$armhf_sysroot/usr/lib/arm-linux-gnueabihf/pkgconfig
cross=(-DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchain-armhf.cmake"
    -DVORNJSONDB_ARMHF_SYSROOT="$armhf_sysroot")
size size-armhf-O2 arm-linux-gnueabihf-strip -DCMAKE_BUILD_TYPE=Release "${cross[@]}"
size size-armhf-Os arm-linux-gnueabihf-strip -DCMAKE_BUILD_TYPE=MinSizeRel "${cross[@]}"
