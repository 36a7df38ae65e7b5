# Sourced by the tests of the command. $VORNJSONDB is the built binary; each test has an empty
# folder of its own as working folder.
set -uo pipefail
unset NO_COLOR COLUMNS
export LC_ALL=C.UTF-8 TERM=xterm
folder=$(mktemp -d)
trap 'cd / && rm -rf "$folder"' EXIT
cd "$folder" || exit 1
failures=0

# expect EXIT OUTPUT ERRORS -- WORD...: runs the command and compares all three, exactly.
expect() {
    local exit_code=$1 output=$2 errors=$3
    shift 4
    "$VORNJSONDB" "$@" >out 2>err </dev/null
    local found=$?
    same "exit of: $*" "$found" "$exit_code"
    same "output of: $*" "$(cat out; echo .)" "$output${output:+$'\n'}."
    same "errors of: $*" "$(cat err; echo .)" "$errors${errors:+$'\n'}."
}

same() {
    if [[ $2 != "$3" ]]; then
        printf 'FAILED %s\n  found:    %s\n  expected: %s\n' "$1" "$2" "$3"
        failures=$((failures + 1))
    fi
}

# until_handles_interrupt PID: until the command is the process, no longer a copy of this shell, and answers
# Ctrl-C itself.
until_handles_interrupt() {
    until [[ $(</proc/"$1"/comm) == vornjsondb &&
        $(sed -n 's/^SigCgt:.*\(.\)$/\1/p' /proc/"$1"/status) == [2367abef] ]]; do
        sleep 0.01
    done
}

finish() {
    exit $((failures > 0))
}

# A table with a text that needs quotes, an empty text, NULLs, wide characters and a negative key.
make_shop() {
    "$VORNJSONDB" init shop.db product id:int name:string price:double tags:Json::Value on:bool \
        --key id --not-null name --default price=0.5 --quiet
    "$VORNJSONDB" upsert shop.db product id=1 'name=tea, "green"' price=5 'tags=["a","b"]' on=true \
        --quiet
    "$VORNJSONDB" upsert shop.db product '{"id": 2, "name": "", "price": 0.1}' --quiet
    "$VORNJSONDB" upsert shop.db product id=-3 name=漢字 tags:=null --quiet
}
