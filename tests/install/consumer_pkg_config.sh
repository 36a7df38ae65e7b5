#!/usr/bin/env bash
# A program gets its flags for the installed libraries from pkg-config, links one of them, or
# both, and runs.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)
# shellcheck source=tests/install/build-consumer.sh
source "$here/build-consumer.sh"

check_consumers pkg_config
