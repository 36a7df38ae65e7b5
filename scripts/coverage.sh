#!/usr/bin/env bash
# Runs the tests with gcc's coverage counters and prints the line and branch coverage of src/ and
# table/.
#
#    scripts/coverage.sh [--fail-under LINES BRANCHES] [GCOVR-OPTION...]
#
# --fail-under fails below these percentages of the lines and of the branches of either folder. What
# else is given goes to gcovr for src/, --html-details
# build/coverage/index.html for example.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

options=()
if [[ ${1:-} == --fail-under ]]; then
    options=(--fail-under-line "$2" --fail-under-branch "$3")
    shift 3
fi

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}" gcovr:gcovr
configure coverage -DCMAKE_BUILD_TYPE=Debug -DBUILD_TESTING=ON -DVORNJSONDB_COVERAGE=ON \
    -DVORNJSONDB_EXAMPLES=OFF "${together[@]}" -DVORNJSONDB_COMMAND=OFF
# Counters of an earlier build do not fit, those of an earlier run would add up.
find build/coverage -name '*.gcda' -delete
programs=(vornjsondb_tests table/vornjsondb_table_tests)
build coverage "${programs[@]##*/}"
# Side by side: each counts in objects of its own.
printf '%s\0' "${programs[@]/#/build/coverage/tests/}" | xargs -0 -n 1 -P "$jobs" sh -c '"$0" --gtest_brief=1'

# Counted is what the tests reach by themselves: in the shared library with every name visible, and of
# table/ in the static one and in its tests, which bring some of its inline functions.
shared=(build/coverage/tests/CMakeFiles/vornjsondb_testable.dir)
table=(build/coverage/table/CMakeFiles/vornjsondb_table.dir
    build/coverage/tests/table/CMakeFiles/vornjsondb_table_tests.dir)

# Branches that only an exception takes are not counted. First the branches file by file, then the
# lines with the figures of both.
# Left out as well are branches on lines that decide nothing: the compiler's own around the making of
# a function-local static and around a catch clause that does not apply, and the ways of an exception
# out of a call that gcov does not mark as such.
own_branches=('^ *static ' '^VORN_JSON_MEMORY' '^ *} catch' '^ *(\*|.*\()?new ' '^ *}\)?;?$' '.*= default;$'
    '^ *const LineFormat Format\(' '^ *std::printf\(' '^ *syslog\(' '^ *Name\.pBegin = It'
    '^ *return FindMember\(' '^ *return SqlText\(')
report=(gcovr --root . --exclude-throw-branches
    --exclude-branches-by-pattern "$(IFS='|' && echo "${own_branches[*]}")")
"${report[@]}" --filter table/ --branches "${table[@]}"
"${report[@]}" --filter table/ --print-summary "${options[@]}" "${table[@]}"
"${report[@]}" --filter src/ --branches "${shared[@]}"
"${report[@]}" --filter src/ --print-summary "${options[@]}" "$@" "${shared[@]}"
