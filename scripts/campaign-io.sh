#!/usr/bin/env bash
# I/O faults: runs the operations that reach the files with the Nth read, write, sync, lock and so on
# failing, for rising N, with rollback journals and with a write-ahead log.
#
#    scripts/campaign-io.sh [--long] [--seed N] [--scale N]
#
# --long takes every N, and a wide table, too. --scale N takes fewer.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/campaign.sh

run_campaign io "$@"
