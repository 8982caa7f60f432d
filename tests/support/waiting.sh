# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
# shellcheck shell=bash
#
# Functions for tests in bash.

fail() {
    echo "${0##*/}: $*" >&2
    exit 1
}

wait_until() { # wait_until WHAT COMMAND...: fails with WHAT after a minute
    local what=$1 tries
    shift
    for ((tries = 0; tries < 1200; ++tries)); do
        ! "$@" || return 0
        sleep 0.05
    done
    fail "$what"
}
