# shellcheck shell=bash
# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
#
# What the programs in this directory share. They continue in the top directory of the sources.
set -euo pipefail
# shellcheck disable=SC2034 # used by the programs
readonly caller_directory=$PWD
cd "$(dirname "${BASH_SOURCE[0]}")/.."

die() {
    echo "dev: $*" >&2
    exit 1
}

as_root() {
    if (($(id -u) == 0)); then "$@"; else sudo -- "$@"; fi
}

# Prints the packages of a field in a paragraph of debian/control, except those that a build profile
# leaves out. Understands what that file uses: the first alternative, and profiles such as <!nocheck>.
listed() { # listed PARAGRAPH FIELD [PROFILE...]
    awk -v paragraph="$1" -v field="$2" -v profiles=" ${*:3} " '
        BEGIN { RS = ""; FS = "\n" }
        $1 != "Source: " paragraph && $1 != "Package: " paragraph { next }
        {
            gsub(/\n /, " ")
            for (line = 1; line <= NF; ++line) {
                if (index($line, field ":") != 1) continue
                count = split(substr($line, length(field) + 2), entries, ",")
                for (entry = 1; entry <= count; ++entry) {
                    words = split(entries[entry], word, " ")
                    omitted = words == 0 || entries[entry] ~ /\$\{/ # filled in by dpkg
                    for (i = 2; i <= words; ++i)
                        if (word[i] ~ /^<!.*>$/ && index(profiles, " " substr(word[i], 3, length(word[i]) - 3) " "))
                            omitted = 1
                    sub(/:.*/, "", word[1])
                    if (!omitted && word[1] != "debhelper-compat") print word[1]
                }
            }
        }' debian/control
}

# Prints the packages for a purpose, which debian/control lists:
#   build   to build everything but the reference; g++ need not be listed there
#   docs    to build the reference
#   run     to build and run the gallery
#   card    to use a real memory card, which takes root
#   test    to build and run the tests
packages_for() { # packages_for PURPOSE...
    local purpose
    for purpose in "$@"; do
        case $purpose in
        build) echo g++ && listed marlo-settings-system Build-Depends nocheck nodoc ;;
        docs) packages_for build && listed marlo-settings-system Build-Depends nocheck ;;
        run) packages_for build && listed marlo-settings-system-gallery Depends ;;
        card) listed marlo-settings-system-gallery Suggests ;;
        test) packages_for run card && listed marlo-settings-system Build-Depends ;;
        *) die "no packages for $purpose" ;;
        esac
    done
}

install_for() { # install_for "PURPOSE..." [PACKAGE...]
    local purposes packages
    read -ra purposes <<<"$1"
    mapfile -t packages < <(packages_for "${purposes[@]}" | sort -u)
    install_missing "${packages[@]}" "${@:2}"
}

install_missing() { # install_missing PACKAGE...
    local package missing=()
    if ! command -v dpkg-query apt-get >/dev/null; then
        echo "dev: this system has no dpkg and apt-get; install what it calls these Debian packages: $*" >&2
        return 0
    fi
    for package in "$@"; do
        # Installed, or a package that provides the name is.
        [[ $(dpkg-query --show --showformat='${db:Status-Status}' "$package" 2>/dev/null) == installed ]] \
            || missing+=("$package")
    done
    ((${#missing[@]} > 0)) || return 0
    (($(id -u) == 0)) || command -v sudo >/dev/null \
        || die "missing packages, and no sudo to install them: ${missing[*]}"
    [[ -z ${MARLO_THROW_AWAY_ROOT-} ]] || die "install these outside of the sandbox: ${missing[*]}"
    echo "dev: installing ${missing[*]}"
    ( # A sandbox that uses this system's own root has the same lock.
        flock 9
        as_root apt-get update -q 9<&-
        as_root env DEBIAN_FRONTEND=noninteractive \
            apt-get install -q -y --no-install-recommends -o DPkg::Lock::Timeout=600 "${missing[@]}" 9<&-
    ) 9</var/lib
}

# Says what the throw-away root will be, or ends with the reason why there can be none. Asked before
# anything is installed or built.
check_sandbox() {
    simulator/sandbox --check || exit
    if [[ $(simulator/sandbox --mode) == *namespace ]]; then
        [[ $PWD/ != @(/mnt|/run)/* ]] || die "move the sources: the sandbox hides /mnt and /run"
    elif [[ -e /var/lib/marlo-sandbox ]]; then
        # What another run restores must not be what this one installs.
        simulator/sandbox -- true
    fi
}

# Lists all files of this tree that git does not ignore, including new ones. A copy of the tree has
# no repository: it contains only these files and build trees.
source_files() {
    if [[ ! -e .git ]]; then
        find . -path './build*' -prune -o \( -type f -o -type l \) -print0
        return
    fi
    git ls-files -z --cached --others --exclude-standard \
        | while IFS= read -r -d '' file; do [[ ! -e $file && ! -L $file ]] || printf '%s\0' "$file"; done
}

configure() { # configure PRESET
    cmake --preset "$1" >/dev/null || die "cmake --preset $1 failed"
}

build() { # build PRESET [OPTION...]: options of cmake --build
    configure "$1"
    cmake --build --preset "$1" "${@:2}"
}

in_sample_root() { # in_sample_root TREE [OPTION...] -- COMMAND...: the sandbox, which ends with this script
    local tree
    tree=$(realpath -- "$1")
    QT_PLUGIN_PATH='' QML2_IMPORT_PATH="$tree/qml" \
        QT_QUICK_CONTROLS_CONF="$PWD/gallery/qtquickcontrols2.conf" \
        setpriv --pdeathsig TERM simulator/sandbox --data "$tree/gallery/sample" "${@:2}"
}

# Sets "tree" to the build tree that contains what the targets name: that of --build, or build.
build_tree() { # build_tree TARGET... -- [--build DIR]
    local targets=()
    while [[ $1 != -- ]]; do
        targets+=("$1")
        shift
    done
    shift
    tree=build
    case ${1-} in
    --build)
        tree=${2:?--build needs a directory}
        [[ $tree == /* ]] || tree=$caller_directory/$tree
        [[ -e $tree/CMakeCache.txt ]] || die "$tree is not a build tree"
        cmake --build "$tree" --target "${targets[@]}"
        ;;
    '') build dev --target "${targets[@]}" ;;
    *) die "unknown option $1" ;;
    esac
}
