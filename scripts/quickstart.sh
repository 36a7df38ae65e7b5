#!/usr/bin/env bash
# From a bare machine to records in a database: installs what is missing, builds, and installs the command
# vornjsondb below build/vornjsondb. Then the command imports the languages of the package iso-codes,
# searches, corrects and exports them, which is compared with what went in; and examples/quickstart.cpp
# does the like from C++. Arguments go to the example. The exit status is that of the first that fails.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" \
    iso-codes jq:jq
configure quickstart -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=OFF -DVORNJSONDB_EXAMPLES=ON \
    -DVORNJSONDB_COMMAND=ON "${together[@]}"
echo "building, which takes about half a minute"
build_quietly quickstart vornjsondb vornjsondb_pages vornjsondb_quickstart
prefix=$PWD/build/vornjsondb
example=$PWD/build/quickstart/vornjsondb_quickstart
cmake --install build/quickstart --prefix "$prefix" --component runtime >/dev/null
export PATH=$prefix/bin:$PATH

# In an empty folder, which goes when this ends.
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT

# typed LINE prints the line and runs it.
typed() {
    printf '$ %s\n' "$1"
    eval "$1"
}

show_command() {
    local languages=/usr/share/iso-codes/json/iso_639-3.json
    cd "$folder"
    typed "vornjsondb insert languages.db language $languages --key alpha_3"
    typed "vornjsondb list languages.db language --where '{\"name\": {\"\$like\": \"%Greek%\"}}' --format table"
    typed "vornjsondb update languages.db language ell common_name=Greek"
    typed "vornjsondb list languages.db language --format jsonl > languages.jsonl"
    typed "diff <(jq -cS '.[\"639-3\"][]' $languages) <(jq -cS . languages.jsonl)" || true
    cmp <(jq -cS '.["639-3"][] | if .alpha_3 == "ell" then .common_name = "Greek" else . end' $languages) \
        <(jq -cS . languages.jsonl)
    echo "All $(wc -l <languages.jsonl) came back as they went in, but for the correction."
}

(show_command) 2>&1
printf '\nFrom C++, by examples/quickstart.cpp:\n'
"$example" "$@"
printf '\nThe command and its manual are in build/vornjsondb:\n'
# shellcheck disable=SC2016  # to be typed as it stands
printf '    export PATH=$PWD/build/vornjsondb/bin:$PATH\n    man vornjsondb\n'
