# Sourced by the tests of the installed tree: builds one C++ source against it, either way, and runs
# the program. Each function takes the source, a fresh folder, the language standard's number and
# the libraries: vornjsondb, table or both.
# shellcheck shell=bash

run_consumer() {
    local -a runner=()
    read -ra runner <<<"$EMULATOR"
    "${runner[@]}" "$1" | tee "$1.out"
}

consume_by_find_package() {
    local source=$1 folder=$2 standard=$3
    shift 3
    local -a options=("-DCMAKE_PREFIX_PATH=$STAGE" "-DCMAKE_CXX_COMPILER=$CXX"
        "-DCMAKE_CXX_FLAGS=$CXXFLAGS" "-DCMAKE_BUILD_TYPE=$CONFIG" "-DCONSUMER_SOURCE=$source"
        "-DCONSUMER_STANDARD=$standard" "-DCONSUMER_LIBRARIES=$(IFS=';' && echo "$*")")
    if [[ -n $TOOLCHAIN_FILE ]]; then
        options+=("-DCMAKE_TOOLCHAIN_FILE=$TOOLCHAIN_FILE" "-DCMAKE_FIND_ROOT_PATH=$STAGE")
    fi
    rm -rf "$folder"
    "$CMAKE" -S "$SOURCE_DIR/tests/install/consumer" -B "$folder" -G "$GENERATOR" "${options[@]}" >/dev/null
    "$CMAKE" --build "$folder" --config "$CONFIG" >/dev/null
    run_consumer "$(find "$folder" -type f -name consumer)"
}

consume_by_pkg_config() {
    local source=$1 folder=$2 standard=$3 pc library_dir
    local -a cxxflags=() flags=()
    shift 3
    # The packages are vornjsondb and vornjsondb-table.
    set -- "${@/#table/vornjsondb-table}"
    pc=$(find "$STAGE" -name vornjsondb.pc)
    library_dir=$(dirname "$(find "$STAGE" -name libvornjsondb.so)")
    read -ra cxxflags <<<"$CXXFLAGS"
    read -ra flags <<<"$(PKG_CONFIG_PATH=$(dirname "$pc") "$PKG_CONFIG" --cflags --libs "$@")"
    rm -rf "$folder"
    mkdir -p "$folder"
    "$CXX" "-std=c++$standard" "${cxxflags[@]}" -o "$folder/consumer" "$source" "${flags[@]}" \
        "-Wl,-rpath,$library_dir"
    run_consumer "$folder/consumer"
}
