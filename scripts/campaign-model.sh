#!/usr/bin/env bash
# Model check: runs random sequences of all operations against the library and against a model of it.
#
#    scripts/campaign-model.sh [--long] [--seed N] [--count SEQUENCES]
#
# "sequence S" in the output runs alone with --seed S --count 1.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/campaign.sh

run_campaign model "$@"
