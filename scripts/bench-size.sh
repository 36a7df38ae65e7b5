#!/usr/bin/env bash
# Prints sizes in bytes for amd64 and 32-bit ARM, -O2 and -Os: of the stripped library, and ("-table")
# of what a small program pulls in from the static one, by its sections: a file grows by whole pages.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/armhf-sysroot.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" \
    g++-arm-linux-gnueabihf:arm-linux-gnueabihf-g++ pkg-config:pkg-config
make_armhf_sysroot

# stripped STRIP FILE prints how many bytes the stripped file has.
stripped() {
    "$1" --strip-all -o "$2.stripped" "$2"
    stat -c %s "$2.stripped"
}

# loaded SIZE FILE prints how many bytes of the file's sections a program has in memory.
loaded() {
    command "$1" "$2" | awk 'NR == 2 { print $4 }'
}

# size NAME PREFIX [CMAKE-OPTION...] with the tools of that prefix.
size() {
    local name=$1 prefix=$2 folder=build/$1 with without
    shift 2
    configure "$name" -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=OFF -DVORNJSONDB_TABLE=ON \
        -DVORNJSONDB_COMMAND=OFF -DVORNJSONDB_BENCHMARKS=ON "$@"
    build "$name" vornjsondb vornjsondb_small vornjsondb_small_without >/dev/null
    with=$(loaded "${prefix}size" "$folder/bench/vornjsondb_small")
    without=$(loaded "${prefix}size" "$folder/bench/vornjsondb_small_without")
    printf '%-16s %s\n' "${name#size-}" "$(stripped "${prefix}strip" "$folder/libvornjsondb.so")"
    printf '%-16s %s\n' "${name#size-}-table" $((with - without))
}

size size-amd64-O2 "" -DCMAKE_BUILD_TYPE=Release
size size-amd64-Os "" -DCMAKE_BUILD_TYPE=MinSizeRel
export PKG_CONFIG_LIBDIR=$armhf_sysroot/usr/lib/arm-linux-gnueabihf/pkgconfig
cross=(-DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchain-armhf.cmake"
    -DVORNJSONDB_ARMHF_SYSROOT="$armhf_sysroot")
size size-armhf-O2 arm-linux-gnueabihf- -DCMAKE_BUILD_TYPE=Release "${cross[@]}"
size size-armhf-Os arm-linux-gnueabihf- -DCMAKE_BUILD_TYPE=MinSizeRel "${cross[@]}"
