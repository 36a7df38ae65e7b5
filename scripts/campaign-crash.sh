#!/usr/bin/env bash
# Crash: kills a process in the midst of its operations again and again, and looks whether the file
# holds what was acknowledged.
#
#    scripts/campaign-crash.sh [--long] [--seed N] [--count KILLS]
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/campaign.sh

run_campaign crash "$@"
