# SPDX-License-Identifier: Apache-2.0
# What the other scripts lean on: messages, the cache folder, logged commands. Sourced by ./dev.
# shellcheck shell=bash

ZELK_CACHE=${ZELK_CACHE:-${XDG_CACHE_HOME:-$HOME/.cache}/zelk}

say() {
    printf '==> %s\n' "$*" >&2
}

die() {
    printf 'dev: %s\n' "$*" >&2
    exit 1
}

# Wrong usage: the same, with the status that callers can tell apart.
die_usage() {
    printf 'dev: %s\n' "$*" >&2
    exit 2
}

# The first line of a log that tells what went wrong, else its last line.
first_error() {
    grep -a -m 1 -E '^E:|[Ee]rror' "$1" || tail -n 1 "$1"
}

# run_logged <sentence for a failure> <command …>: runs it with its output in a log, which is named when
# it fails.
run_logged() {
    local failure=$1 log=$ZELK_CACHE/logs/$2.log
    shift
    mkdir -p -- "$ZELK_CACHE/logs"
    "$@" >"$log" 2>&1 </dev/null || die "$failure: $(first_error "$log") (log: $log)"
}

free_megabytes() {
    df -Pm -- "$1" | awk 'NR == 2 { print $4 }'
}

need_space() {
    local megabytes=$1 folder=$2 free
    free=$(free_megabytes "$folder")
    ((free >= megabytes)) ||
        die "not enough disk space: $megabytes MB are needed in $folder and $free MB are free"
}

make_cache_folder() {
    if ! mkdir -p -- "$ZELK_CACHE" 2>/dev/null || [[ ! -w $ZELK_CACHE ]]; then
        die "the cache folder $ZELK_CACHE cannot be written: set ZELK_CACHE to one that can"
    fi
    ZELK_CACHE=$(realpath -- "$ZELK_CACHE")
}

# Only what these scripts made, should the folder hold anything else.
remove_cache() {
    (cd -- "$ZELK_CACHE" && rm -rf -- apt initramfs kernel lock logs platform sources)
    rmdir -- "$ZELK_CACHE" 2>/dev/null || true
}

# Holds the lock until the (sub)shell that called it ends.
lock_file() {
    local file=$1 what=$2 descriptor
    exec {descriptor}>"$file"
    if ! flock --nonblock "$descriptor"; then
        say "waiting for another run that is using $what"
        flock "$descriptor"
    fi
}

# make_cached <folder> <megabytes needed> <message> <function …>: makes a folder of the cache unless it is
# there. The function is given a scratch folder and leaves the content in its subfolder "result", which
# gets its name in one step: what is in the cache is complete, whenever a run was cut short.
make_cached() {
    local folder=$1 megabytes=$2 message=$3
    shift 3
    if [[ -d $folder ]]; then
        return
    fi
    (
        lock_file "$ZELK_CACHE/lock" "$ZELK_CACHE"
        if [[ -d $folder ]]; then
            exit 0
        fi
        need_space "$megabytes" "$ZELK_CACHE"
        say "$message"
        scratch=$folder.partial
        rm -rf -- "$scratch"
        trap 'rm -rf -- "$scratch"' EXIT
        mkdir -p -- "$scratch"
        "$@" "$scratch"
        mv -T -- "$scratch/result" "$folder"
    )
}

# A short name for whatever is fed to it.
short_hash() {
    sha256sum | cut -c 1-16
}
