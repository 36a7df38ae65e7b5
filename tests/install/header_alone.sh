#!/usr/bin/env bash
# The public header compiles by itself, as C++11 and later. A warning is an error where it is one in
# the build.
set -euo pipefail

read -ra json_flags <<<"$JSONCPP_CFLAGS"
werror=()
if [[ $WERROR == ON ]]; then
    werror=(-Werror)
fi
unit=$WORK_DIR/header_alone.cpp
echo '#include <VornJsonDbApi.h>' >"$unit"

for standard in c++11 c++14 c++17 c++2a; do
    echo "as $standard"
    "$CXX" "-std=$standard" -Wall -Wextra -Wpedantic "${werror[@]}" -fsyntax-only \
        "-I$SOURCE_DIR/include" "${json_flags[@]}" "$unit"
done
