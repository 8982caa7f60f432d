# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
#
# bash completion for marlo-definitions

_marlo_definitions() {
    local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]} command='' word
    for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
        case $word in
        check | list | show)
            command=$word
            break
            ;;
        esac
    done

    local words=''
    case $previous in
    --format) words='text json' ;;
    --root)
        mapfile -t COMPREPLY < <(compgen -d -- "$current")
        return
        ;;
    *)
        case $command:$current in
        check:-*) words='--format --no-catalogs --root --strict' ;;
        show:-*) words='--locale' ;;
        list:*) words='--catalogs' ;;
        :-*) words='--help --version' ;;
        :*) words='check list show' ;;
        *)
            # Definition files, and the directories that may contain them.
            local file
            COMPREPLY=()
            while IFS= read -r file; do
                if [[ -d $file || ${file,,} == *.conf || ${file,,} == *.json ]]; then
                    COMPREPLY+=("$file")
                fi
            done < <(compgen -f -- "$current")
            return
            ;;
        esac
        ;;
    esac
    mapfile -t COMPREPLY < <(compgen -W "$words" -- "$current")
}

complete -o filenames -F _marlo_definitions marlo-definitions
