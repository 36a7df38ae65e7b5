#!/usr/bin/env bash
# Looks at the Release library as a loader does: are the protections there that the build asks for?
#
#    scripts/check-hardening.sh [LIBRARY...]
#
# Without an argument the library is built first.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

libraries=("$@")
if ((${#libraries[@]} == 0)); then
    need_packages binutils:readelf
    configure_release
    build_quietly release vornjsondb
    libraries=(build/release/libvornjsondb.so)
fi

status=0
# check NAME COMMAND... prints how the command ended.
check() {
    local name=$1
    shift
    if "$@" >/dev/null; then
        printf '%-28s yes\n' "$name"
    else
        printf '%-28s NO\n' "$name"
        status=1
    fi
}

absent() {
    ! "$@"
}

for library in "${libraries[@]}"; do
    echo "$library"
    headers=$(LC_ALL=C readelf -W --program-headers "$library")
    dynamic=$(LC_ALL=C readelf -W --dynamic "$library")
    imports=$(nm -D --undefined-only "$library")

    check "RELRO segment" grep -q 'GNU_RELRO' <<<"$headers"
    check "bound at load (BIND_NOW)" grep -qE 'BIND_NOW|FLAGS_1.*NOW' <<<"$dynamic"
    check "stack not executable" grep -qE 'GNU_STACK( +0x[0-9a-f]+){5} RW ' <<<"$headers"
    check "nothing writable and run" absent grep -qE 'LOAD.* RWE ' <<<"$headers"
    check "no text relocations" absent grep -q 'TEXTREL' <<<"$dynamic"
    check "no search path" absent grep -qE 'RPATH|RUNPATH' <<<"$dynamic"
    check "stack protector" grep -qE '__stack_chk_(fail|guard)' <<<"$imports"
    check "checked C library calls" grep -qE '__(syslog|printf|memcpy|strcpy|snprintf)_chk' <<<"$imports"
    # One of these left means that part of the sources was built without the checks.
    check "no unchecked counterpart" absent grep -qE ' (syslog|printf|vsyslog|sprintf|strcpy)(@|$)' <<<"$imports"
done
exit "$status"
