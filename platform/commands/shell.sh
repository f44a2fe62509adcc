# SPDX-License-Identifier: Apache-2.0
#: shell [options] | a terminal in which a touch stack runs, to work with as with a device
# shellcheck shell=bash

usage_shell() {
    cat <<'TEXT'
usage: ./dev shell [--stack "OPTIONS" | --no-stack] [-- COMMAND …]

A terminal at a desk: servicemanager and zelk-touchstack run, and zelkctl, its completion and its manual pages
are at hand. With COMMAND that is run instead of a shell, and its exit status is returned.
  --stack "OPTIONS"   start zelk-touchstack with these (see zelk-touchstack --help)
  --no-stack          start servicemanager alone

The desk is on this machine where /dev/binder is usable, else in QEMU, where this machine's files are seen
read-only but for build/ and the desk's home folder. Another ./dev shell, meanwhile, is a second terminal at
the same desk. It ends with the last of them.

  ZELK_HOME             the home folder, which is kept (default: ~/.local/share/zelk/home)
  ZELK_VM=direct|qemu   where to run it
TEXT
}

command_shell() {
    local stack='' options
    while (($# > 0)); do
        case $1 in
        --stack)
            (($# > 1)) || die_usage "shell: --stack needs zelk-touchstack's options, as one word"
            stack=$2
            shift
            ;;
        --stack=*) stack=${1#*=} ;;
        --no-stack) stack=$1 ;;
        --)
            shift
            (($# > 0)) || die_usage "shell: no command is given after --"
            break
            ;;
        *) die_usage "shell: unknown option '$1'; a command comes after --" ;;
        esac
        shift
    done
    options=$(xargs -r -n 1 printf '%s\n' <<<"$stack" 2>/dev/null) ||
        die_usage "shell: a quote in '$stack' has no end"
    begin programs shell vm -- build_release
    # The output is the command's.
    build_preset release "${PROGRAMS[@]}" >&2
    desk_install
    setup_vm
    desk_run "$options" "$@"
}
