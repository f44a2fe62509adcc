# SPDX-License-Identifier: Apache-2.0
#: clean [--all] | remove what was built; with --all the cache as well
# shellcheck shell=bash

usage_clean() {
    cat <<'TEXT'
usage: ./dev clean [--all]

Removes build/; with --all also the cache of downloads and of the built platform, unless the folder that is named
as the cache held something else before: then nothing is removed.
TEXT
}

command_clean() {
    case $* in
    '' | --all) ;;
    *) die_usage "clean takes no argument but --all" ;;
    esac
    if [[ ${1:-} == --all && -d $ZELK_CACHE ]]; then
        cache_is_ours ||
            die "$ZELK_CACHE holds what ./dev did not make, and nothing is removed: set ZELK_CACHE to the cache"
    fi
    say "removing $ROOT/build"
    rm -rf -- "$ROOT/build"
    if [[ ${1:-} == --all && -d $ZELK_CACHE ]]; then
        say "removing what $ZELK_CACHE holds"
        remove_cache
    fi
}
