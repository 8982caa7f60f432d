# shellcheck shell=bash
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
#
# Roots of other systems, which mmdebstrap makes. Needs common.sh.
readonly roots=${XDG_CACHE_HOME:-${HOME-}/.cache}/marlo-settings-system

# Sets "source" to the start of a line of apt's sources, up to the mirror's address, and
# "source_options" to options of mmdebstrap, so that a root uses the mirror, proxy and keys of this
# machine's apt.
find_mirror() {
    # shellcheck disable=SC2016 # apt-get replaces these names
    local format='$(ORIGIN)|$(LABEL)|$(REPO_URI)|$(SOURCESENTRY)' targets file entry stanza key option
    targets=$(apt-get indextargets --format "$format" 'Created-By: Packages' | grep '^Debian|Debian|' || true)
    if [[ -z $targets ]]; then
        as_root apt-get update -q
        targets=$(apt-get indextargets --format "$format" 'Created-By: Packages' | grep '^Debian|Debian|') \
            || die "the sources of this machine's apt include no mirror of Debian"
    fi
    IFS='|' read -r _ _ source file <<<"${targets%%$'\n'*}"
    entry=${file##*:} file=${file%:*}
    source_options=()
    if [[ $file == *.sources ]]; then
        stanza=$(awk -v entry="$entry" 'BEGIN { RS = "" } NR == entry' "$file" | grep -v '^#')
        key=$(sed -nE 's/^Signed-By: *//Ip' <<<"$stanza")
    else
        key=$(sed -nE "$entry"'s/^[^#]*\[.*signed-by=([^] ]*).*/\1/ip' "$file")
    fi
    if [[ $key == /* ]]; then
        source="[signed-by=$key] $source"
        source_options+=("--setup-hook=mkdir -p \"\$1${key%/*}\"" "--setup-hook=copy-in $key ${key%/*}")
    fi
    source="deb $source"
    while read -r option; do
        source_options+=("--aptopt=$option")
    done < <(apt-config dump | grep -E '^Acquire::(https?::(.*::)?Proxy|Check-)' || true)
}

# Architectures that this machine runs through qemu. Their roots contain the libraries of the
# architecture, but the programs of this machine, including the cross-compiler.
is_emulated() { # is_emulated ARCH
    [[ $1 == @(arm64|armhf) && $1 != "$(dpkg --print-architecture)" ]]
}

make_root() { # make_root DIRECTORY SUITE [OPTION...]: options of mmdebstrap
    local root=$1 suite=$2 source source_options
    install_missing mmdebstrap
    find_mirror
    echo "dev: making $root"
    mkdir -p "${root%/*}"
    as_root rm -rf --one-file-system -- "$root"
    as_root mmdebstrap --quiet --variant=apt --dpkgopt=force-unsafe-io "${source_options[@]}" "${@:3}" \
        "$suite" "$root" "$source $suite main"
}

# Makes the root of a system when it is first needed.
root_for() { # root_for SUITE ARCH
    local root=$roots/$1-$2 list=$2 include=ca-certificates,mount
    [[ ! -e $root/made ]] || return 0
    if is_emulated "$2"; then
        install_missing qemu-user-static binfmt-support
        list=$(dpkg --print-architecture),$2
        include+=,build-essential
    fi
    make_root "$root" "$1" --architectures="$list" --include="$include"
    as_root touch "$root/made"
}

# Copies this tree to src in a root, where build trees stay.
copy_tree() { # copy_tree ROOT
    local root=$1
    # Only files with new content get a new time there, whatever their time is here. The build there
    # therefore sees every change and nothing else.
    as_root rm -rf --one-file-system -- "$root/new"
    as_root mkdir -p "$root/src" "$root/new"
    source_files | tar --create --null --files-from=- \
        | as_root tar --extract --touch --no-same-owner --directory="$root/new"
    # shellcheck disable=SC2016 # expanded by the inner shell
    (cd "$root/new" && as_root find . -type f -exec bash -c '
        for file; do
            ! cmp --silent "$file" "../src/$file" || touch --reference="../src/$file" "$file"
        done' bash {} +)
    as_root find "$root/src" -mindepth 1 -maxdepth 1 ! -name 'build*' -exec rm -rf {} +
    as_root find "$root/new" -mindepth 1 -maxdepth 1 -exec mv -t "$root/src" {} +
}

# Runs ./dev with the arguments in a root, on a copy of this tree.
in_root() { # in_root NAME [ARG...]
    local root=$roots/$1
    shift
    copy_tree "$root"
    # shellcheck disable=SC2016 # expanded by the inner shell
    as_root unshare --mount --pid --fork --kill-child bash -euc '
        mount --bind "$1" "$1"
        mount -t proc proc "$1/proc"
        mount --rbind /sys "$1/sys"
        mount --rbind /dev "$1/dev"
        cp -L /etc/resolv.conf "$1/etc/resolv.conf"
        cd "$1"
        shift
        # chroot alone is not enough: the kernel allows no user namespaces in it.
        pivot_root . mnt
        exec env -i HOME=/root PATH=/usr/sbin:/usr/bin:/sbin:/bin LANG=C.UTF-8 \
            bash -euc "umount --lazy /mnt; exec /src/dev \"\$@\"" bash "$@"' bash "$root" "$@"
}
