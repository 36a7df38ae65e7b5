#!/usr/bin/env bash
# Every source of the libraries compiles in any build system: with the include folder, the language
# level and JsonCpp's flags alone, from another directory, with no generated file.
set -euo pipefail

read -ra json_flags <<<"$JSONCPP_CFLAGS"
folders=("$SOURCE_DIR/src")
if [[ -n $TABLE_LIBRARY ]]; then
    folders+=("$SOURCE_DIR/table")
fi
mapfile -t sources < <(find "${folders[@]}" -name '*.cpp' | LC_ALL=C sort)
((${#sources[@]} > 0))

cd "$WORK_DIR"
printf '%s\n' "${sources[@]}"
printf '%s\0' "${sources[@]}" |
    xargs -0 -n 4 -P 2 "$CXX" -std=c++17 -fsyntax-only "-I$SOURCE_DIR/include" "${json_flags[@]}"
