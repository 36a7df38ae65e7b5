#!/usr/bin/env bash
# Looks for faults without running inputs: clang's static analyzer over the libraries and the command,
# cppcheck over the older library, and the tests against the checked form of the standard library.
# Fails on any finding; what is left out, and why, stands in docs/reliability.md.
#
#    scripts/static-analysis.sh [clang|cppcheck|debug]...
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/debian-archive.sh

steps=("$@")
if ((${#steps[@]} == 0)); then
    steps=(clang cppcheck debug)
fi
need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}" \
    clang-14:clang++-14 cppcheck:cppcheck

mkdir -p build/analysis
flags=(-std=c++17 -Iinclude -I/usr/include/jsoncpp '-DVORNJSONDB_VERSION="0"')

# Calls into templates of the standard library are not followed: that takes half of the time, and what is
# found there is not ours.
run_clang() {
    local -a sources
    mapfile -t sources < <(find src table cli -name '*.cpp' | sort)
    write_unified build/analysis/unified "${sources[@]}"
    printf '%s\0' build/analysis/unified/* | xargs -0 -n 1 -P "$jobs" clang++-14 --analyze \
        --analyzer-output text "${flags[@]}" -Werror -Xclang -analyzer-werror \
        -Xclang -analyzer-config -Xclang aggressive-binary-operation-simplification=true \
        -Xclang -analyzer-config -Xclang c++-stdlib-inlining=false \
        -Xclang -analyzer-checker=core,cplusplus,deadcode,nullability,security,unix,optin.cplusplus,optin.portability
}

run_cppcheck() {
    # The documented signature takes the statement by value; the second takes an argument of the log
    # line for a statement; a buffer's bytes are written before they are read.
    cppcheck --quiet --std=c++17 --language=c++ --enable=warning,performance,portability \
        --inline-suppr --suppress=missingIncludeSystem \
        --suppress=passedByValue:src/core/VornJsonDbApiRunner.cpp \
        --suppress=constStatement:src/core/VornJsonDbApiRows.cpp \
        --suppress=uninitMemberVar:src/base/TextBuffer.h -D__GNUC__=12 --error-exitcode=1 \
        -Iinclude -j "$jobs" src include
}

# The checked containers have another layout, so that JsonCpp and GoogleTest must be built with them,
# too: JsonCpp from Debian's source package, whose signature apt checks.
make_checked_libraries() {
    local prefix=$PWD/build/analysis-prefix work=$PWD/build/analysis-source flags=$1 archive
    if [[ -e $prefix/complete ]]; then
        return 0
    fi
    need_packages dpkg-dev:dpkg-source googletest
    rm -rf "$work" "$prefix"
    mkdir -p "$work/lists/partial" "$work/cache/archives/partial" "$prefix/lib"
    archive=$(debian_archive)
    echo "deb-src [signed-by=$debian_keyring] $archive main" >"$work/source.list"
    (
        cd "$work"
        printf '%s\n' 'APT::Sandbox::User "root";' "Dir::State::lists \"$work/lists\";" \
            "Dir::Cache \"$work/cache\";" "Dir::Etc::sourcelist \"$work/source.list\";" \
            'Dir::Etc::sourceparts "-";' >apt.conf
        export APT_CONFIG=$work/apt.conf
        apt-get -qq update
        apt-get -qq source libjsoncpp >apt.log 2>&1
        cd libjsoncpp-*/
        g++ -std=c++17 -g -fPIC "$flags" -Iinclude -shared -Wl,-soname,libjsoncpp.so \
            -o "$prefix/lib/libjsoncpp.so" src/lib_json/json_{reader,value,writer}.cpp
    )
    cmake -S /usr/src/googletest -B "$work/googletest" -DCMAKE_CXX_FLAGS="$flags" \
        -DCMAKE_INSTALL_PREFIX="$prefix" >/dev/null
    cmake --build "$work/googletest" --parallel "$jobs" --target install >/dev/null
    touch "$prefix/complete"
}

run_debug() {
    local prefix=$PWD/build/analysis-prefix flags=-D_GLIBCXX_DEBUG
    make_checked_libraries "$flags"
    configure analysis-debug -DCMAKE_BUILD_TYPE=Debug -DBUILD_TESTING=ON -DVORNJSONDB_EXAMPLES=OFF \
        "${together[@]}" -DVORNJSONDB_COMMAND=OFF \
        -DCMAKE_CXX_FLAGS="$flags" -DCMAKE_PREFIX_PATH="$prefix" \
        -DVORNJSONDB_JSONCPP_LIBRARY="$prefix/lib/libjsoncpp.so"
    build_quietly analysis-debug vornjsondb_tests
    build/analysis-debug/tests/vornjsondb_tests --gtest_brief=1
}

for step in "${steps[@]}"; do
    echo "== $step"
    case $step in
        clang) run_clang ;;
        cppcheck) run_cppcheck ;;
        debug) run_debug ;;
        *) echo "unknown step $step" >&2 && exit 2 ;;
    esac
done
