#!/usr/bin/env bash
# Every C++ sample of the pages builds against the installed libraries, runs and prints what stands
# below it, in the page's next block, which is marked as text. A sample with a main is a program; the
# others are bodies of functions, to which samples.h gives what the page says that they go on from.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

# extract PAGE FOLDER writes each sample to FOLDER/LINE.code and its output to FOLDER/LINE.expected.
extract() {
    rm -rf "$2"
    mkdir -p "$2"
    awk -v folder="$2" '
        /^```cpp$/ { line = NR + 1; file = folder "/" line ".code"; next }
        /^```text$/ && line { file = folder "/" line ".expected"; printf "" >file; line = 0; next }
        /^```/ { file = ""; next }
        file { print >file }
    ' "$SOURCE_DIR/$1"
}

# run SOURCE FOLDER EXPECTED, in an empty folder: a sample may leave a database file behind.
run() {
    local source=$1 folder=$2 expected=$3
    mkdir -p "$folder"
    (
        mkdir "$folder/run"
        cd "$folder/run"
        consume_by_find_package "$source" "$folder/build" 17 vornjsondb table >"$folder/output"
    )
    diff -u "$expected" "$folder/output"
}

# check_fragments PAGE FOLDER LINE... makes one program of all of them.
check_fragments() {
    local page=$1 folder=$2 line
    shift 2
    {
        echo "#include \"$here/samples.h\""
        for line; do
            echo "static void Sample$line(sqlite3* pDb, Table& Devices) {"
            echo "#line $line \"$SOURCE_DIR/$page\""
            cat "$folder/$line.code"
            echo "}"
        done
        echo "int main() {"
        for line; do
            echo "    RunSample($line, Sample$line);"
        done
        echo "}"
    } >"$folder/fragments.cpp"
    for line; do
        echo "== line $line"
        cat "$folder/$line.expected"
    done >"$folder/fragments.expected"
    run "$folder/fragments.cpp" "$folder/fragments" "$folder/fragments.expected"
}

# check PAGE
check() {
    local page=$1 folder=$WORK_DIR/samples/${1%.md} code line
    local -a fragments=()
    extract "$page" "$folder"
    for code in $(find "$folder" -name '*.code' | LC_ALL=C sort -V); do
        line=$(basename "$code" .code)
        if [[ ! -e $folder/$line.expected ]]; then
            echo "$page:$line: the sample is followed by no block of what it prints" >&2
            exit 1
        elif grep -q 'int main' "$code"; then
            echo "$page:$line"
            cp "$code" "$folder/$line.cpp"
            run "$folder/$line.cpp" "$folder/$line" "$folder/$line.expected"
        else
            fragments+=("$line")
        fi
    done
    if ((${#fragments[@]} > 0)); then
        echo "$page:" "${fragments[@]}"
        check_fragments "$page" "$folder" "${fragments[@]}"
    fi
    [[ -n $(find "$folder" -name '*.code') ]]
}

check README.md
check docs/sharp-edges.md
check docs/table.md
