# SPDX-License-Identifier: Apache-2.0
# Completion of orvane-unit for bash: source this file.

_orvane_unit() {
    local commands='new describe set show explain run diff impact report capture check'
    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
    local command=${COMP_WORDS[1]}
    COMPREPLY=()
    if ((COMP_CWORD == 1)); then
        mapfile -t COMPREPLY < <(compgen -W "$commands --help --version" -- "$word")
        return
    fi
    case $before in
    --from | --orvane | -o)
        mapfile -t COMPREPLY < <(compgen -f -- "$word")
        compopt -o filenames 2>/dev/null
        return
        ;;
    --only)
        mapfile -t COMPREPLY < <(compgen -W 'params records tuning versions files' -- "$word")
        return
        ;;
    esac
    local options=--help
    case $command in
    new) options+=' --from' ;;
    show) options+=' --only --json' ;;
    explain) options+=' -a -i --all --json --content' ;;
    run) options+=' --orvane --brief --json' ;;
    diff) options+=' -a -i --json' ;;
    impact) options+=' --json' ;;
    report) options+=' -o -a -i --redact-serial --impact' ;;
    capture) options+=' --redact-serial' ;;
    check) options+=' --orvane --update --json' ;;
    esac
    if [[ $word == -* ]]; then
        mapfile -t COMPREPLY < <(compgen -W "$options" -- "$word")
    elif [[ $command == set ]] && ((COMP_CWORD > 2)); then
        mapfile -t COMPREPLY < <(compgen -W 'param. serial= slot. aux= tuning.' -- "$word")
        compopt -o nospace 2>/dev/null
    else
        mapfile -t COMPREPLY < <(compgen -d -- "$word")
        compopt -o filenames 2>/dev/null
    fi
}

complete -F _orvane_unit orvane-unit
