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

# check_consumers WAY: what programs print that are built by consume_by_WAY, with one library and with
# both in either order.
check_consumers() {
    local way=$1 here=$SOURCE_DIR/tests/install/consumer output expected source standard libraries
    while IFS='|' read -r expected source standard libraries <&3; do
        if [[ $libraries == *table* && -z $TABLE_LIBRARY ]]; then
            continue
        fi
        # shellcheck disable=SC2086  # a list
        output=$("consume_by_$way" "$here/$source.cpp" "$WORK_DIR/$way/$source" "$standard" $libraries)
        diff -u - <(echo "$output") <<<"$expected"
    done 3<<'END'
consumer: Jack's plane|old|11|vornjsondb
consumer: Jack's plane|table|17|table
new reads plane, old reads 100 %d|both|17|vornjsondb table
new reads plane, old reads 100 %d|both|17|table vornjsondb
END
}
