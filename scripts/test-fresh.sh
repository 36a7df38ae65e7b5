#!/usr/bin/env bash
# Do README's two commands hold on a bare machine? Makes a minimal Debian, clones the last commit into
# it, runs both commands, as an ordinary user with sudo and as root, each user in a copy of the system
# that nobody has used before, and prints how long they took.
#
#    scripts/test-fresh.sh [bookworm|trixie] [--root-only] [--if-possible]
#
# Without a release both are tried. --root-only leaves the ordinary user out. --if-possible says why and
# ends well where such a system cannot be made: without debootstrap, without root's rights, without an
# archive in reach. What a run can use again lies in build/fresh: the minimal systems and the packages
# that were fetched.
set -euo pipefail
cd "$(dirname "$0")/.."
source scripts/install-packages.sh
source scripts/build.sh
source scripts/debian-archive.sh
export PATH=$PATH:/usr/sbin:/sbin

releases=(bookworm trixie)
users=(user root)
if_possible=no
for argument; do
    case $argument in
        bookworm | trixie) releases=("$argument") ;;
        --root-only) users=(root) ;;
        --if-possible) if_possible=yes ;;
        *)
            echo "usage: scripts/test-fresh.sh [bookworm|trixie] [--root-only] [--if-possible]" >&2
            exit 2
            ;;
    esac
done

fresh=$PWD/build/fresh
system=""

remove_system() {
    if [[ -n $system ]]; then
        if [[ -s $system.pid ]]; then
            as_root kill -KILL "$(cat "$system.pid")" || true
            wait
            rm -f "$system.pid"
        fi
        as_root rm -rf --one-file-system "$system"
        system=""
    fi
}

# in_system VERB RELEASE ARGUMENT: see scripts/fresh-system.sh.
in_system() {
    local status=0 variable
    local -a settings=()
    for variable in http_proxy https_proxy no_proxy; do
        if [[ -n ${!variable:-} ]]; then
            settings+=("$variable=${!variable}")
        fi
    done
    system=$(mktemp -d "$fresh/system.XXXXXX")
    chmod 755 "$system"
    # In the background, so that a signal is answered at once.
    as_root env "${settings[@]}" scripts/fresh-system.sh "$1" "$system" "${@:2}" &
    wait $! || status=$?
    rm -f "$system.pid"
    remove_system
    return "$status"
}

# write_sources RELEASE makes the system's list of sources: what the machine's archives have of it.
write_sources() {
    local release=$1 suite address
    for suite in "$release" "$release-updates" "$release-security"; do
        address=$archive
        if [[ $suite == *-security ]]; then
            address=$security_archive
        fi
        if [[ -n $address ]] && /usr/lib/apt/apt-helper download-file \
            "${address%/}/dists/$suite/InRelease" "$fresh/$suite.InRelease" >/dev/null 2>&1; then
            echo "deb $address $suite main"
        fi
    done >"$fresh/$release.list"
    grep -q " $release main$" "$fresh/$release.list"
}

make_base() {
    local release=$1
    if [[ -e $fresh/$release.tar ]]; then
        return 0
    fi
    echo "making a minimal system of $release"
    in_system make "$release" "$archive" >"$fresh/$release-base.log" 2>&1
}

# obstacle prints why no system can be made here, if so.
obstacle() {
    if ! command -v debootstrap >/dev/null; then
        echo "debootstrap is not installed"
    elif [[ ! -e $debian_keyring ]]; then
        echo "Debian's keys (debian-archive-keyring) are not installed"
    elif [[ $(id -u) -ne 0 ]] && ! sudo -n true 2>/dev/null; then
        echo "this is neither root nor a user of sudo without a password"
    elif ! as_root unshare --mount --pid --fork true 2>/dev/null; then
        echo "root may not mount anything here"
    fi
}

try_user() {
    local release=$1 user=$2 log=$fresh/$1-$2.log
    if ! in_system run "$release" "$user"; then
        tail -n 60 "$log"
        echo "$release failed, all of the output is in ${log#"$PWD/"}"
        return 1
    fi
    if [[ $werror == ON ]] && grep ' warning: ' "$log"; then
        echo "the compiler of $release warns, all of the output is in ${log#"$PWD/"}"
        return 1
    fi
}

# not_tried WHAT REASON
not_tried() {
    echo "$1 not tried: $2"
    if [[ $if_possible == no ]]; then
        exit 1
    fi
    exit 0
}

try_release() {
    local release=$1 user
    trap remove_system EXIT
    trap 'exit 1' TERM
    if ! write_sources "$release"; then
        not_tried "$release" "$archive is out of reach or does not have it"
    fi
    if ! make_base "$release"; then
        not_tried "$release" "no minimal system: $(tail -n 1 "$fresh/$release-base.log")"
    fi
    for user in "${users[@]}"; do
        try_user "$release" "$user"
    done
}

mkdir -p "$fresh"
if [[ $if_possible == no ]]; then
    need_packages debootstrap:debootstrap debian-archive-keyring
    as_root true
fi
reason=$(obstacle)
if [[ -n $reason ]]; then
    not_tried "fresh systems" "$reason"
fi
archive=$(debian_archive) || not_tried "fresh systems" "no Debian archive is known"
archive=${archive%% *}
security_archive=$(find_archive Debian-Security)
security_archive=${security_archive%% *}
rm -rf "$fresh/project"
git clone --quiet . "$fresh/project"

# Side by side, because each of them has stretches that keep one core busy or none.
tries=()
for release in "${releases[@]}"; do
    try_release "$release" &
    tries+=($!)
done
wait_all "${tries[@]}"
