#!/usr/bin/env bash
# The static library defines names in its two namespaces only, so that it clashes with nothing in a
# program. What the compiler makes of templates and inline functions is left out: it is weak, and any
# number of programs' objects may have it.
set -euo pipefail

names=$("$NM" -C --defined-only --extern-only "$TABLE_LIBRARY" 2>/dev/null |
    sed -n -E 's/^[0-9a-f]+ ([A-Z]) /\1 /p' | grep -v '^[VW] ')
grep -q '^T VORN_JSON_DB::Table::Open(' <<<"$names"
if grep -v -E '^[A-Z] (VORN_JSON_DB|vornjsondb)::' <<<"$names"; then
    echo "the names above are in none of the library's namespaces" >&2
    exit 1
fi
