#!/usr/bin/env bash
# Where a library of the command is missing, configuring names the package, and the option that leaves
# the command out; with that option, or without the second handle, all the rest is there.
set -euo pipefail

folder=$WORK_DIR/command_libraries
# Two of the four.
lacking=(-DCMAKE_DISABLE_FIND_PACKAGE_CLI11=ON -DVORNJSONDB_LIBCSV_LIBRARY=)
# shellcheck source=tests/install/configure.sh
source "$(dirname "$0")/configure.sh"

refused "The command vornjsondb needs what these Debian packages hold: libcli11-dev libcsv-dev. -DVORNJSONDB_COMMAND=OFF leaves the command out."
builds_without vornjsondb_command without_command -DVORNJSONDB_COMMAND=OFF
builds_without vornjsondb_command without_table -DVORNJSONDB_TABLE=OFF
