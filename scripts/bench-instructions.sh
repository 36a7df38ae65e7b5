#!/usr/bin/env bash
# Counts the instructions of fixed work and compares them with the budget.
#
#    scripts/bench-instructions.sh [--update REASON]
#
# Prints instructions per create, fetch, update, delete and listed cell on the table of eight
# members, split by the library in which they were executed: by the old handle, by the second one
# ("table-"; a loaded record, too), and by hand ("hand-", whose code counts as ours). Unlike a time,
# a count is the same in every run. The status is 1 when a total or our own part is more than 2% above
# bench/instruction-budget.txt, which holds for the versions of compiler and libraries that it
# names; --update writes a new budget, whose first line is the reason.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

pkg_version() {
    dpkg-query -W -f '${Version}' "$1" 2>/dev/null || echo unknown
}

budget=bench/instruction-budget.txt
reason=""
if [[ ${1:-} == --update ]]; then
    reason=${2:?"--update wants the reason for the new budget"}
fi

need_packages valgrind:valgrind
configure_release -DVORNJSONDB_BENCHMARKS=ON
build_quietly release vornjsondb_instructions
folder=build/release/bench

# count WORK prints: work, total, ours, JsonCpp's, SQLite's, rest; each divided by the units.
count() {
    local profile=$folder/callgrind.$1 units
    # The empty environment keeps the stack where it was in every other run.
    if ! units=$(cd "$folder" && env -i valgrind --tool=callgrind --callgrind-out-file="callgrind.$1" \
        '--toggle-collect=*MeasuredWork*' ./vornjsondb_instructions "$1" 2>"callgrind.$1.log"); then
        cat "$profile.log" >&2
        return 1
    fi
    callgrind_annotate --threshold=100 --show-percs=no "$profile" |
        awk -v work="$1" -v units="$units" '
            $1 ~ /^[0-9,]+$/ && !/PROGRAM TOTALS/ {
                gsub(",", "", $1)
                total += $1
                # The second handle is linked into the program.
                if (/\[[^]]*vornjsondb[^]]*\]$/) { ours += $1 }
                else if (/\[[^]]*libjsoncpp[^]]*\]$/) { jsoncpp += $1 }
                else if (/\[[^]]*libsqlite3[^]]*\]$/) { sqlite += $1 }
            }
            END {
                printf "%-12s %9.0f %9.0f %9.0f %9.0f %9.0f\n", work, total / units, ours / units,
                    jsoncpp / units, sqlite / units, (total - ours - jsoncpp - sqlite) / units
            }'
}

heading=$(printf '%-12s %9s %9s %9s %9s %9s' work total ours jsoncpp sqlite rest)
# The counts of other versions differ: they belong to these.
versions="g++ $("${CXX:-g++}" -dumpfullversion), SQLite $(pkg_version libsqlite3-0), JsonCpp $(
    pkg_version libjsoncpp-dev), C library $(pkg_version libc6)"

results=$folder/instructions.txt
works=({create,get,update,delete,list} table-{create,get,first,list,load,json} hand-{create,get,list,load})
# The work of each runs alone in a process: a process for each core.
export -f count
export folder
printf '%s\n' "${works[@]}" | xargs -P "$jobs" -I{} bash -c 'set -eo pipefail; count {} >"$folder/instructions.{}"'
(cd "$folder" && cat "${works[@]/#/instructions.}") >"$results"
echo "# $heading"
sed 's/^/  /' "$results"

if [[ -n $reason ]]; then
    {
        echo "# $reason"
        echo "# Instructions per call, in a list per cell; see scripts/bench-instructions.sh."
        echo "# $versions"
        echo "# $heading"
        cat "$results"
    } >"$budget"
    echo "wrote $budget"
    exit
fi

enforced=1
if ! grep -qxF "# $versions" "$budget"; then
    enforced=0
    echo "the budget was counted with: $(sed -n '3s/^# //p' "$budget")"
    echo "this count was made with:    $versions"
    echo "so the comparison is shown and not enforced"
fi
awk -v enforced="$enforced" '
    FNR == NR { if ($1 != "#") { total[$1] = $2; ours[$1] = $3 } next }
    function check(what, now, allowed) {
        if (now > allowed * 1.02) {
            printf "%s: %s rose from %d to %d\n", $1, what, allowed, now
            failed = 1
        }
    }
    !($1 in total) { printf "%s is not in the budget\n", $1; failed = 1; next }
    { check("the total", $2, total[$1]); check("our part", $3, ours[$1]) }
    END { if (!failed) { print "within the budget" } exit failed && enforced }
' "$budget" "$results"
