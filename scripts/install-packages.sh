# Sourced by the other scripts: installs the Debian packages that are missing, and says nothing about
# those that are there.
# shellcheck shell=bash

as_root() {
    if [[ $(id -u) -eq 0 ]]; then
        "$@"
    else
        sudo "$@"
    fi
}

# need_packages PACKAGE[:COMMAND]... A package counts as there when it is installed, or when the
# command that it is wanted for is.
need_packages() {
    local wanted package command
    local -a missing=()
    for wanted in "$@"; do
        package=${wanted%%:*}
        command=${wanted#"$package"}
        command=${command#:}
        if [[ -n $command ]] && command -v "$command" >/dev/null; then
            continue
        fi
        if [[ $(dpkg-query -W -f '${db:Status-Status}' "$package" 2>/dev/null) == installed ]]; then
            continue
        fi
        missing+=("$package")
    done
    if ((${#missing[@]} == 0)); then
        return 0
    fi
    if ! command -v apt-get >/dev/null; then
        echo "please install what these Debian packages hold: ${missing[*]}" >&2
        return 1
    fi

    echo "installing ${missing[*]}" >&2
    local -a install=(env DEBIAN_FRONTEND=noninteractive apt-get install -qq -y
        --no-install-recommends "${missing[@]}")
    # The package lists may be absent or outdated: then they are fetched, and it is tried again.
    if ! as_root "${install[@]}" >/dev/null 2>&1; then
        as_root apt-get update -qq
        as_root "${install[@]}" >/dev/null
    fi
}
