#!/usr/bin/env bash
# Where a library of the command is missing, configuring names the package, and the option that leaves
# the command out; with that option, or without the second handle, all the rest is there.
set -euo pipefail

folder=$WORK_DIR/command_libraries
rm -rf "$folder"
mkdir -p "$folder"

# configure NAME [OPTION...], as on a machine that lacks two of the four.
configure() {
    local name=$1
    local -a options=("-DCMAKE_CXX_COMPILER=$CXX" -DBUILD_TESTING=OFF
        -DCMAKE_DISABLE_FIND_PACKAGE_CLI11=ON -DVORNJSONDB_LIBCSV_LIBRARY=)
    shift
    if [[ -n $TOOLCHAIN_FILE ]]; then
        options+=("-DCMAKE_TOOLCHAIN_FILE=$TOOLCHAIN_FILE")
    fi
    "$CMAKE" -S "$SOURCE_DIR" -B "$folder/$name" -G "$GENERATOR" "${options[@]}" "$@" >"$folder/$name.log" 2>&1
}

if configure with; then
    echo "the command was to be built without its libraries" >&2
    exit 1
fi
# CMake breaks lines where it likes.
said=$(tr -s ' \n' ' ' <"$folder/with.log")
if [[ $said != *"The command vornjsondb needs what these Debian packages hold: libcli11-dev libcsv-dev. -DVORNJSONDB_COMMAND=OFF leaves the command out."* ]]; then
    cat "$folder/with.log" >&2
    exit 1
fi

for option in COMMAND TABLE; do
    configure "without_$option" "-DVORNJSONDB_$option=OFF"
    targets=$("$CMAKE" --build "$folder/without_$option" --target help)
    grep -q -w vornjsondb <<<"$targets"
    if grep -w vornjsondb_command <<<"$targets"; then
        exit 1
    fi
done
