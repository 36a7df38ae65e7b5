#!/usr/bin/env bash
# The first C++ sample of the README builds against the installed library and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

sample=$WORK_DIR/readme_sample.cpp
awk '/^```cpp$/ { inside = 1; next } inside && /^```$/ { exit } inside' "$SOURCE_DIR/README.md" >"$sample"
if ! grep -q 'int main' "$sample"; then
    echo "README.md has no complete program in its first cpp block" >&2
    exit 1
fi

# The sample may leave a database file behind.
mkdir -p "$WORK_DIR/readme_run"
cd "$WORK_DIR/readme_run"
find . -mindepth 1 -delete
consume_by_find_package "$sample" "$WORK_DIR/readme_build"
