#!/usr/bin/env bash
# Fails when clang-tidy finds something in the libraries, the command or the examples. File names given as
# arguments limit the look to these.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" \
    clang-tidy:clang-tidy
configure tidy -DCMAKE_EXPORT_COMPILE_COMMANDS=ON -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=ON \
    "${together[@]}" -DVORNJSONDB_COMMAND=ON

# look CHECKS FILE...: the checks that are set in .clang-tidy, changed by these. The counts of warnings in
# system headers tell nothing.
look() {
    local checks=$1
    shift
    printf '%s\0' "$@" | xargs -0 -n 1 -P "$jobs" clang-tidy --quiet "--checks=$checks" -p build/tidy 2>&1 |
        { grep -v -E '^[0-9]+ warnings? generated\.$' || true; }
}

# All of them take a tenth of the time when 24 are read at once, as files that include them.
files=("$@")
checks=""
of_libraries=()
of_command=()
if ((${#files[@]} == 0)); then
    mapfile -t files < <(sed -n 's/^ *"file": "\(.*\)",\{0,1\}$/\1/p' build/tidy/compile_commands.json)
    checks=-bugprone-suspicious-include
fi
# The command has one thread, and so may ask for the environment and the names of errors.
for file in "${files[@]}"; do
    if [[ ${file#"$PWD/"} =~ ^(build/tidy/)?cli/ ]]; then
        of_command+=("$file")
    else
        of_libraries+=("$file")
    fi
done
if ((${#of_libraries[@]} > 0)); then
    look "$checks" "${of_libraries[@]}"
fi
if ((${#of_command[@]} > 0)); then
    look "$checks,-concurrency-mt-unsafe" "${of_command[@]}"
fi
