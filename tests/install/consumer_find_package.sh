#!/usr/bin/env bash
# A program finds the installed libraries by find_package(vornjsondb), links one of them, or
# both, and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

check_consumers find_package
