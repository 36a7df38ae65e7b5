#!/usr/bin/env bash
# Compares the library's binary interface with what abi/ holds, for 64-bit x86 and 32-bit ARM: the
# exported names, and the types behind them down to the class layout. Fails on any change.
#
#    scripts/check-abi.sh [--update]
#
# --update writes what is there now to abi/.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/armhf-sysroot.sh

update=false
if [[ ${1:-} == --update ]]; then
    update=true
fi

need_packages "${compiler_packages[@]}" "${library_packages[@]}" abigail-tools:abidw \
    g++-arm-linux-gnueabihf
make_armhf_sysroot

# Without debug information a change of the class layout goes unseen.
options=(-DCMAKE_BUILD_TYPE=RelWithDebInfo -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=OFF
    -DVORNJSONDB_COMMAND=OFF)
configure abi-amd64 "${options[@]}"
configure abi-armhf "${options[@]}" -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchain-armhf.cmake" \
    -DVORNJSONDB_ARMHF_SYSROOT="$armhf_sysroot"

status=0
for architecture in amd64 armhf; do
    build_quietly "abi-$architecture" vornjsondb
    folder=build/abi-$architecture
    nm -D --defined-only "$folder/libvornjsondb.so" | sed 's/^[0-9a-f]* *//' | LC_ALL=C sort \
        >"$folder/exports.txt"
    # Nothing in it names the folder of a build.
    abidw --exported-interfaces-only --no-show-locs --no-comp-dir-path --no-corpus-path \
        "$folder/libvornjsondb.so" | sed "s|path='$PWD/|path='|" >"$folder/description.abi"
    if $update; then
        mkdir -p abi
        cp "$folder/exports.txt" "abi/exports-$architecture.txt"
        cp "$folder/description.abi" "abi/libvornjsondb-$architecture.abi"
        echo "$architecture: abi/ is up to date"
        continue
    fi
    changed=false
    diff -u "abi/exports-$architecture.txt" "$folder/exports.txt" || changed=true
    abidiff "abi/libvornjsondb-$architecture.abi" "$folder/description.abi" || changed=true
    if $changed; then
        status=1
        echo "$architecture: the binary interface differs from abi/" >&2
    else
        echo "$architecture: $(wc -l <"$folder/exports.txt") exported names, interface unchanged"
    fi
done
exit "$status"
