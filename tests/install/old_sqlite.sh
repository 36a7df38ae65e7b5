#!/usr/bin/env bash
# Where SQLite is older than the second handle needs, configuring says so, and which option leaves it
# out; with that option all the rest is there.
set -euo pipefail

folder=$WORK_DIR/old_sqlite
rm -rf "$folder"
mkdir -p "$folder/include"
echo '#define SQLITE_VERSION "3.34.1"' >"$folder/include/sqlite3.h"

# configure NAME [OPTION...]
configure() {
    local name=$1
    local -a options=("-DCMAKE_CXX_COMPILER=$CXX" "-DSQLite3_INCLUDE_DIR=$folder/include" -DBUILD_TESTING=OFF)
    shift
    if [[ -n $TOOLCHAIN_FILE ]]; then
        options+=("-DCMAKE_TOOLCHAIN_FILE=$TOOLCHAIN_FILE")
    fi
    "$CMAKE" -S "$SOURCE_DIR" -B "$folder/$name" -G "$GENERATOR" "${options[@]}" "$@" >"$folder/$name.log" 2>&1
}

if configure with; then
    echo "SQLite 3.34.1 was taken" >&2
    exit 1
fi
# CMake breaks lines where it likes.
said=$(tr -s ' \n' ' ' <"$folder/with.log")
if [[ $said != *"vornjsondb-table needs SQLite 3.35 or later, and 3.34.1 was found. -DVORNJSONDB_TABLE=OFF builds libvornjsondb alone."* ]]; then
    cat "$folder/with.log" >&2
    exit 1
fi

configure without -DVORNJSONDB_TABLE=OFF
targets=$("$CMAKE" --build "$folder/without" --target help)
grep -q -w vornjsondb <<<"$targets"
if grep -w vornjsondb_table <<<"$targets"; then
    exit 1
fi
