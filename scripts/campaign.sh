# Sourced by scripts/campaign-*.sh.
# shellcheck shell=bash

source scripts/install-packages.sh
source scripts/build.sh

# run_campaign NAME [--asan] [OPTION...] builds one campaign and runs it with these options. The
# folders are those of scripts/test.sh.
run_campaign() {
    local name=$1 folder="test"
    local -a options=(-DCMAKE_BUILD_TYPE=Release)
    shift
    if [[ ${1:-} == --asan ]]; then
        shift
        folder=asan
        options=(-DCMAKE_BUILD_TYPE=Debug -DVORNJSONDB_SANITIZE=ON)
    fi
    need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${test_packages[@]}"
    configure "$folder" "${options[@]}" -DBUILD_TESTING=ON -DVORNJSONDB_WERROR=ON
    build "$folder" "vornjsondb_campaign_$name" >"build/$folder/campaign.log" 2>&1 ||
        { cat "build/$folder/campaign.log" >&2 && return 1; }
    UBSAN_OPTIONS=print_stacktrace=1 "build/$folder/tests/campaigns/vornjsondb_campaign_$name" "$@"
}
