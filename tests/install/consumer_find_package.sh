#!/usr/bin/env bash
# A program finds the installed library by find_package(vornjsondb), links it and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

[[ $(consume_by_find_package "$here/consumer/main.cpp" "$WORK_DIR/find_package") == "consumer: Jack's plane" ]]
