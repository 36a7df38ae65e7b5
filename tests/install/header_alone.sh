#!/usr/bin/env bash
# The public header compiles by itself, as C++11 and later, without a warning.
set -euo pipefail

read -ra json_flags <<<"$JSONCPP_CFLAGS"
unit=$WORK_DIR/header_alone.cpp
echo '#include <VornJsonDbApi.h>' >"$unit"

for standard in c++11 c++14 c++17 c++2a; do
    echo "as $standard"
    "$CXX" "-std=$standard" -Wall -Wextra -Wpedantic -Werror -fsyntax-only \
        "-I$SOURCE_DIR/include" "${json_flags[@]}" "$unit"
done
