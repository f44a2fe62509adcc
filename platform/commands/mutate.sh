# SPDX-License-Identifier: Apache-2.0
#: mutate [options] | break statements of the library one at a time, and see the tests notice
# shellcheck shell=bash

usage_mutate() {
    cat <<'TEXT'
usage: ./dev mutate [--count N] [--seed SEED] [--at FILE:LINE ...]

Breaks N statements of values/, binder/, companion/ and managers/, 100 if not told, one at a time, chosen at
random, in a copy of the tree, and runs the native tests of the folder. Prints each with the program that noticed
it, and the seed, with which the same are chosen again. Fails when fewer than 95 % are noticed.

  --at FILE:LINE    only the statements of that line, in each way in which they can be broken
TEXT
}

command_mutate() {
    local -a options=()
    while (($# > 0)); do
        case $1 in
        --count | --seed)
            [[ ${2:-} =~ ^[0-9]{1,9}$ ]] || die_usage "mutate: $1 needs a number"
            options+=("$1" "$2")
            shift
            ;;
        --at)
            [[ ${2:-} =~ ^[a-z]+/[A-Za-z]+\.(cpp|h):[0-9]+$ ]] || die_usage "mutate: --at needs FILE:LINE"
            options+=("$1" "$2")
            shift
            ;;
        *) die_usage "mutate: unknown option '$1'" ;;
        esac
        shift
    done
    check_host
    need_packages "${PACKAGES_ALL[@]}"
    ensure_platform ''
    say "copying and building the tree in build/mutation"
    mkdir -p -- "$ROOT/build/mutation"
    "$ROOT/tests/mutation/mutate" "$ROOT" "$ROOT/build/mutation" "${options[@]}"
}
