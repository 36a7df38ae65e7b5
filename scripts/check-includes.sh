#!/usr/bin/env bash
# Fails when an include of src/, table/ or cli/ points against the order of the layers. Prints the
# offenders.
#
#    scripts/check-includes.sh [ROOT-FOLDER]
set -euo pipefail
cd "${1:-"$(dirname "$0")/.."}"
root=$(pwd -P)

# What each layer may include beside itself, the log line and the public headers: the folders of
# src/, and table/ and cli/ beside them.
declare -A allowed=(
    [base]=""
    [schema]="base"
    [util]="schema base"
    [sql]="schema base"
    [core]="schema base"
    [records]="sql core schema base"
    [table]="schema base"
    [cli]="table schema base"
)
# For all of src/; the second handle logs nothing.
log_line=src/core/LogLine.h

offenders=0
offend() {
    echo "$1:$2: $3"
    offenders=$((offenders + 1))
}

layer_of() {
    local path=${1#src/}
    echo "${path%%/*}"
}

check_include() {
    local file=$1 line=$2 name=$3 layer target target_layer
    layer=$(layer_of "$file")
    target=$(realpath -m "$root/$(dirname "$file")/$name")
    if [[ ! -f $target ]]; then
        offend "$file" "$line" "\"$name\" is no file beside it; public headers are <VornJsonDb...h>"
        return
    fi
    target=${target#"$root"/}
    target_layer=$(layer_of "$target")
    if [[ $target_layer == "$layer" || ($target == "$log_line" && $file == src/*) ]]; then
        return
    fi
    if [[ -z ${allowed[$target_layer]+known} ]]; then
        offend "$file" "$line" "\"$name\" lies in no layer"
    elif [[ " ${allowed[$layer]} " != *" $target_layer "* ]]; then
        offend "$file" "$line" "$layer must not include $target_layer (\"$name\")"
    fi
}

while IFS=: read -r file line text; do
    layer=$(layer_of "$file")
    if [[ -z ${allowed[$layer]+known} ]]; then
        offend "$file" "$line" "$layer is no known layer"
    elif [[ $text =~ \"([^\"]+)\" ]]; then
        check_include "$file" "$line" "${BASH_REMATCH[1]}"
    fi
done < <(find src table cli -type f \( -name '*.cpp' -o -name '*.h' \) -print0 | sort -z |
    xargs -0 grep -nH -E '^[[:space:]]*#[[:space:]]*include')

if ((offenders > 0)); then
    echo "$offenders include(s) against the order of the layers" >&2
    exit 1
fi
