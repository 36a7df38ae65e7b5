#!/usr/bin/env bash
# A program finds the installed libraries by find_package(vornjsondb), links one of them, or
# both, and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

# expect OUTPUT SOURCE STANDARD LIBRARY...
expect() {
    local output
    output=$(consume_by_find_package "$here/consumer/$2.cpp" "$WORK_DIR/find_package/$2" "${@:3}")
    diff -u - <(echo "$output") <<<"$1"
}

expect "consumer: Jack's plane" old 11 vornjsondb
if [[ -n $TABLE_LIBRARY ]]; then
    expect "consumer: Jack's plane" table 17 table
    expect "new reads plane, old reads 100 %d" both 17 vornjsondb table
    expect "new reads plane, old reads 100 %d" both 17 table vornjsondb
fi
