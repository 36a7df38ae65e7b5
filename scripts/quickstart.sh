#!/usr/bin/env bash
# From a bare machine to records in a database: installs what is missing, builds the library and runs
# examples/quickstart.cpp on the language and country codes of the package iso-codes. Arguments go to
# the example. The exit status is the example's.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" iso-codes
configure quickstart -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=ON \
    -DVORNJSONDB_COMMAND=ON
if ! output=$(build quickstart vornjsondb_quickstart 2>&1); then
    printf '%s\n' "$output" >&2
    exit 1
fi

exec build/quickstart/vornjsondb_quickstart "$@"
