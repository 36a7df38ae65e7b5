# Sourced: where this machine's Debian packages come from. What else is fetched comes from there, too,
# and is checked with Debian's own keys.
# shellcheck shell=bash

# shellcheck disable=SC2034  # used by those who source this file
debian_keyring=/usr/share/keyrings/debian-archive-keyring.gpg

# find_archive LABEL prints address and release of the first of apt's sources that bears this label.
find_archive() {
    # shellcheck disable=SC2016  # apt puts them in
    apt-get indextargets --format '$(REPO_URI) $(CODENAME)' 'Created-By: Packages' \
        'Component: main' 'Origin: Debian' "Label: $1" |
        sed -n '/-updates$/!{p;q}'
}

# debian_archive prints address and release of the Debian archive that apt uses. The labels are in
# the package lists, which a machine may never have fetched.
debian_archive() {
    local found
    found=$(find_archive Debian)
    if [[ -z $found ]]; then
        as_root apt-get -qq update >&2
        found=$(find_archive Debian)
    fi
    if [[ -z $found ]]; then
        echo "apt has no Debian archive with the component main among its sources" >&2
        return 1
    fi
    echo "$found"
}
