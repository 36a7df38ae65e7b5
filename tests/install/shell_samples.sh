#!/usr/bin/env bash
# Every shell sample of the pages prints what stands below it, in the page's next block, which is marked
# as text. The samples of a page are typed one after another, in an empty folder, on a terminal of 100
# columns, with the installed command.
set -euo pipefail

export PATH=$STAGE/bin:$PATH LC_ALL=C.UTF-8
# No colours, and no bar where the machine is slow.
export TERM=dumb

# extract PAGE FOLDER writes the lines of all samples to FOLDER/typed and what they print to
# FOLDER/expected, each sample under its line.
extract() {
    awk -v folder="$2" -v page="$1" '
        function mark(file, text) { print text >(folder "/" file) }
        /^```sh$/ && line { exit }
        /^```sh$/ { line = NR + 1; file = "typed"; mark("typed", "echo == line " line); mark("expected", "== line " line); next }
        /^```text$/ && line { file = "expected"; line = 0; next }
        /^```/ { file = ""; next }
        file { mark(file, $0) }
        END {
            if (line) {
                print page ":" line ": the sample is followed by no block of what it prints" >"/dev/stderr"
                exit 1
            }
        }
    ' "$SOURCE_DIR/$1"
}

# check PAGE
check() {
    local page=$1 folder=$WORK_DIR/shell_samples/${1%.md}
    rm -rf "$folder"
    mkdir -p "$folder/run"
    extract "$page" "$folder"
    echo "$page: $(grep -c '^== line' "$folder/expected") samples"
    (
        cd "$folder/run"
        script -qec 'stty cols 100; exec bash ../typed' /dev/null </dev/null | tr -d '\r' >../printed
    )
    diff -u "$folder/expected" "$folder/printed"
}

check README.md
check docs/command.md
