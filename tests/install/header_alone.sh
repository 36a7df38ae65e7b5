#!/usr/bin/env bash
# Each public header compiles by itself, as its oldest language standard and later ones. A warning is
# an error where it is one in the build.
set -euo pipefail

read -ra json_flags <<<"$JSONCPP_CFLAGS"
werror=()
if [[ $WERROR == ON ]]; then
    werror=(-Werror)
fi

# compiles HEADER STANDARD...
compiles() {
    local header=$1 unit=$WORK_DIR/header_alone.cpp standard
    shift
    echo "#include <$header>" >"$unit"
    for standard; do
        echo "$header as $standard"
        "$CXX" "-std=$standard" -Wall -Wextra -Wpedantic "${werror[@]}" -fsyntax-only \
            "-I$SOURCE_DIR/include" "${json_flags[@]}" "$unit"
    done
}

compiles VornJsonDbApi.h c++11 c++14 c++17 c++2a
if [[ -n $TABLE_LIBRARY ]]; then
    compiles VornJsonDbTable.h c++17 c++2a
fi
