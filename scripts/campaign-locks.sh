#!/usr/bin/env bash
# Locks: locks that are let go of at a known attempt, signals during the wait, a caller's own busy
# handler; then eight processes on one file.
#
#    scripts/campaign-locks.sh [--long] [--seed N] [--count SECONDS]
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/campaign.sh

run_campaign locks "$@"
