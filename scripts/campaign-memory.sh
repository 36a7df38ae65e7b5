#!/usr/bin/env bash
# Out of memory: runs each public operation with the Nth allocation failing, for rising N, under
# AddressSanitizer and LeakSanitizer.
#
#    scripts/campaign-memory.sh [--long] [--seed N] [--scale N]
#
# --long takes every N without the sanitizers, too. --scale N takes fewer.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/campaign.sh

options=()
for option in "$@"; do
    if [[ $option == --long ]]; then
        run_campaign memory "$@"
    else
        options+=("$option")
    fi
done
run_campaign memory --asan "${options[@]}"
