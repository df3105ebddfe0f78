# Completion of korvex-logcheck in bash: options, engines, files, directories, users.
# shellcheck shell=bash

_korvex_logcheck() {
    local current=$2 option=$3 i ended=
    COMPREPLY=()
    for ((i = 1; i < COMP_CWORD; i++)); do
        [[ ${COMP_WORDS[i]} != -- ]] || ended=1
    done
    # An equals sign is a word of its own on the line.
    [[ $current != = ]] || current=
    [[ $option != = ]] || option=${COMP_WORDS[COMP_CWORD - 2]}
    [[ $2 != = ]] || option=${COMP_WORDS[COMP_CWORD - 1]}
    case $ended$option in
        --home)
            compopt -o filenames
            mapfile -t COMPREPLY < <(compgen -d -- "$current")
            return
            ;;
        --user)
            mapfile -t COMPREPLY < <(compgen -u -- "$current")
            return
            ;;
        --export)
            mapfile -t COMPREPLY < <(compgen -W 'list lnav rsyslog syslog-ng fluent-bit vector loki
                logstash pcre' -- "$current")
            return
            ;;
        --channel | --appender) return ;; # anybody's name
    esac
    if [[ -z $ended && $current == -* ]]; then
        mapfile -t COMPREPLY < <(compgen -W '--home --channel --paths --user --fix --json --quiet
            --codes --export --appender --version --help' -- "$current")
    else
        compopt -o filenames
        mapfile -t COMPREPLY < <(compgen -f -- "$current")
    fi
} && complete -F _korvex_logcheck korvex-logcheck
