#!/usr/bin/env bash
# Installs the build into an empty folder, for this test and for those of its users, and looks at
# what lies there.
set -euo pipefail

rm -rf "$STAGE"
"$CMAKE" --install "$BUILD_DIR" --config "$CONFIG" --prefix "$STAGE" >/dev/null

# lib may be lib64 or lib/<triplet>, by the system's custom.
(cd "$STAGE" && find . -mindepth 1 ! -type d) | sed -E 's|^\./lib[^/]*(/[^/]*-linux-[^/]*)?/|lib/|; s|^\./||' |
    LC_ALL=C sort >"$WORK_DIR/installed.txt"

expected="include/VornJsonDbApi.h
lib/cmake/vornjsondb/VornJsonDbJsonCpp.cmake
lib/cmake/vornjsondb/vornjsondbConfig.cmake
lib/cmake/vornjsondb/vornjsondbConfigVersion.cmake
lib/cmake/vornjsondb/vornjsondbTargets-${CONFIG,,}.cmake
lib/cmake/vornjsondb/vornjsondbTargets.cmake
lib/libvornjsondb.so
lib/libvornjsondb.so.6
lib/libvornjsondb.so.6.0.0
lib/pkgconfig/vornjsondb.pc"
if [[ -n $TABLE_LIBRARY ]]; then
    expected+="
include/VornJsonDbTable.h
lib/libvornjsondb-table.a
lib/pkgconfig/vornjsondb-table.pc"
fi
if [[ -n $COMMAND ]]; then
    expected+="
bin/vornjsondb
share/bash-completion/completions/vornjsondb
share/fish/vendor_completions.d/vornjsondb.fish
share/man/man1/vornjsondb.1
share/zsh/site-functions/_vornjsondb"
fi
diff -u <(LC_ALL=C sort <<<"$expected") "$WORK_DIR/installed.txt"

# The pages are those of this command, and it runs from where it lies now.
if [[ -n $COMMAND ]]; then
    for page in man:man/man1/vornjsondb.1 bash:bash-completion/completions/vornjsondb \
        zsh:zsh/site-functions/_vornjsondb fish:fish/vendor_completions.d/vornjsondb.fish; do
        diff -u <("$STAGE/bin/vornjsondb" completion "${page%%:*}") "$STAGE/share/${page#*:}"
    done
fi

# A tree that names the folder it was built in breaks when it is moved. Debug information and
# instrumented code may name sources.
if grep -rlF --include='*.cmake' --include='*.pc' -e "$BUILD_DIR" -e "$SOURCE_DIR" -e "$STAGE" "$STAGE"; then
    echo "the files above name a folder of the build" >&2
    exit 1
fi
