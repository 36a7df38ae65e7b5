#!/usr/bin/env bash
# Fails when clang-tidy finds something in the libraries or the examples. File names given as arguments
# limit the look to these.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/source-files.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" clang-tidy:clang-tidy
configure tidy -DCMAKE_EXPORT_COMPILE_COMMANDS=ON -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=ON

files=("$@")
if ((${#files[@]} == 0)); then
    mapfile -d '' -t files < <(cxx_files src table examples | grep -z '\.cpp$')
fi
# The counts of warnings in system headers tell nothing.
printf '%s\0' "${files[@]}" | xargs -0 -n 1 -P "$jobs" clang-tidy --quiet -p build/tidy 2>&1 |
    { grep -v -E '^[0-9]+ warnings? generated\.$' || true; }
