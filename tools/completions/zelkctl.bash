# SPDX-License-Identifier: Apache-2.0
# bash completion for zelkctl
# shellcheck shell=bash

# _zelkctl_words <command>: the words that may follow it; behind a | the kind of its arguments: file, or
# words to choose from.
_zelkctl_words() {
    case $1 in
    '') echo '--help --version --log ping check record record-file frames command filter property event inspect
        packet-size auth config session touch gesture hand' ;;
    ping | filter | event | auth | 'session restore') echo '--help' ;;
    check) echo '--help --invasive --json --tap|companion touch gesture hand' ;;
    record) echo '--help --frames --seconds --output' ;;
    record-file) echo '--help --seconds|file' ;;
    frames) echo '--help watch stat export report' ;;
    'frames report') echo '--help --output --every|file' ;;
    'frames watch') echo '--help --seconds --json' ;;
    'frames stat') echo '--help --json|file' ;;
    'frames export') echo '--help --format --output --first --last --every --scale|file' ;;
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
    'touch watch') echo '--help --count --seconds --output --json --gesture --draw --feature' ;;
    'gesture watch') echo '--help --count --seconds --output --json --gesture --draw' ;;
    'hand enroll' | 'hand match') echo '--help --count --seconds --output --json --event --stop' ;;
    'hand scan' | 'hand watch') echo '--help --count --seconds --output --json --event' ;;
    *) echo '--help' ;;
    esac
}

_zelkctl() {
    local current=${COMP_WORDS[COMP_CWORD]} command='' word words arguments='' i
    COMPREPLY=()
    for ((i = 1; i < COMP_CWORD; i++)); do
        word=${COMP_WORDS[i]}
        case $word in
        --output | -o | --format | -f | --every | --scale | --gesture | --feature | --event | --frames | --seconds | --count | --first | --last | -n | -s)
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
            property | session | frames | config | touch | gesture | hand) command+=" $word" ;;
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
