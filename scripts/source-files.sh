# Sourced by the checks.
# shellcheck shell=bash

# cxx_files FOLDER... prints the C++ files below these folders, each ended by a NUL: those that git
# does not ignore, or all outside a clone (in a source archive).
cxx_files() {
    if git rev-parse --is-inside-work-tree >/dev/null 2>&1; then
        # A file that is deleted but not yet committed is still listed.
        git ls-files -z --cached --others --exclude-standard -- "${@/%//*.cpp}" "${@/%//*.h}" |
            while IFS= read -r -d '' file; do
                if [[ -e $file ]]; then
                    printf '%s\0' "$file"
                fi
            done
    else
        find "$@" -path './build*' -prune -o \( -name '*.cpp' -o -name '*.h' \) -print0
    fi
}
