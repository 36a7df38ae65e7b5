#!/usr/bin/env bash
# Fetches the Debian packages whose files the command is tried on, and unpacks them below
# build/real-files, a folder for each. They are not installed: some would bring a whole language along.
#
#    scripts/real-files.sh
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh

packages=(
    # Tables as CSV, TSV, JSON and JSON Lines.
    iso-codes ieee-data python3-vega-datasets mstflint python3-statsmodels gdal-data
    node-csv-spectrum node-caniuse-db unicode-data tzdata pathspider
    # Databases.
    r-cran-rsqlite python3-xraydb birdfont-common libcangjie2-data codfis fail2ban brewtarget r-cran-sf
    python3-mapproxy
)

need_packages dpkg:dpkg-deb python3:python3
mkdir -p build/real-files
cd build/real-files

missing=()
for package in "${packages[@]}"; do
    if [[ ! -d $package ]]; then
        missing+=("$package")
    fi
done
if ((${#missing[@]} == 0)); then
    exit
fi

echo "fetching ${missing[*]}" >&2
rm -rf new
mkdir new
fetch() {
    (cd new && apt-get download -qq -o APT::Sandbox::User=root "${missing[@]}")
}
# The package lists may be absent or outdated: then they are fetched, and it is tried again.
if ! fetch 2>/dev/null; then
    as_root apt-get update -qq
    fetch
fi
for package in "${missing[@]}"; do
    dpkg-deb -x new/"$package"_*.deb "new/$package"
    mv "new/$package" "$package" # whole, or not there
done
rm -rf new
