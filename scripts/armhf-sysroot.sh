# Sourced: unpacks Debian's 32-bit ARM packages of what the library and its tests need into
# build/armhf-sysroot, without a word to the machine's own package system. The packages come from
# where this machine's come from, and their signatures are checked.
# shellcheck shell=bash

armhf_sysroot=$PWD/build/armhf-sysroot
armhf_packages=(libsqlite3-0 libsqlite3-dev libjsoncpp25 libjsoncpp-dev libgtest-dev libgmock-dev)

# Prints the first package source of this machine that is a Debian archive with the component main, as
# one line for the 32-bit ARM packages.
armhf_source_line() {
    local deb822=/etc/apt/sources.list.d/debian.sources
    if [[ -e $deb822 ]]; then
        awk -F': *' '
            /^#/ { next }
            $1 == "URIs" { split($0, words, ": *"); uri = $0; sub(/^URIs: */, "", uri) }
            $1 == "Suites" { suite = $2; sub(/ .*/, "", suite) }
            $1 == "Signed-By" { key = $2 }
            /^$/ { exit }
            END { printf "deb [arch=armhf signed-by=%s] %s %s main\n", key, uri, suite }' "$deb822"
    else
        awk '$1 == "deb" && / main( |$)/ {
            sub(/^deb +(\[[^]]*\] +)?/, "")
            print "deb [arch=armhf signed-by=/usr/share/keyrings/debian-archive-keyring.gpg] " $1 " " $2 " main"
            exit
        }' /etc/apt/sources.list
    fi
}

make_armhf_sysroot() {
    local work=$PWD/build/armhf-apt package
    if [[ -e $armhf_sysroot/complete ]]; then
        return 0
    fi
    rm -rf "$armhf_sysroot" "$work"
    mkdir -p "$armhf_sysroot" "$work/lists/partial" "$work/cache/archives/partial" "$work/packages"
    armhf_source_line >"$work/armhf.list"
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
