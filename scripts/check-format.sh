#!/usr/bin/env bash
# Fails when a C++ file is not laid out as .clang-format says; with --fix it lays them out.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/source-files.sh

need_packages clang-format:clang-format
mode=(--dry-run -Werror)
if [[ ${1:-} == --fix ]]; then
    mode=(-i)
fi
cxx_files . | xargs -0 -r clang-format "${mode[@]}"
