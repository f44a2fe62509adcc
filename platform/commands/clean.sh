# SPDX-License-Identifier: Apache-2.0
#: clean [--all] | remove what was built; with --all the cache as well
# shellcheck shell=bash

usage_clean() {
    cat <<'TEXT'
usage: ./dev clean [--all]

Removes build/; with --all also the cache of downloads and of the built platform.
TEXT
}

command_clean() {
    case $* in
    '' | --all) ;;
    *) die_usage "clean takes no argument but --all" ;;
    esac
    say "removing $ROOT/build"
    rm -rf -- "$ROOT/build"
    if [[ ${1:-} == --all && -d $ZELK_CACHE ]]; then
        say "removing what $ZELK_CACHE holds"
        remove_cache
    fi
}
