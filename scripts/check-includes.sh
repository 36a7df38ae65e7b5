#!/usr/bin/env bash
# Fails when an include of src/ points against the order of the layers. Prints the offenders.
#
#    scripts/check-includes.sh [SRC-FOLDER]
set -euo pipefail
src=$(realpath "${1:-"$(dirname "$0")/../src"}")

# What each layer may include beside itself, the log line and the public header.
declare -A allowed=(
    [base]=""
    [schema]="base"
    [util]="schema base"
    [sql]="schema base"
    [core]="schema base"
    [records]="sql core schema base"
)
open_to_all=core/LogLine.h

offenders=0
offend() {
    echo "$1:$2: $3"
    offenders=$((offenders + 1))
}

check_include() {
    local file=$1 line=$2 name=$3 layer target target_layer
    layer=${file%%/*}
    target=$(realpath -m "$src/$(dirname "$file")/$name")
    if [[ ! -f $target ]]; then
        offend "$file" "$line" "\"$name\" is no file beside it; the public header is <VornJsonDbApi.h>"
        return
    fi
    if [[ $target != "$src"/* ]]; then
        offend "$file" "$line" "\"$name\" lies outside src"
        return
    fi
    target=${target#"$src"/}
    target_layer=${target%%/*}
    if [[ $target == "$open_to_all" || $target_layer == "$layer" ]]; then
        return
    fi
    if [[ " ${allowed[$layer]} " != *" $target_layer "* ]]; then
        offend "$file" "$line" "$layer must not include $target_layer (\"$name\")"
    fi
}

cd "$src"
while IFS=: read -r file line text; do
    if [[ -z ${allowed[${file%%/*}]+known} ]]; then
        offend "$file" "$line" "${file%%/*} is no known layer"
    elif [[ $text =~ \"([^\"]+)\" ]]; then
        check_include "$file" "$line" "${BASH_REMATCH[1]}"
    fi
done < <(find . -type f \( -name '*.cpp' -o -name '*.h' \) -printf '%P\0' | sort -z |
    xargs -0 grep -nH -E '^[[:space:]]*#[[:space:]]*include')

if ((offenders > 0)); then
    echo "$offenders include(s) against the order of the layers" >&2
    exit 1
fi
