#!/usr/bin/env bash
# A program gets its flags for the installed library from pkg-config, links it and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

[[ $(consume_by_pkg_config "$here/consumer/main.cpp" "$WORK_DIR/pkg_config") == "consumer: Jack's plane" ]]
