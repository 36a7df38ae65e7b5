#!/usr/bin/env bash
# Tries the command on real files and databases: each goes in and comes back, compared by another reader.
#
#    scripts/real-files.sh [files|databases|commands]...
#
# They come from packages of Debian 12, whose versions the tests know. The packages are unpacked below
# build/real-files, a folder for each, and not installed: some would bring a whole language along.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh

packages=(
    # Tables as CSV, TSV, JSON and JSON Lines.
    iso-codes ieee-data python3-vega-datasets mstflint python3-statsmodels gdal-data
    node-csv-spectrum node-caniuse-db unicode-data tzdata pathspider
    # Databases.
    r-cran-rsqlite python3-xraydb birdfont-common libcangjie2-data codfis fail2ban brewtarget r-cran-sf
    python3-mapproxy
)

# fetch_packages unpacks those that are not there yet.
fetch_packages() {
    local package
    local -a missing=()
    for package in "${packages[@]}"; do
        if [[ ! -d $package ]]; then
            missing+=("$package")
        fi
    done
    if ((${#missing[@]} == 0)); then
        return
    fi
    echo "fetching ${missing[*]}"
    rm -rf new
    mkdir new
    # The package lists may be absent or outdated: then they are fetched, and it is tried again.
    if ! download "${missing[@]}" 2>/dev/null; then
        as_root apt-get update -qq
        download "${missing[@]}"
    fi
    for package in "${missing[@]}"; do
        dpkg-deb -x new/"$package"_*.deb "new/$package"
        mv "new/$package" "$package" # whole, or not there
    done
    rm -rf new
}

download() {
    (cd new && apt-get download -qq -o APT::Sandbox::User=root "$@")
}

tests=("$@")
if ((${#tests[@]} == 0)); then
    tests=(files databases commands)
fi
need_packages "${compiler_packages[@]}" "${library_packages[@]}" "${command_packages[@]}" \
    "${test_packages[@]}" dpkg:dpkg-deb python3:python3
configure "test" -DCMAKE_BUILD_TYPE=Release -DBUILD_TESTING=ON "${together[@]}" -DVORNJSONDB_COMMAND=ON
build_quietly "test" vornjsondb_command
mkdir -p build/real-files
(cd build/real-files && fetch_packages)

export VORNJSONDB=$PWD/build/test/cli/vornjsondb VORNJSONDB_REAL_FILES=$PWD/build/real-files
for name in "${tests[@]}"; do
    case $name in
        commands) bash tests/cli/real/commands.sh ;;
        *) python3 "tests/cli/real/$name.py" ;;
    esac
done
