# Sourced by the tests of what configuring refuses. $folder, which is made anew, holds a build folder for
# each configuration; $lacking has the options that make this machine one that lacks something.
# shellcheck shell=bash

# configure NAME [OPTION...]
configure() {
    local name=$1
    local -a options=("-DCMAKE_CXX_COMPILER=$CXX" -DBUILD_TESTING=OFF "${lacking[@]}")
    shift
    if [[ -n $TOOLCHAIN_FILE ]]; then
        options+=("-DCMAKE_TOOLCHAIN_FILE=$TOOLCHAIN_FILE")
    fi
    "$CMAKE" -S "$SOURCE_DIR" -B "$folder/$name" -G "$GENERATOR" "${options[@]}" "$@" >"$folder/$name.log" 2>&1
}

# refused MESSAGE: configuring fails, with this among what it says.
refused() {
    local said
    if configure with; then
        echo "configuring should have failed with: $1" >&2
        exit 1
    fi
    # CMake breaks lines where it likes.
    said=$(tr -s ' \n' ' ' <"$folder/with.log")
    if [[ $said != *"$1"* ]]; then
        cat "$folder/with.log" >&2
        exit 1
    fi
}

# builds_without TARGET NAME OPTION: with the option all is there but the target.
builds_without() {
    local targets
    configure "$2" "$3"
    targets=$("$CMAKE" --build "$folder/$2" --target help)
    grep -q -w vornjsondb <<<"$targets"
    if grep -w "$1" <<<"$targets"; then
        exit 1
    fi
}

rm -rf "${folder:?}"
mkdir -p "$folder"
