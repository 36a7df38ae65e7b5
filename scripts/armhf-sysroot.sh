# Sourced: unpacks Debian's 32-bit ARM packages of what the library and its tests need into
# build/armhf-sysroot, without a word to the machine's own package system. The packages come from
# where this machine's come from, and their signatures are checked.
# shellcheck shell=bash

source scripts/debian-archive.sh

armhf_sysroot=$PWD/build/armhf-sysroot
armhf_packages=(libsqlite3-0 libsqlite3-dev libjsoncpp25 libjsoncpp-dev libgtest-dev libgmock-dev)

make_armhf_sysroot() {
    local work=$PWD/build/armhf-apt archive package
    if [[ -e $armhf_sysroot/complete ]]; then
        return 0
    fi
    rm -rf "$armhf_sysroot" "$work"
    mkdir -p "$armhf_sysroot" "$work/lists/partial" "$work/cache/archives/partial" "$work/packages"
    archive=$(debian_archive)
    echo "deb [arch=armhf signed-by=$debian_keyring] $archive main" >"$work/armhf.list"
    cat >"$work/apt.conf" <<CONF
APT::Architecture "amd64";
APT::Architectures { "amd64"; "armhf"; };
APT::Sandbox::User "root";
Dir::State::lists "$work/lists";
Dir::Cache "$work/cache";
Dir::Etc::sourcelist "$work/armhf.list";
Dir::Etc::sourceparts "-";
CONF
    (
        export APT_CONFIG=$work/apt.conf
        apt-get -qq update
        cd "$work/packages"
        apt-get -qq download "${armhf_packages[@]/%/:armhf}"
    )
    for package in "$work"/packages/*.deb; do
        dpkg-deb -x "$package" "$armhf_sysroot"
    done
    # What pkg-config tells must name the sysroot, not the machine's own folders.
    sed -i "s|^prefix=/usr|prefix=$armhf_sysroot/usr|" \
        "$armhf_sysroot"/usr/lib/arm-linux-gnueabihf/pkgconfig/*.pc
    touch "$armhf_sysroot/complete"
}
