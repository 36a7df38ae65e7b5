#!/usr/bin/env bash
# Where SQLite is older than the second handle needs, configuring says so, and which option leaves it
# out; with that option all the rest is there.
set -euo pipefail

folder=$WORK_DIR/old_sqlite
lacking=("-DSQLite3_INCLUDE_DIR=$folder/include")
# shellcheck source=tests/install/configure.sh
source "$(dirname "$0")/configure.sh"
mkdir "$folder/include"
echo '#define SQLITE_VERSION "3.34.1"' >"$folder/include/sqlite3.h"

refused "vornjsondb-table needs SQLite 3.35 or later, and 3.34.1 was found. -DVORNJSONDB_TABLE=OFF builds libvornjsondb alone."
builds_without vornjsondb_table without -DVORNJSONDB_TABLE=OFF
