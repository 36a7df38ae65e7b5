#!/usr/bin/env bash
# The shared library exports exactly the names in exports.txt, and its soname is the documented one.
set -euo pipefail

here=$(cd "$(dirname "$0")" && pwd)

# The letter before a name counts, too: the flags must stay weak. A constructor stands twice in the
# list, because the compiler emits it twice; so does the destructor.
"$NM" -DC --defined-only "$LIBRARY" | sed 's/^[0-9a-f]* *//' | LC_ALL=C sort \
    >"$WORK_DIR/exports.txt"
diff -u "$here/exports.txt" "$WORK_DIR/exports.txt"

dynamic=$(LC_ALL=C "$READELF" -d "$LIBRARY")
if [[ $dynamic != *"Library soname: [libvornjsondb.so.6]"* ]]; then
    printf 'the soname is not libvornjsondb.so.6:\n%s\n' "$dynamic" >&2
    exit 1
fi
