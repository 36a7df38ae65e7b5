#!/usr/bin/env bash
# One minimal system, for scripts/test-fresh.sh, which runs this as root. What is mounted and started
# here ends with this script, whatever ends it: it has mounts and processes of its own, and FOLDER.pid
# names the process to kill.
#
#    scripts/fresh-system.sh make FOLDER RELEASE ADDRESS
#    scripts/fresh-system.sh run FOLDER RELEASE USER
#
# make writes the system to build/fresh/RELEASE.tar, from the archive at ADDRESS. run takes a copy of it,
# puts the project in and runs README's two commands as USER, which is root or the name of an ordinary
# user to be. It prints their times; what they print goes to build/fresh/RELEASE-USER.log.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/debian-archive.sh

if [[ $1 != inside ]]; then
    echo $$ >"$2.pid"
    exec unshare --mount --pid --fork --kill-child scripts/fresh-system.sh inside "$@"
fi
shift

system=$2 release=$3
fresh=$PWD/build/fresh
packages=$fresh/$release-packages
trap 'exit 1' INT TERM
# Root's folder would be in the way of whoever clears build/.
trap 'chown -R --reference="$fresh" "$packages"' EXIT
mkdir -p "$packages"

# debootstrap does not read apt's settings.
use_proxy_of_apt() {
    local proxy=""
    eval "$(apt-config shell proxy Acquire::http::Proxy)"
    if [[ -n $proxy && $proxy != DIRECT ]]; then
        export http_proxy=${http_proxy:-$proxy}
    fi
}

make_system() {
    local address=$1 also=sudo
    if [[ $address == https:* ]]; then
        also+=,ca-certificates
    fi
    use_proxy_of_apt
    debootstrap --foreign --variant=minbase --include="$also" --force-check-gpg \
        --keyring="$debian_keyring" "$release" "$system" "$address"
    # Waiting for the disk after each file would be most of what an installation takes here, and no
    # system outlives its run.
    mkdir -p "$system/etc/dpkg/dpkg.cfg.d"
    echo force-unsafe-io >"$system/etc/dpkg/dpkg.cfg.d/no-waiting"
    chroot "$system" /debootstrap/debootstrap --second-stage
    # Nobody who comes to such a system finds package lists there.
    rm -rf "$system"/var/lib/apt/lists/* "$system"/var/cache/apt/archives/*.deb
    tar -C "$system" -cf "$fresh/$release.tar.part" .
    mv "$fresh/$release.tar.part" "$fresh/$release.tar"
}

# The machine's archives, as far as they have this release, and how it reaches them.
configure_apt() {
    local settings=$system/etc/apt/apt.conf.d/99machine variable
    cp "$fresh/$release.list" "$system/etc/apt/sources.list"
    apt-config dump --format '%f "%v";%n' Acquire |
        grep -iE '^Acquire::(https?::|Retries|Check-Valid-Until|Check-Date)' |
        grep -viE ':: "|Proxy-Auto-Detect' >"$settings" || true
    for variable in http_proxy https_proxy; do
        if [[ -n ${!variable:-} ]]; then
            echo "Acquire::${variable%_proxy}::Proxy \"${!variable}\";" >>"$settings"
        fi
    done
}

mount_kernel_folders() {
    mount -t proc proc "$system/proc"
    mount -t devpts -o newinstance,ptmxmode=0666,mode=0620,gid=5 devpts "$system/dev/pts"
    mount -t tmpfs tmpfs "$system/dev/shm"
    # A package that was fetched once is not fetched again; apt checks it all the same.
    mount --bind "$packages" "$system/var/cache/apt/archives"
}

prepare_system() {
    local user=$1 home
    rm -f "$system/etc/resolv.conf"
    cp -L /etc/resolv.conf "$system/etc/resolv.conf"
    echo "127.0.0.1 localhost $(hostname)" >"$system/etc/hosts"
    configure_apt
    if [[ $user == root ]]; then
        # Root must do without it.
        SUDO_FORCE_REMOVE=yes chroot "$system" dpkg --purge sudo >/dev/null
        home=$system/root
    else
        chroot "$system" useradd --create-home --shell /bin/bash "$user"
        echo "$user ALL=(ALL) NOPASSWD: ALL" >"$system/etc/sudoers.d/$user"
        home=$system/home/$user
    fi
    cp -r "$fresh/project" "$home/vornjsondb"
    chroot "$system" chown -R "$user:" "${home#"$system"}/vornjsondb"
    mount_kernel_folders
}

# try USER COMMAND runs it as after a login and tells how long it took.
try() {
    local user=$1 command=$2 start=$SECONDS status=0
    echo "== $command"
    chroot "$system" env -i PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin \
        su -l "$user" -c "cd vornjsondb && $command" </dev/null || status=$?
    printf '%-9s %-5s %4d s  %s\n' "$release" "$user" $((SECONDS - start)) "$command" >&3
    return "$status"
}

case $1 in
    make)
        make_system "$4"
        ;;
    run)
        exec 3>&1 >"$fresh/$release-$4.log" 2>&1
        tar -C "$system" -xf "$fresh/$release.tar"
        prepare_system "$4"
        try "$4" ./scripts/quickstart.sh
        try "$4" ./scripts/test.sh
        ;;
esac
