# Sourced by the other scripts: how a build folder under build/ is made.
# shellcheck shell=bash

jobs=$(nproc)

# Warnings are errors where changes are checked, and only there: nobody else shall be stopped by a
# compiler that warns of more than ours.
werror=OFF
if [[ ${CI:-} == true ]]; then
    werror=ON
fi

# Most of a compiler's time goes into the same headers again and again: where no library is made to be
# kept, it is given 24 sources at once. What one of them lacks by itself is found by
# tests/install/sources_alone.sh. Of what helps to find a fault, reports name the lines alone.
# shellcheck disable=SC2034  # used by those who source this file
together=(-DCMAKE_UNITY_BUILD=ON -DCMAKE_UNITY_BUILD_BATCH_SIZE=24 -DCMAKE_CXX_FLAGS_DEBUG=-g1)

# write_unified FOLDER SOURCE...: the same where CMake is not asked, as files that include the sources of a
# folder, twelve at once. Clang analyses what a file includes as the file's own when it is called
# UnifiedSource.
write_unified() {
    local unified=$1 folder
    shift
    rm -rf "$unified"
    mkdir -p "$unified"
    printf '%s\n' "${@%/*}" | sort -u | while read -r folder; do
        printf '%s\n' "$@" | grep "^$folder/[^/]*$" | sed "s|.*|#include \"$PWD/&\"|" |
            split --lines 12 --additional-suffix .cpp - "$unified/UnifiedSource-${folder//\//-}-"
    done
}

# configure NAME [CMAKE-OPTION...] makes build/NAME. Ninja and ccache are used where they are at hand.
configure() {
    local folder=build/$1
    shift
    local -a options=(-DVORNJSONDB_WERROR="$werror")
    if [[ ! -e $folder/CMakeCache.txt ]] && command -v ninja >/dev/null; then
        options+=(-G Ninja)
    fi
    # Said each time, so that a folder outlives the ccache that it was made with.
    options+=(-DCMAKE_CXX_COMPILER_LAUNCHER="${CMAKE_CXX_COMPILER_LAUNCHER:-$(command -v ccache || true)}")
    mkdir -p "$folder"
    if ! cmake -S . -B "$folder" "${options[@]}" "$@" >"$folder/configure.log" 2>&1; then
        cat "$folder/configure.log" >&2
        return 1
    fi
}

# build NAME [TARGET...]
build() {
    local folder=build/$1
    shift
    local -a targets=()
    if (($# > 0)); then
        targets=(--target "$@")
    fi
    cmake --build "$folder" --parallel "$jobs" "${targets[@]}"
}

# build_quietly NAME [TARGET...] says something only when the build fails.
build_quietly() {
    if ! build "$@" >"build/$1/build.log" 2>&1; then
        cat "build/$1/build.log" >&2
        return 1
    fi
}

# wait_all PID... waits for programs that run side by side, and fails if one of them does. A signal ends
# them, too: what runs in the background does not hear of Ctrl-C.
wait_all() {
    local pid status=0
    # shellcheck disable=SC2064  # these, whoever runs by then
    trap "kill $* 2>/dev/null; wait; exit 1" INT TERM HUP
    for pid; do
        wait "$pid" || status=1
    done
    trap - INT TERM HUP
    return "$status"
}

# configure_release [CMAKE-OPTION...] makes build/release: all that is installed, as it is installed. It
# takes scripts/install-packages.sh, too.
configure_release() {
    need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}"
    configure release -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=ON \
        -DVORNJSONDB_COMMAND=ON "$@"
}

# configure_debug makes build/debug: the tests of both libraries, which look for them where
# LD_LIBRARY_PATH says before they look where they were built.
configure_debug() {
    configure debug -DCMAKE_BUILD_TYPE=Debug -DBUILD_TESTING=ON -DVORNJSONDB_EXAMPLES=OFF \
        -DVORNJSONDB_COMMAND=OFF "${together[@]}" -DCMAKE_EXE_LINKER_FLAGS=-Wl,--enable-new-dtags
}

# What the scripts need. Where the compiler is given with CXX, it counts in the place of g++.
# shellcheck disable=SC2034  # used by those who source this file
{
    compiler_packages=("g++:${CXX:-g++}" cmake:cmake)
    if ! command -v ninja >/dev/null; then
        compiler_packages+=(make:make)
    fi
    library_packages=(libsqlite3-dev libjsoncpp-dev)
    command_packages=(libcli11-dev libcsv-dev libutf8proc-dev rapidjson-dev)
    test_packages=(libgtest-dev libgmock-dev pkg-config:pkg-config iso-codes)
    # The shells read their completion scripts, mandoc the manual page.
    command_test_packages=(fish:fish mandoc:mandoc sqlite3:sqlite3 zsh:zsh)
}
