# SPDX-License-Identifier: Apache-2.0
# bash completion for zelkctl
# shellcheck shell=bash

# _zelkctl_words <command>: the words that may follow it; behind a | the kind of its arguments: file, or
# words to choose from.
_zelkctl_words() {
    case $1 in
    '') echo '--help --version --log ping record record-file command filter property event inspect packet-size auth
        config session touch gesture hand' ;;
    ping | filter | event | auth | 'session restore') echo '--help' ;;
    record) echo '--help --frames --seconds --output' ;;
    record-file) echo '--help --seconds|file' ;;
    command | inspect | packet-size | 'session save') echo '--help --json' ;;

    property) echo '--help set' ;;
    'property set') echo '--help|setRollingLogSize' ;;
    session) echo '--help save restore' ;;

    config) echo '--help get dump load reload save' ;;
    'config get') echo '--help --json' ;;
    config\ *) echo '--help|file' ;;

    touch) echo '--help features enable disable region watch' ;;
    'touch features') echo '--help --first --last --json' ;;
    'touch region') echo '--help --on --off' ;;

    gesture) echo '--help wakeup detect add delete enable disable verify limits watch' ;;
    'gesture wakeup' | 'hand wakeup') echo '--help|on off' ;;
    'gesture detect') echo '--help|start stop' ;;
    'gesture add' | 'gesture verify') echo '--help|file' ;;
    'gesture limits' | 'hand profiles') echo '--help --json' ;;

    hand) echo '--help enroll scan match cancel security profiles name rename delete wakeup watch' ;;
    'hand enroll' | 'hand match') echo '--help --count --seconds --output --json --stop' ;;
    'hand scan' | *' watch') echo '--help --count --seconds --output --json' ;;
    *) echo '--help' ;;
    esac
}

_zelkctl() {
    local current=${COMP_WORDS[COMP_CWORD]} command='' word words arguments='' i
    COMPREPLY=()
    for ((i = 1; i < COMP_CWORD; i++)); do
        word=${COMP_WORDS[i]}
        case $word in
        --output | -o | --frames | --seconds | --count | --first | --last | -n | -s)
            if ((++i < COMP_CWORD)); then
                continue
            fi
            # The value of this option is what is being typed.
            if [[ $word == --output || $word == -o ]]; then
                mapfile -t COMPREPLY < <(compgen -f -- "$current")
            fi
            return
            ;;
        -*) ;;
        *)
            case $command in
            '') command=$word ;;
            property | session | config | touch | gesture | hand) command+=" $word" ;;
            esac
            ;;
        esac
    done
    words=$(_zelkctl_words "$command")
    if [[ $words == *'|'* ]]; then
        arguments=${words#*|}
        words=${words%%|*}
    fi
    if [[ $arguments == file && $current != -* ]]; then
        mapfile -t COMPREPLY < <(compgen -f -- "$current")
    else
        mapfile -t COMPREPLY < <(compgen -W "$words ${arguments/#file/}" -- "$current")
    fi
}

complete -o filenames -F _zelkctl zelkctl
